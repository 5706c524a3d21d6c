// decoder_env_pkg: what a test bench of the core needs around the model, as plain classes: a predictor, a scoreboard, and
// checkers of the blocks in flight. They extend nothing, so that a uvm_component, or any other environment, can hold them.
// docs/uvm.md explains them.
package decoder_env_pkg;

    import morvik_pkg::*;

    // A block as the core takes it.
    class block_in;
        soft_values_t sys, par1, par2;  // K + 4 soft values each
        int iterations = 8;
        int unsigned tag;
    endclass

    // The decisions about a block, as the core gives them or as it should.
    class block_out;
        int unsigned tag;
        bit bits[$];
        bit unknown[$];  // 1 where the core's bit was x or z
        bit overtaken;   // set by a scoreboard

        // Appends a decision.
        function void add(bit value, bit is_unknown = 0);
            bits.push_back(value);
            unknown.push_back(is_unknown);
        endfunction

        // What is wrong with `got`, or nothing.
        function string difference(block_out got);
            int first, count;
            if (got.bits.size() != bits.size())
                return $sformatf("%0d decisions, expected %0d", got.bits.size(), bits.size());
            first = -1;
            foreach (bits[i])
                if (got.unknown[i] || got.bits[i] != bits[i]) begin
                    first = first < 0 ? i : first;
                    count++;
                end
            if (first < 0)
                return "";
            return $sformatf("bit %0d is %s, expected %b; %0d of %0d bits differ", first,
                got.unknown[first] ? "x" : got.bits[first] ? "1" : "0", bits[first], count, bits.size());
        endfunction
    endclass

    // Tells what the core must answer.
    class predictor;
        local morvik_decoder model;

        // The core's configuration: processing units, algorithm, bits of a tag.
        function new(int num_pu = 2, int algorithm = ALGORITHM_SCALED, int tag_width = 8);
            model = new(num_pu, algorithm, tag_width);
        endfunction

        // The decisions about a block, or null after an error if the core does not take such a block.
        function block_out predict(block_in block);
            block_out right;
            if (model.decode(block.sys, block.par1, block.par2, block.iterations, block.tag) != 0)
                return null;
            right = new;
            right.tag = model.dout_tag;
            foreach (model.dout[i])
                right.add(model.dout[i]);
            return right;
        endfunction

        function void destroy();
            model.destroy();
        endfunction
    endclass

    // Compares what the core gives with what is expected. Errors are counted and printed; override `error` to pass them on.
    class scoreboard;
        int unsigned equal, different, missing, extra, misplaced;
        local bit keeps_order;
        local block_out expected[$];

        // Whether blocks leave the core in the order in which they enter it; if not, their tags tell which is which, the
        // oldest first among equal ones.
        function new(bit in_order = 1);
            keeps_order = in_order;
        endfunction

        virtual function void error(string text);
            $display("ERROR: %s", text);
        endfunction

        // A block has entered the core; null stands for one that it does not take.
        function void expect_block(block_out right);
            if (right != null)
                expected.push_back(right);
        endfunction

        // A block has left the core.
        function void take(block_out got);
            block_out right;
            string what;
            int place;
            place = place_of(got.tag);
            if (place < 0) begin
                extra++;
                error($sformatf("decisions with tag %0d, for which no block is in flight", got.tag));
                return;
            end
            for (int i = 0; keeps_order && i < place; i++)
                overtake(expected[i], got);
            right = expected[place];
            expected.delete(place);
            what = right.difference(got);
            if (what == "")
                equal++;
            else begin
                different++;
                error($sformatf("block with tag %0d: %s", got.tag, what));
            end
        endfunction

        // Blocks in flight.
        function int in_flight();
            return expected.size();
        endfunction

        // The end of the test: what is in flight is missing.
        function void finish();
            foreach (expected[i]) begin
                missing++;
                error($sformatf("block with tag %0d: no decisions, expected %0d", expected[i].tag,
                    expected[i].bits.size()));
            end
            expected.delete();
        endfunction

        // Whether something was compared, and all of it is right.
        function bit passed();
            return equal > 0 && different + missing + extra + misplaced == 0;
        endfunction

        function string summary();
            return $sformatf("%0d blocks equal, %0d different, %0d missing, %0d extra, %0d out of order", equal, different,
                missing, extra, misplaced);
        endfunction

        // Told once for each block that is late, or never comes.
        local function void overtake(block_out late, block_out got);
            if (late.overtaken)
                return;
            late.overtaken = 1;
            misplaced++;
            error($sformatf("decisions with tag %0d come before those with tag %0d", got.tag, late.tag));
        endfunction

        // The oldest block with the tag, or -1.
        local function int place_of(int unsigned tag);
            foreach (expected[i])
                if (expected[i].tag == tag)
                    return i;
            return -1;
        endfunction
    endclass

    // Checks the inside of the core. A checker has one block, so there is one for each block in flight, whose tags differ.
    class block_checkers;
        int unsigned seen, computed;  // values of the core in finished blocks: those observed, and all
        local int units, kind;
        local bit is_counting;
        local morvik_checker all[$], resting[$];
        local morvik_checker busy[int unsigned];  // by tag

        function new(int num_pu = 2, int algorithm = ALGORITHM_SCALED);
            units = num_pu;
            kind = algorithm;
        endfunction

        // A block has entered the core.
        function void start(block_in block);
            morvik_checker check;
            if (busy.exists(block.tag) != 0)
                check = busy[block.tag];
            else if (resting.size() > 0)
                check = resting.pop_front();
            else
                check = another();
            void'(check.start(block.sys, block.par1, block.par2, block.iterations));
            busy[block.tag] = check;
        endfunction

        local function morvik_checker another();
            morvik_checker check;
            check = new(units, kind);
            if (is_counting)
                check.count_situations();
            all.push_back(check);
            return check;
        endfunction

        // Counts the situations of the arithmetic that observed values show, if it is called before the first block.
        function void count_situations();
            is_counting = 1;
        endfunction

        // Writes the counts of each checker: to NAME_0.csv, NAME_1.csv and so on.
        function void write_situations(string name);
            foreach (all[i])
                void'(all[i].write_situations($sformatf("%s_%0d.csv", name, i)));
        endfunction

        // The checker of a block in flight, or null.
        function morvik_checker of(int unsigned tag);
            if (busy.exists(tag) == 0)
                return null;
            return busy[tag];
        endfunction

        // A block has left the core: prints the report if something differs or, unless that is intended, is missing.
        function void finish(int unsigned tag, bit partial = 1);
            morvik_checker check;
            int standing;
            check = of(tag);
            if (check == null)
                return;
            for (int signal = 0; signal <= SIGNAL_EXTRINSIC; signal++) begin
                seen += check.seen(signal);
                computed += check.expected(signal);
            end
            standing = check.standing();
            if (standing == CHECKER_DIFFERS || (standing == CHECKER_INCOMPLETE && !partial)) begin
                $display("block with tag %0d:", tag);
                void'(check.report(partial));
            end
            busy.delete(tag);
            resting.push_back(check);
        endfunction

        function string summary();
            return $sformatf("%0d of %0d values inside observed", seen, computed);
        endfunction
    endclass

    // Counts what the model and its checkers report, so that it decides about the test, too. Assign one to morvik_log.
    class counting_reporter extends morvik_reporter;
        int unsigned errors, warnings;

        virtual function void report_error(string line);
            errors++;
            $display("ERROR: morvik: %s", line);
        endfunction

        virtual function void report_warning(string line);
            warnings++;
            $display("WARNING: morvik: %s", line);
        endfunction
    endclass

endpackage
