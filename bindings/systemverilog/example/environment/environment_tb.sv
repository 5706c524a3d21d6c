// environment_tb: a test bench around core_stand_in with the classes of decoder_env_pkg. Its drivers and monitors are what the
// agents of a UVM environment do.
//
//     +blocks=N           how many, by default 12; core_stand_in.sv has more arguments
//     +situations=NAME    counts the situations of the arithmetic that ratios show, in NAME_0.csv, NAME_1.csv and so on
module environment_tb;
    import morvik_pkg::*;
    import decoder_env_pkg::*;

    localparam int num_pu = 2;
    localparam int drain = 20_000;  // clocks after the last position in which decisions may come

    bit clk = 0;
    logic in_valid = 0, in_last = 0;
    logic signed [7:0] sys, par1, par2;
    logic [3:0] iterations;
    logic [7:0] in_tag;
    logic out_valid, out_last, out_bit, out_unknown;
    logic [7:0] out_tag;

    core_stand_in core (.*);

    counting_reporter reporter;
    predictor predict;
    scoreboard board;
    block_checkers checkers;
    int unsigned random = 1;
    int blocks = 12;
    string situations;

    initial forever #5 clk = !clk;

    function automatic int noisy(int signal);
        random = 1664525 * random + 1013904223;
        return signal + 32'(random[31:26]) - 32;
    endfunction

    // Noisy zeros of three sizes.
    function automatic block_in block_number(int number);
        block_in made;
        int positions;
        positions = 4 + (number % 3 == 0 ? 512 : number % 3 == 1 ? 104 : 40);
        made = new;
        made.sys = new[positions];
        made.par1 = new[positions];
        made.par2 = new[positions];
        for (int i = 0; i < positions; i++) begin
            made.sys[i] = noisy(-12);
            made.par1[i] = noisy(-12);
            made.par2[i] = noisy(-12);
        end
        made.iterations = 1 + number % 3;
        made.tag = number % 256;
        return made;
    endfunction

    // The driver: a position in each clock.
    task automatic send(block_in block);
        foreach (block.sys[i]) begin
            @(negedge clk);
            in_valid = 1;
            in_last = i == block.sys.size() - 1;
            sys = 8'(block.sys[i]);
            par1 = 8'(block.par1[i]);
            par2 = 8'(block.par2[i]);
            iterations = 4'(block.iterations);
            in_tag = 8'(block.tag);
        end
        @(negedge clk);
        in_valid = 0;
    endtask

    // The monitor of the core's output, and of the ratios inside.
    task automatic watch();
        block_out got;
        morvik_checker check;
        got = new;
        forever begin
            @(negedge clk);
            if (out_valid) begin
                check = checkers.of(32'(out_tag));
                if (check != null)
                    void'(check.observe(SIGNAL_LLR, 32'(core.llr_half_iteration), 32'(core.llr_step), 32'(core.llr)));
                got.tag = 32'(out_tag);
                got.add(out_bit, $isunknown(out_bit) || out_unknown);
                if (out_last) begin
                    board.take(got);
                    checkers.finish(got.tag);
                    got = new;
                end
            end
        end
    endtask

    task automatic run();
        for (int number = 0; number < blocks; number++) begin
            block_in block;
            block = block_number(number);
            board.expect_block(predict.predict(block));
            checkers.start(block);
            send(block);
        end
        repeat (drain) @(negedge clk);
    endtask

    initial begin
        void'($value$plusargs("blocks=%d", blocks));
        reporter = new;
        morvik_log = reporter;
        predict = new(num_pu);
        board = new($test$plusargs("out_of_order") == 0);
        checkers = new(num_pu);
        if ($value$plusargs("situations=%s", situations) != 0)
            checkers.count_situations();
        fork
            watch();
        join_none
        run();
        board.finish();
        $display("%s", board.summary());
        $display("%s, %0d errors", checkers.summary(), reporter.errors);
        if (situations != "")
            checkers.write_situations(situations);
        if (!board.passed() || checkers.seen == 0 || reporter.errors > 0)
            $fatal(1, "failed");
        $display("passed");
        $finish;
    end
endmodule
