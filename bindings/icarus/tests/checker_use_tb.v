// checker_use_tb: what a checker says while a test bench runs, and what test benches do wrong with it. The messages are in
// checker_use_tb.txt.
module checker_use_tb;
    integer one, other, answer, i;
    reg signed [7:0] sys [0:43];
    reg signed [7:0] par1 [0:43];
    reg signed [7:0] par2 [0:43];
    reg [11:0] row [0:7];  // not signed, as parts of a vector are not
    reg signed [12:0] wide;

    initial begin
        for (i = 0; i < 44; i = i + 1) begin
            sys[i] = 5 * i - 100;
            par1[i] = 60 - 3 * i;
            par2[i] = i;
        end
        $display("create");
        one = $morvik_checker_create(3, 1);
        answer = $morvik_observe(one, "llr", 0, 0, 0);
        $display("order, answer %0d", answer);
        one = $morvik_checker_create(2, 1);
        $morvik_count_situations(one);
        answer = $morvik_observe(one, "llr", 0, 0, 0);
        i = $morvik_ratio(one, 0);
        $display("ratio %0d", i);
        answer = $morvik_report(one, 0);
        $display("blocks, answer %0d", answer);
        answer = $morvik_checker_start(one, sys, par1, par2, 40, 8);
        answer = $morvik_checker_start(one, sys, par1, par2, 0, 8);
        answer = $morvik_checker_start(one, sys, par1, par2, 44, 16);
        $display("places, answer %0d", answer);
        answer = $morvik_checker_start(one, sys, par1, par2, 44, 1);
        answer = $morvik_observe(one, "gamma", 0, 0, 0);
        answer = $morvik_observe(one, 23, 0, 0, 0);
        answer = $morvik_observe(one, "llr", 2, 0, 0);
        answer = $morvik_observe(one, "llr", 0, 43, 0);
        answer = $morvik_observe(one, "llr", 0, 4'bx, 0);
        wide = 2048;
        answer = $morvik_observe(one, "llr", 0, 0, wide);
        answer = $morvik_observe(one, "alpha", 0, 0, 0, 0, 0);
        answer = $morvik_observe(one, "llr", 0, 0, 0, 0);
        $display("no value: %0d", $morvik_value(one, "llr", 0, 41));
        $display("a row");
        for (i = 0; i < 8; i = i + 1)
            row[i] = $morvik_value(one, 5 + i, 1, 7);
        answer = $morvik_observe(one, "alpha", 1, 7, row[0], row[1], row[2], row[3], row[4], row[5], row[6], row[7]);
        $display("answer %0d, partial %0d, complete %0d", answer, $morvik_report(one, 1), $morvik_report(one, 0));
        $display("x, and another checker");
        other = $morvik_checker_create(8, 0);
        answer = $morvik_checker_start(other, sys, par1, par2, 44, 1);
        answer = $morvik_observe(one, "alpha2", 1, 8, 12'h00z);
        answer = $morvik_observe(one, "alpha2", 1, 9, 12'hxxx);
        $display("answer %0d, another %0d", answer, $morvik_observe(other, "llr", 0, 40, 1'bx));
        $display("another block");
        answer = $morvik_checker_start(one, sys, par1, par2, 44, 1);
        answer = $morvik_observe(one, "llr", 1, 3, $morvik_ratio(one, 3));
        $display("answer %0d, standing %0d", answer, $morvik_report(one, 1));
        $display("a refused block is none");
        answer = $morvik_checker_start(one, sys, par1, par2, -1, 1);
        answer = $morvik_observe(one, "llr", 1, 3, 0);
        $display("after destroy");
        $morvik_checker_destroy(one);
        answer = $morvik_observe(one, "llr", 0, 0, 0);
        $morvik_checker_destroy(one);
        $display("situations");
        $morvik_count_situations(one);
        answer = $morvik_write_situations(other, "/nowhere/met.csv");
        $display("answer %0d, not counted", answer);
        $morvik_count_situations(other);
        answer = $morvik_write_situations(other, "/nowhere/met.csv");
        $display("answer %0d, written %0d", answer, $morvik_write_situations(other, "/dev/null"));
    end
endmodule
