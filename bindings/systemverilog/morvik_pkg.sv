// morvik_pkg: the bit-accurate model of the turbo decoder in SystemVerilog. docs/systemverilog.md explains it.
//
//     import morvik_pkg::*;
//     morvik_decoder model = new(4, ALGORITHM_SCALED);   // processing units, algorithm
//     if (model.decode(sys, par1, par2, 8, tag) == 0)     // K + 4 soft values each, eight iterations
//         compare(model.dout, model.dout_tag);
//     model.destroy();
package morvik_pkg;

    import "DPI-C" function chandle morvik_dpi_create(input int num_pu, input int algorithm, input int tag_width);
    import "DPI-C" function void morvik_dpi_destroy(input chandle decoder);
    import "DPI-C" function int morvik_dpi_is_open(input chandle decoder);
    import "DPI-C" function void morvik_dpi_put(input chandle decoder, input int sys, input int par1, input int par2);
    import "DPI-C" function int morvik_dpi_decode(input chandle decoder, input int iterations, input int unsigned tag);
    import "DPI-C" function int morvik_dpi_size(input chandle decoder);
    import "DPI-C" function int morvik_dpi_bit(input chandle decoder, input int position);
    import "DPI-C" function int unsigned morvik_dpi_tag(input chandle decoder);
    import "DPI-C" function string morvik_dpi_message(input chandle decoder);

    import "DPI-C" function chandle morvik_checker_create(input int num_pu, input int algorithm);
    import "DPI-C" function void morvik_checker_destroy(input chandle handle);
    import "DPI-C" function int morvik_checker_is_open(input chandle handle);
    import "DPI-C" function void morvik_checker_put(
        input chandle handle, input int sys, input int par1, input int par2);
    import "DPI-C" function int morvik_checker_start(input chandle handle, input int iterations);
    import "DPI-C" function void morvik_checker_forget(input chandle handle);
    import "DPI-C" function int morvik_checker_signal(input string name);
    import "DPI-C" function int morvik_checker_observe(
        input chandle handle, input int signal, input int half_iteration, input int step, input int value);
    import "DPI-C" function int morvik_dpi_observe_row(
        input chandle handle, input int signal, input int half_iteration, input int step,
        input int value0, input int value1, input int value2, input int value3,
        input int value4, input int value5, input int value6, input int value7);
    import "DPI-C" function int morvik_checker_value(
        input chandle handle, input int signal, input int half_iteration, input int step);
    import "DPI-C" function int morvik_checker_ratio(input chandle handle, input int bit_number);
    import "DPI-C" function int morvik_checker_seen(input chandle handle, input int signal);
    import "DPI-C" function int morvik_checker_expected(input chandle handle, input int signal);
    import "DPI-C" function int morvik_checker_standing(input chandle handle);
    import "DPI-C" function string morvik_checker_report(input chandle handle);
    import "DPI-C" function int morvik_checker_count_situations(input chandle handle);
    import "DPI-C" function int morvik_checker_write_situations(input chandle handle, input string file_name);
    import "DPI-C" function string morvik_checker_message(input chandle handle);

    import "DPI-C" function void morvik_dpi_unit_put(input int value);
    import "DPI-C" function int morvik_dpi_unit_compute(input int unit, input int algorithm);
    import "DPI-C" function int morvik_dpi_unit_result(input int number);
    import "DPI-C" function string morvik_dpi_unit_message();

    localparam int ALGORITHM_MAX_LOG = 0;
    localparam int ALGORITHM_SCALED = 1;  // max-log, extrinsic values times 0.75
    localparam int ALGORITHM_TABLE = 2;   // max-log with a correction table

    // Signals: SIGNAL_ALPHA + 3 is alpha3.
    localparam int SIGNAL_INTRINSIC = 0;
    localparam int SIGNAL_G = 1;       // branch metrics g0 to g3
    localparam int SIGNAL_ALPHA = 5;   // forward metrics alpha0 to alpha7
    localparam int SIGNAL_BETA = 13;   // backward metrics beta0 to beta7
    localparam int SIGNAL_LLR = 21;    // log-likelihood ratio
    localparam int SIGNAL_EXTRINSIC = 22;

    // What a checker answers.
    localparam int CHECKER_AGREES = 0;
    localparam int CHECKER_DIFFERS = 1;
    localparam int CHECKER_REFUSED = 2;
    localparam int CHECKER_INCOMPLETE = 3;
    localparam int VALUE_UNKNOWN = 32'sh8000_0000;  // x, or no value

    typedef int soft_values_t[];  // K + 4 values of a stream, -128 to 127; positive ones favour bit 1
    typedef bit decisions_t[];
    typedef logic signed [31:0] metrics_t[8];  // a row; the last four of g are not used

    // The row of a column of state metrics: eight registers of 12 bits side by side, that of state 0 in the lowest bits.
    function automatic metrics_t metrics_of(logic [95:0] bits);
        metrics_t row;
        for (int state = 0; state < 8; state++)
            row[state] = 32'($signed(bits[12 * state +: 12]));
        return row;
    endfunction

    // The row of branch metrics: four registers of 8 bits side by side, g0 in the lowest bits.
    function automatic metrics_t branches_of(logic [31:0] bits);
        metrics_t row;
        for (int i = 0; i < 8; i++)
            row[i] = i < 4 ? 32'($signed(bits[8 * i +: 8])) : 0;
        return row;
    endfunction

    // How error and warning lines reach the log. A derived class can hand them to uvm_error and uvm_warning instead; an
    // object of it in morvik_log serves all decoders.
    class morvik_reporter;
        virtual function void report_error(string line);
            $error("morvik: %s", line);
        endfunction

        virtual function void report_warning(string line);
            $warning("morvik: %s", line);
        endfunction
    endclass

    morvik_reporter morvik_log;

    // What the model says goes to the log, and stays to be read.
    class morvik_speaker;
        string message;  // of the last call that observed no right value: all that the model said, with line feeds between

        protected function void add_message(string line);
            if (morvik_log == null)
                morvik_log = new;
            message = message == "" ? line : {message, "\n", line};
            if (line.len() >= 8 && line.substr(0, 7) == "WARNING:")
                morvik_log.report_warning(line);
            else
                morvik_log.report_error(line);
        endfunction

        // Whether the three streams of a block have one length; otherwise says so.
        protected function bit are_alike(int sys, int par1, int par2);
            if (sys == par1 && sys == par2)
                return 1;
            add_message($sformatf("ERROR:binding:The streams differ in length: sys has %0d values, par1 %0d, par2 %0d",
                sys, par1, par2));
            return 0;
        endfunction
    endclass

    // A decoder. Call destroy when done with it: its memory is outside the simulator's.
    class morvik_decoder extends morvik_speaker;
        // Results of the last call.
        int status;             // 0 decoded, 1 an argument was refused, 2 the block was refused, 99 out of memory
        decisions_t dout;       // K decisions; none if the block was refused
        int unsigned dout_tag;  // the tag, truncated to tag_width bits

        local chandle handle;
        local bit destroyed;

        // num_pu 2, 4 or 8; algorithm 0 to 2; tag_width 0 to 32. Other values are reported, and is_open tells.
        function new(int num_pu = 2, int algorithm = ALGORITHM_SCALED, int tag_width = 8);
            handle = morvik_dpi_create(num_pu, algorithm, tag_width);
            status = 1 - morvik_dpi_is_open(handle);
            if (handle == null)
                add_message("ERROR:binding:No memory for a decoder");
            collect_messages();
        endfunction

        // Whether decode can be called.
        function bit is_open();
            return morvik_dpi_is_open(handle) != 0;
        endfunction

        // Decodes a block and returns the status. The decisions are in dout, the tag is in dout_tag.
        function int decode(
            input soft_values_t sys,
            input soft_values_t par1,
            input soft_values_t par2,
            input int iterations = 8,
            input int unsigned tag = 0
        );
            int result;  // not status: Verilator 5.006 assumes that calls in between do not change a member
            result = 1;
            message = "";
            dout = new[0];
            if (destroyed)
                add_message("ERROR:binding:decode was called after destroy");
            else if (handle == null)
                add_message("ERROR:binding:decode was called without a decoder");
            else if (are_alike(sys.size(), par1.size(), par2.size()))
                result = decode_streams(sys, par1, par2, iterations, tag);
            status = result;
            return result;
        endfunction

        // What status means.
        function string status_text();
            case (status)
                0: return "decoded";
                1: return "an argument was refused";
                2: return "the block was refused";
                default: return "out of memory";
            endcase
        endfunction

        // Releases the decoder. Another call does nothing.
        function void destroy();
            morvik_dpi_destroy(handle);
            handle = null;
            destroyed = 1;
        endfunction

        local function int decode_streams(
            input soft_values_t sys,
            input soft_values_t par1,
            input soft_values_t par2,
            input int iterations,
            input int unsigned tag
        );
            int result;
            for (int i = 0; i < sys.size(); i++)
                morvik_dpi_put(handle, sys[i], par1[i], par2[i]);
            result = morvik_dpi_decode(handle, iterations, tag);
            collect_messages();
            if (result == 0) begin
                dout = new[morvik_dpi_size(handle)];
                for (int i = 0; i < dout.size(); i++)
                    dout[i] = morvik_dpi_bit(handle, i) != 0;
                dout_tag = morvik_dpi_tag(handle);
            end
            return result;
        endfunction

        local function void collect_messages();
            string line;
            line = morvik_dpi_message(handle);
            while (line != "") begin
                add_message(line);
                line = morvik_dpi_message(handle);
            end
        endfunction
    endclass

    // What observe and observe_row of a checker do, on its raw(). Calls through a class cost a simulator more than what they
    // call; here, told(answer) of the checker passes the messages on where the answer is not CHECKER_AGREES.
    function automatic int raw_observe(chandle raw, int signal, int half_iteration, int step, logic signed [31:0] got);
        return morvik_checker_observe(raw, signal, half_iteration, step, $isunknown(got) ? VALUE_UNKNOWN : got);
    endfunction

    function automatic int raw_observe_row(chandle raw, int signal, int half_iteration, int step, metrics_t got);
        if ($isunknown(got[0] ^ got[1] ^ got[2] ^ got[3] ^ got[4] ^ got[5] ^ got[6] ^ got[7]))  // x stays x
            for (int i = 0; i < 8; i++)
                if ($isunknown(got[i]))
                    got[i] = VALUE_UNKNOWN;
        return morvik_dpi_observe_row(raw, signal, half_iteration, step,
            got[0], got[1], got[2], got[3], got[4], got[5], got[6], got[7]);
    endfunction

    // A checker: compares the values of a core with the model while the simulation runs. docs/checker.md explains it. Call
    // destroy when done with it.
    class morvik_checker extends morvik_speaker;
        local chandle handle;

        // num_pu 2, 4 or 8; algorithm 0 to 2. Other values are reported, and is_open tells.
        function new(int num_pu = 2, int algorithm = ALGORITHM_SCALED);
            handle = morvik_checker_create(num_pu, algorithm);
            void'(answered(1 - morvik_checker_is_open(handle)));
        endfunction

        // Whether the configuration was accepted, and destroy was not called.
        function bit is_open();
            return morvik_checker_is_open(handle) != 0;
        endfunction

        // Begins a block: K + 4 soft values of each stream. What was observed before is forgotten. Returns CHECKER_AGREES,
        // or another number after an error.
        function int start(
            input soft_values_t sys,
            input soft_values_t par1,
            input soft_values_t par2,
            input int iterations = 8
        );
            int result;
            message = "";
            morvik_checker_forget(handle);
            if (!are_alike(sys.size(), par1.size(), par2.size()))
                return CHECKER_REFUSED;
            for (int i = 0; i < sys.size(); i++)
                morvik_checker_put(handle, sys[i], par1[i], par2[i]);
            result = morvik_checker_start(handle, iterations);
            void'(answered(1));  // there may be warnings
            return result;
        endfunction

        // Takes a value of the core, in eighths: a register's bits, sign-extended. The first difference of a block is an
        // error. Returns CHECKER_AGREES, CHECKER_DIFFERS or CHECKER_REFUSED.
        function int observe(int signal, int half_iteration, int step, logic signed [31:0] got);
            int answer;
            answer = raw_observe(handle, signal, half_iteration, step, got);
            if (answer != CHECKER_AGREES)
                void'(answered(answer));
            return answer;
        endfunction

        // The same for all values of SIGNAL_G, SIGNAL_ALPHA or SIGNAL_BETA.
        function int observe_row(int signal, int half_iteration, int step, metrics_t got);
            int answer;
            answer = raw_observe_row(handle, signal, half_iteration, step, got);
            if (answer != CHECKER_AGREES)
                void'(answered(answer));
            return answer;
        endfunction

        // For raw_observe and raw_observe_row, until destroy.
        function chandle raw();
            return handle;
        endfunction

        // Passes the messages on after an answer of raw_observe or raw_observe_row, and returns it.
        function int told(int answer);
            return answered(answer);
        endfunction

        // What the core computes, or VALUE_UNKNOWN where it computes nothing.
        function int value(int signal, int half_iteration, int step);
            int result;
            result = morvik_checker_value(handle, signal, half_iteration, step);
            void'(answered(result == VALUE_UNKNOWN ? 1 : 0));
            return result;
        endfunction

        // The log-likelihood ratio of a bit after the last half-iteration, in eighths.
        function int ratio(int bit_number);
            int result;
            result = morvik_checker_ratio(handle, bit_number);
            void'(answered(result == VALUE_UNKNOWN ? 1 : 0));
            return result;
        endfunction

        // Values of a signal observed so far, and values that the core computes.
        function int seen(int signal);
            return morvik_checker_seen(handle, signal);
        endfunction

        function int expected(int signal);
            return morvik_checker_expected(handle, signal);
        endfunction

        // How the block stands: CHECKER_AGREES, CHECKER_DIFFERS, CHECKER_INCOMPLETE, or CHECKER_REFUSED without a block.
        function int standing();
            return morvik_checker_standing(handle);
        endfunction

        // Prints how much of the block was observed, and all differences. Returns CHECKER_AGREES, CHECKER_DIFFERS, or
        // CHECKER_INCOMPLETE after an error if values are missing. With `partial`, they may be.
        function int report(bit partial = 0);
            int answer;
            answer = standing();
            $display("%s", morvik_checker_report(handle));
            if (answer == CHECKER_INCOMPLETE && partial)
                answer = CHECKER_AGREES;
            void'(answered(answer));
            if (answer == CHECKER_INCOMPLETE)
                add_message("ERROR:checker:Values are missing; set partial if that is intended");
            return answer;
        endfunction

        // Counts from now on how often values that are right meet each situation of the arithmetic, those of this block
        // included. This takes longer than observing them.
        function void count_situations();
            void'(answered(morvik_checker_count_situations(handle)));
        endfunction

        // Writes these counts, for `morvik coverage`. Returns CHECKER_AGREES, or CHECKER_REFUSED after an error if there are
        // none or the file cannot be written.
        function int write_situations(string file_name);
            return answered(morvik_checker_write_situations(handle, file_name));
        endfunction

        // Releases the checker. Another call does nothing.
        function void destroy();
            morvik_checker_destroy(handle);
            handle = null;
        endfunction

        // Passes the messages on if there may be some.
        local function int answered(int answer);
            string line;
            message = "";
            if (answer == 0)
                return answer;
            if (handle == null) begin
                add_message("ERROR:binding:There is no checker: it was destroyed, or there is no memory for it");
                return answer;
            end
            line = morvik_checker_message(handle);
            while (line != "") begin
                add_message(line);
                line = morvik_checker_message(handle);
            end
            return answer;
        endfunction
    endclass

    // The units of the core as functions, for test benches of single units. docs/units.md explains them. All values are
    // integers in eighths. An input that is x, or that its register cannot hold, is an error: functions of one result then
    // return VALUE_UNKNOWN, those of a row return 0 and leave it unknown.
    class morvik_units extends morvik_speaker;
        local int type_number;

        // algorithm 0 to 2.
        function new(int algorithm = ALGORITHM_SCALED);
            type_number = algorithm;
        endfunction

        // Twice the intrinsic value.
        function int intrinsic(logic signed [31:0] apriori, logic signed [31:0] systematic);
            put(apriori);
            put(systematic);
            return scalar(0);
        endfunction

        // The four branch metrics.
        function bit branch(
            logic signed [31:0] twice_intrinsic, logic signed [31:0] parity, output metrics_t g);
            put(twice_intrinsic);
            put(parity);
            return rows(1, 4, g);
        endfunction

        // A step of the forward recursion. Only ALGORITHM_TABLE has pending corrections other than 0.
        function bit forward(
            metrics_t alpha, metrics_t pending, metrics_t g, output metrics_t next, output metrics_t next_pending);
            return step(2, alpha, pending, g, next, next_pending);
        endfunction

        // A step of the backward recursion.
        function bit backward(
            metrics_t beta, metrics_t pending, metrics_t g, output metrics_t previous, output metrics_t previous_pending);
            return step(3, beta, pending, g, previous, previous_pending);
        endfunction

        // The log-likelihood ratio.
        function int ratio(metrics_t alpha, metrics_t beta, metrics_t g);
            put_row(alpha, 8);
            put_row(beta, 8);
            put_row(g, 4);
            return scalar(4);
        endfunction

        function int extrinsic(logic signed [31:0] llr, logic signed [31:0] twice_intrinsic);
            put(llr);
            put(twice_intrinsic);
            return scalar(5);
        endfunction

        // The interleaver's address of a step of the interleaved code.
        function int address(logic signed [31:0] block_size, logic signed [31:0] step_number);
            put(block_size);
            put(step_number);
            return scalar(6);
        endfunction

        // The backward metrics before the tail; three systematic and three parity values.
        function bit tail(metrics_t systematic, metrics_t parity, output metrics_t beta);
            put_row(systematic, 3);
            put_row(parity, 3);
            return rows(7, 8, beta);
        endfunction

        // A column as a border keeps it.
        function bit border(metrics_t column, output metrics_t kept);
            put_row(column, 8);
            return rows(8, 8, kept);
        endfunction

        local function void put(logic signed [31:0] value);
            morvik_dpi_unit_put($isunknown(value) ? VALUE_UNKNOWN : value);
        endfunction

        local function void put_row(metrics_t values, int count);
            for (int i = 0; i < count; i++)
                put(values[i]);
        endfunction

        // Whether there are results; otherwise says why.
        local function bit computed(int unit_number);
            message = "";
            if (morvik_dpi_unit_compute(unit_number, type_number) != 0)
                return 1;
            add_message(morvik_dpi_unit_message());
            return 0;
        endfunction

        local function int scalar(int unit_number);
            if (!computed(unit_number))
                return VALUE_UNKNOWN;
            return morvik_dpi_unit_result(0);  // not in one expression: Verilator 5.006 calls it first
        endfunction

        local function bit rows(int unit_number, int count, output metrics_t values);
            bit result;
            result = computed(unit_number);
            for (int i = 0; i < 8; i++)
                values[i] = 'x;
            for (int i = 0; i < count && result; i++)
                values[i] = morvik_dpi_unit_result(i);
            return result;
        endfunction

        local function bit step(
            int unit_number, metrics_t column, metrics_t pending, metrics_t g,
            output metrics_t reached, output metrics_t reached_pending);
            bit result;
            put_row(column, 8);
            put_row(pending, 8);
            put_row(g, 4);
            result = rows(unit_number, 8, reached);
            for (int i = 0; i < 8; i++)
                reached_pending[i] = 'x;
            for (int i = 0; i < 8 && result; i++)
                reached_pending[i] = morvik_dpi_unit_result(8 + i);
            return result;
        endfunction
    endclass

endpackage
