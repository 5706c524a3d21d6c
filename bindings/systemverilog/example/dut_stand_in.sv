// dut_stand_in: replaces the turbo decoder core in the example. It accepts the K + 4 positions of a block, one per
// clock, and then plays back the expected decisions of a set of vectors, one bit per clock. +break_block=B +break_bit=I
// inverts bit I of block B, like a bug.
module dut_stand_in (
    input logic clk,
    input logic [31:0] K,  // stable from the first position of a block to its last decision
    input logic din_valid,
    input logic signed [7:0] sys,
    input logic signed [7:0] par1,
    input logic signed [7:0] par2,
    output logic dout_valid,
    output logic dout
);
    string set;
    bit expected[int];  // the bits of all blocks, consecutively
    int break_block, break_bit;
    int block = 0, position = 0, playing = -1, played = 0;

    initial begin
        dout_valid = 0;
        if (!$value$plusargs("set=%s", set))
            $fatal(1, "+set=DIR is missing");
        $readmemh({set, "/expected.memh"}, expected);
        if (!$value$plusargs("break_block=%d", break_block))
            break_block = -1;
        if (!$value$plusargs("break_bit=%d", break_bit))
            break_bit = 0;
    end

    always @(posedge clk) begin
        dout_valid <= playing >= 0;
        if (playing >= 0) begin
            if (expected.exists(played) == 0)
                $fatal(1, "%s/expected.memh ends at bit %0d", set, played);
            dout <= expected[played] ^ (block == break_block && playing == break_bit);
            played <= played + 1;
            playing <= playing + 1 < K ? playing + 1 : -1;
            if (playing + 1 == K)
                block <= block + 1;
        end
        if (din_valid) begin
            position <= position + 1 < K + 4 ? position + 1 : 0;
            if (position + 1 == K + 4)
                playing <= 0;
        end
    end

    // A real core computes with the soft values.
    wire unused = ^{sys, par1, par2};
endmodule
