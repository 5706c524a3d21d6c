// checker_cost_tb: what a checker costs beside the simulation of a datapath. With CHECK = 1, it takes all 23 values of a
// trellis step in each clock; with CHECK = 2, it counts situations, too; with CHECK = 0, the datapath runs alone.
// docs/checker.md has the commands.

// About what one thread of a unit computes in a clock: branch metrics, a step of each recursion, a ratio and an extrinsic
// value, with the memories of a window. The trellis is not that of the code.
module datapath (
    input logic clk,
    input logic signed [7:0] sys, par, apriori,
    output logic signed [11:0] llr,
    output logic signed [7:0] extrinsic
);
    logic [5:0] k = 0;
    logic [95:0] alphas[64];
    logic [31:0] gammas[64];
    logic signed [7:0] intrinsic, g[4];
    logic signed [11:0] alpha[8], beta[8], best[2];

    function automatic logic signed [7:0] clip(logic signed [9:0] value);
        return value > 127 ? 8'sd127 : value < -128 ? -8'sd128 : value[7:0];
    endfunction

    function automatic logic signed [11:0] max(logic signed [11:0] a, logic signed [11:0] b);
        logic signed [11:0] difference;
        difference = a - b;
        return difference < 0 ? b : a;
    endfunction

    always_comb begin
        intrinsic = clip((10'(apriori) >>> 1) + 10'(sys));
        g[0] = clip(-(10'(intrinsic) + 10'(par)));
        g[1] = clip(10'(par) - 10'(intrinsic));
        g[2] = clip(10'(intrinsic) - 10'(par));
        g[3] = clip(10'(intrinsic) + 10'(par));
        best = '{12'sh800, 12'sh800};
        for (int s = 0; s < 8; s++)
            for (int b = 0; b < 2; b++)
                best[b] = max(best[b], signed'(alphas[63 - k][12*s +: 12]) + beta[4*b + s/2] + 12'(g[b == 0 ? s%4 : 3 - s%4]));
    end

    always_ff @(posedge clk) begin
        for (int s = 0; s < 8; s++) begin
            alpha[s] <= max(alpha[(2*s)%8] + 12'(g[s%4]), alpha[(2*s + 1)%8] + 12'(g[3 - s%4]));
            beta[s] <= max(beta[s/2] + 12'(signed'(gammas[63 - k][8*(s%4) +: 8])),
                beta[4 + s/2] + 12'(signed'(gammas[63 - k][8*(3 - s%4) +: 8])));
            alphas[k][12*s +: 12] <= alpha[s];
        end
        for (int i = 0; i < 4; i++)
            gammas[k][8*i +: 8] <= g[i];
        llr <= best[1] - best[0];
        extrinsic <= clip(signed'(llr[11:2]) - 10'(intrinsic));
        k <= k + 1;
    end
endmodule

module checker_cost_tb;
    import morvik_pkg::*;

    parameter int CHECK = 1;
    localparam int clocks = 1_000_000;
    localparam int steps = 1536;           // those of one of four segments
    localparam int block_clocks = 98_304;  // 16 half-iterations of 6144 steps, if there were one thread alone

    bit clk = 0;
    logic signed [7:0] sys, par, apriori, extrinsic;
    logic signed [11:0] llr;
    int unsigned random = 1;
    morvik_checker check;
    chandle raw;
    int values[steps][23];  // right ones: a core that is checked for long has no others

    datapath dut (.*);

    function automatic void start();
        soft_values_t stream;
        stream = new[6148];
        for (int i = 0; i < 6148; i++)
            stream[i] = (37 * i) % 101 - 50;
        void'(check.start(stream, stream, stream, 8));
    endfunction

    // Once, as each block is the same one.
    function automatic void take_values();
        for (int step = 0; step < steps; step++)
            for (int signal = 0; signal < 23; signal++)
                values[step][signal] = check.value(signal, 0, step);
    endfunction

    function automatic void observe(int step);
        metrics_t row;
        int differs;
        differs = 0;
        differs |= raw_observe(raw, SIGNAL_INTRINSIC, 0, step, values[step][SIGNAL_INTRINSIC]);
        for (int i = 0; i < 4; i++)
            row[i] = values[step][SIGNAL_G + i];
        differs |= raw_observe_row(raw, SIGNAL_G, 0, step, row);
        for (int i = 0; i < 8; i++)
            row[i] = values[step][SIGNAL_ALPHA + i];
        differs |= raw_observe_row(raw, SIGNAL_ALPHA, 0, step, row);
        for (int i = 0; i < 8; i++)
            row[i] = values[step][SIGNAL_BETA + i];
        differs |= raw_observe_row(raw, SIGNAL_BETA, 0, step, row);
        differs |= raw_observe(raw, SIGNAL_LLR, 0, step, values[step][SIGNAL_LLR]);
        differs |= raw_observe(raw, SIGNAL_EXTRINSIC, 0, step, values[step][SIGNAL_EXTRINSIC]);
        if (differs != 0)
            void'(check.told(differs));
    endfunction

    initial begin
        check = new(8, ALGORITHM_SCALED);
        raw = check.raw();
        if (CHECK == 2)
            check.count_situations();
        for (int n = 0; n < clocks; n++) begin
            if (CHECK != 0 && n % block_clocks == 0)
                start();
            if (CHECK != 0 && n == 0)
                take_values();
            random = random * 1664525 + 1013904223;
            {sys, par, apriori} = random[31:8];
            #1 clk = 1;
            if (CHECK != 0)
                observe(n % steps);
            #1 clk = 0;
        end
        $display("%0d", llr ^ 12'(extrinsic));  // so that it is computed
        if (CHECK != 0)
            void'(check.report(1));
        $finish;
    end
endmodule
