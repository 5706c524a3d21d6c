// wrong_use_tb: mistakes of test benches, and their messages. +report uses the class unchanged, whose messages reach
// the simulator's log; otherwise they are collected and compared.
module wrong_use_tb;
    import morvik_pkg::*;

    int failures = 0;

    class silence extends morvik_reporter;
        virtual function void report_error(string line);
        endfunction

        virtual function void report_warning(string line);
        endfunction
    endclass

    function automatic soft_values_t values(int count, int value = -24);
        soft_values_t all;
        all = new[count];
        for (int i = 0; i < count; i++)
            all[i] = value;
        return all;
    endfunction

    function automatic void expect_that(morvik_decoder model, int status, string message);
        if (model.status == status && model.message == message && (status == 0) == (model.dout.size() != 0))
            return;
        failures++;
        $display("expected status %0d and '%s'", status, message);
        $display("got      status %0d and '%s', %0d decisions", model.status, model.message, model.dout.size());
    endfunction

    // Decodes three streams of given lengths.
    function automatic void decode(morvik_decoder model, int sys, int par1, int par2, int iterations);
        int status;
        status = model.decode(values(sys), values(par1), values(par2), iterations);
        if (status != model.status)
            failures++;
    endfunction

    function automatic void refuse_generics();
        morvik_decoder model;
        model = new(3);
        expect_that(model, 1, "ERROR:decoder:C_NUM_PU must be either 2, 4 or 8");
        decode(model, 44, 44, 44, 8);
        expect_that(model, 1, "ERROR:binding:The generics of this decoder were refused, so it does not decode");
        if (model.is_open())
            failures++;
        model.destroy();
        model = new(2, 3);
        expect_that(model, 1, "ERROR:decoder:C_ALGORITHM_TYPE must be in range 0 to 2");
        model.destroy();
        model = new(2, 1, 33);
        expect_that(model, 1, "ERROR:decoder:C_TAG_WIDTH must be in range 0 to 32");
        model.destroy();
    endfunction

    function automatic void refuse_blocks();
        morvik_decoder model;
        model = new(8);
        decode(model, 40, 40, 40, 8);
        expect_that(model, 2, {"ERROR:TDecoder3G:Block size not supported: 40 soft values in each stream, but a block ",
            "of 40 bits has 44, the tail included"});
        decode(model, 45, 45, 45, 8);
        expect_that(model, 2, {"ERROR:TDecoder3G:Block size not supported: 45 soft values in each stream are not K + 4 ",
            "for a block size K of 3GPP TS 36.212"});
        decode(model, 6149, 6149, 6149, 8);
        expect_that(model, 1, {"ERROR:binding:Block size not supported: 6149 soft values in each stream are not K + 4 ",
            "for a block size K of 3GPP TS 36.212"});
        decode(model, 0, 0, 0, 8);
        expect_that(model, 1, "ERROR:binding:The streams are empty, but a block of K bits has K + 4 soft values in each");
        decode(model, 44, 43, 44, 8);
        expect_that(model, 1, "ERROR:binding:The streams differ in length: sys has 44 values, par1 43, par2 44");
        decode(model, 44, 44, 44, 0);
        expect_that(model, 1, "ERROR:decoder:Number of iterations must be in the range 1 to 15");
        decode(model, 44, 44, 44, -1);
        expect_that(model, 1, "ERROR:decoder:Number of iterations must be in the range 1 to 15");
        decode(model, 44, 44, 44, 8);
        expect_that(model, 0, "");
        model.destroy();
        decode(model, 44, 44, 44, 8);
        expect_that(model, 1, "ERROR:binding:decode was called after destroy");
        model.destroy();
    endfunction

    function automatic void warn();
        morvik_decoder model;
        string saturated, truncated;
        model = new(8);
        saturated = "WARNING:decoder:RSC2 parity value in position 0 saturated positively, further saturation will not be reported";
        truncated = "WARNING:decoder:Input block tag has been truncated to 8 bits, further truncation will not be reported";
        void'(model.decode(values(44), values(44), values(44, 128), 8, 'h123));
        expect_that(model, 0, {saturated, "\n", truncated});
        if (model.dout_tag != 'h23 || model.status_text() != "decoded")
            failures++;
        model.destroy();
    endfunction

    function automatic void expect_answer(morvik_checker check, int got, int answer, string message);
        if (got == answer && (check.message == message || message == "agrees"))
            return;
        failures++;
        $display("expected answer %0d and '%s'", answer, message);
        $display("got      answer %0d and '%s'", got, check.message);
    endfunction

    function automatic void refuse_checks();
        morvik_checker check, other;
        metrics_t row;
        string no_block;
        no_block = "ERROR:checker:There is no block: start comes before values are observed or asked for";
        check = new(3);
        expect_answer(check, int'(check.is_open()), 0, "ERROR:decoder:C_NUM_PU must be either 2, 4 or 8");
        check.destroy();
        check = new;
        expect_answer(check, check.observe(SIGNAL_LLR, 0, 0, 0), CHECKER_REFUSED, no_block);
        expect_answer(check, check.ratio(0), VALUE_UNKNOWN, no_block);
        expect_answer(check, check.start(values(44), values(44), values(43), 8), CHECKER_REFUSED,
            "ERROR:binding:The streams differ in length: sys has 44 values, par1 44, par2 43");
        expect_answer(check, check.start(values(40), values(40), values(40), 8), CHECKER_REFUSED,
            {"ERROR:checker:Block size not supported: 40 soft values in each stream, but a block of 40 bits has 44, ",
            "the tail included"});
        expect_answer(check, check.start(values(44), values(44), values(44), 8), CHECKER_AGREES, "");
        expect_answer(check, check.observe(SIGNAL_LLR, 16, 0, 0), CHECKER_REFUSED,
            "ERROR:checker:Half-iteration 16 is not allowed, expected 0 to 15");
        expect_answer(check, check.observe(SIGNAL_ALPHA, 0, 0, 'hf00), CHECKER_REFUSED,
            {"ERROR:checker:alpha0 3840 is not allowed, expected -2048 to 2047: eighths, a register's bits in two's ",
            "complement, sign-extended"});
        for (int i = 0; i < 8; i++)
            row[i] = check.value(SIGNAL_BETA + i, 3, 5);
        expect_answer(check, check.observe_row(SIGNAL_BETA + 1, 3, 5, row), CHECKER_REFUSED,
            "ERROR:checker:beta1 is not the first of its row, beta0");
        expect_answer(check, check.observe_row(SIGNAL_BETA, 3, 5, row), CHECKER_AGREES, "agrees");
        expect_answer(check, check.told(raw_observe_row(check.raw(), SIGNAL_BETA, 3, 5, row)), CHECKER_AGREES, "");
        expect_answer(check, check.told(raw_observe(check.raw(), SIGNAL_LLR, 16, 0, 0)), CHECKER_REFUSED,
            "ERROR:checker:Half-iteration 16 is not allowed, expected 0 to 15");
        expect_answer(check, check.standing(), CHECKER_INCOMPLETE,
            "ERROR:checker:Half-iteration 16 is not allowed, expected 0 to 15");
        expect_answer(check, check.report(1), CHECKER_AGREES, "");
        expect_answer(check, check.report(), CHECKER_INCOMPLETE, "ERROR:checker:Values are missing; set partial if that is intended");
        expect_answer(check, check.write_situations("/nowhere/met.csv"), CHECKER_REFUSED,
            "ERROR:checker:Situations are counted only if count_situations asks for it");
        check.count_situations();
        expect_answer(check, check.write_situations("/nowhere/met.csv"), CHECKER_REFUSED,
            "ERROR:checker:/nowhere/met.csv: cannot be written: No such file or directory");
        other = new(8);
        expect_answer(other, other.start(values(44), values(44), values(44), 1), CHECKER_AGREES, "");
        expect_answer(other, other.seen(SIGNAL_BETA), 0, "");
        expect_answer(check, check.seen(SIGNAL_BETA), 1,
            "ERROR:checker:/nowhere/met.csv: cannot be written: No such file or directory");
        other.destroy();
        // A refused block is none: values are not those of the block before.
        expect_answer(check, check.start(values(44), values(43), values(44), 8), CHECKER_REFUSED,
            "ERROR:binding:The streams differ in length: sys has 44 values, par1 43, par2 44");
        expect_answer(check, check.observe(SIGNAL_LLR, 0, 0, 0), CHECKER_REFUSED, no_block);
        check.destroy();
        expect_answer(check, check.observe(SIGNAL_LLR, 0, 0, 0), CHECKER_REFUSED,
            "ERROR:binding:There is no checker: it was destroyed, or there is no memory for it");
        check.destroy();
    endfunction

    function automatic void expect_row(bit ok, metrics_t got, string expected);
        string text;
        text = $sformatf("%0d %0d %0d %0d %0d %0d %0d %0d", got[0], got[1], got[2], got[3], got[4], got[5], got[6], got[7]);
        if (ok && text == expected)
            return;
        failures++;
        $display("expected %s, got %s", expected, text);
    endfunction

    // Each unit with the values that the tests of all bindings have.
    function automatic void use_units();
        morvik_units units;
        metrics_t alpha, beta, pending, systematic, parity, g, result, result_pending;
        bit ok;
        for (int i = 0; i < 8; i++) begin
            alpha[i] = 12 * i - 40;
            beta[i] = 20 - 9 * i;
            pending[i] = i < 5 ? i : 6;
            g[i] = 0;
            result_pending[i] = 0;
        end
        systematic = '{1, -20, 30, 0, 0, 0, 0, 0};
        parity = '{-100, 50, -6, 0, 0, 0, 0, 0};
        units = new(ALGORITHM_TABLE);
        ok = units.branch(units.intrinsic(10, -24), 16, g);
        expect_row(ok, '{g[0], g[1], g[2], g[3], 0, 0, 0, 0}, "-3 -35 -35 -3 0 0 0 0");
        ok = units.forward(alpha, pending, g, result, result_pending);
        expect_row(ok, result, "-30 34 47 53 -24 21 61 47");
        expect_row(ok, result_pending, "4 0 0 1 1 0 0 4");
        ok = units.backward(beta, pending, g, result, result_pending);
        expect_row(ok, result, "23 17 16 47 39 7 -7 -1");
        ok = units.tail(systematic, parity, result);
        expect_row(ok, result, "40 -160 104 -96 -152 48 -8 192");
        ok = units.border(alpha, result);
        expect_row(ok, result, "-40 -32 -16 -8 8 16 32 40");
        result = '{units.ratio(alpha, beta, g), units.extrinsic(-101, -19), units.address(40, 7), 0, 0, 0, 0, 0};
        expect_row(1, result, "-33 -63 31 0 0 0 0 0");
        units = new(ALGORITHM_SCALED);
        if (units.extrinsic(-101, -19) != -48)
            failures++;
    endfunction

    function automatic void refuse_units();
        morvik_units units;
        metrics_t zeros, column, pending, result, result_pending;
        for (int i = 0; i < 8; i++)
            zeros[i] = 0;
        column = zeros;
        pending = zeros;
        result = zeros;
        result_pending = zeros;
        units = new(ALGORITHM_TABLE);
        column[3] = 2048;
        if (units.forward(column, zeros, zeros, result, result_pending)
            || units.message != "ERROR:unit:alpha3 2048 is not allowed, expected -2048 to 2047")
            failures++;
        column[3] = VALUE_UNKNOWN;  // what x becomes; Verilator itself has none
        if (units.ratio(column, zeros, zeros) != VALUE_UNKNOWN
            || units.message != "ERROR:unit:alpha3 has bits that are x or z")
            failures++;
        if (units.address(40, 40) != VALUE_UNKNOWN || units.message != "ERROR:unit:step 40 is not allowed, expected 0 to 39")
            failures++;
        pending[7] = 3;
        if (!units.backward(zeros, pending, zeros, result, result_pending) || result_pending[0] != 6)
            failures++;
        units = new;
        if (units.backward(zeros, pending, zeros, result, result_pending))
            failures++;
    endfunction

    // Registers side by side, of which the first is in the lowest bits.
    function automatic void unpack();
        metrics_t row;
        row = metrics_of({12'hfff, 12'h7ff, 12'h800, 12'h000, 12'h004, 12'h003, 12'h002, 12'h801});
        if (row[0] != -2047 || row[1] != 2 || row[5] != -2048 || row[6] != 2047 || row[7] != -1)
            failures++;
        row = branches_of({8'h7f, 8'h80, 8'hff, 8'h01});
        if (row[0] != 1 || row[1] != -1 || row[2] != -128 || row[3] != 127 || row[4] != 0)
            failures++;
    endfunction

    // The class unchanged.
    function automatic void report();
        morvik_decoder model;
        model = new(3);
        decode(model, 44, 44, 44, 8);
        model.destroy();
        model = new(2);
        void'(model.decode(values(44, 200), values(44), values(44), 8));
        decode(model, 40, 40, 40, 8);
        model.destroy();
        decode(model, 44, 44, 44, 8);
    endfunction

    // Null handles at the functions themselves: nothing happens.
    function automatic void call_with_null();
        morvik_dpi_put(null, 0, 0, 0);
        morvik_dpi_destroy(null);
        if (morvik_dpi_decode(null, 8, 0) != 1 || morvik_dpi_size(null) != 0 || morvik_dpi_bit(null, 0) != 0
            || morvik_dpi_tag(null) != 0 || morvik_dpi_message(null) != "" || morvik_dpi_is_open(null) != 0)
            failures++;
    endfunction

    initial begin
        if ($test$plusargs("report"))
            report();
        else begin
            silence reporter;
            reporter = new;
            morvik_log = reporter;
            refuse_generics();
            refuse_blocks();
            refuse_checks();
            use_units();
            refuse_units();
            unpack();
            warn();
            call_with_null();
        end
        $display("%0d failures", failures);
        if (failures != 0)
            $fatal(1, "wrong use is answered otherwise");
        $finish;
    end
endmodule
