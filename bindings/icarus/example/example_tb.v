// example_tb: a self-checking test bench in plain Verilog. It decodes recorded blocks by the model, and compares with the
// decisions of a device under test, for which a file stands in.
//
//     +K=N              block size
//     +soft=FILE        soft values: a header, then a row BLOCK,SYS,PAR1,PAR2 for each of the K + 4 positions of a block
//     +decisions=FILE   a line of K bits for each block
//     +break_block=B +break_bit=I   turns bit I of block B over, as a bug of the device would
module example_tb;
    reg [8 * 256 - 1:0] soft_name, decisions_name, header;
    integer soft_file, decisions_file, K, break_block, break_bit;
    integer model, status, blocks, wrong_bits, read, number, value_sys, value_par1, value_par2, i;
    reg device;

    reg signed [7:0] sys [0:6147];  // room for the largest block: K + 4 positions
    reg signed [7:0] par1 [0:6147];
    reg signed [7:0] par2 [0:6147];
    reg dout [0:6143];

    // Reads the next block; `read` is 4 when it is complete.
    task read_block;
        begin
            read = 4;
            for (i = 0; i < K + 4 && read == 4; i = i + 1) begin
                read = $fscanf(soft_file, "%d,%d,%d,%d", number, value_sys, value_par1, value_par2);
                sys[i] = value_sys;
                par1[i] = value_par1;
                par2[i] = value_par2;
            end
        end
    endtask

    task compare;
        for (i = 0; i < K; i = i + 1) begin
            read = $fscanf(decisions_file, "%1b", device);
            if (blocks == break_block && i == break_bit)
                device = !device;
            if (device !== dout[i]) begin
                wrong_bits = wrong_bits + 1;
                $display("block %0d, bit %0d: the device decides %b, the model %b", blocks, i, device, dout[i]);
            end
        end
    endtask

    initial begin
        if (!$value$plusargs("K=%d", K) || !$value$plusargs("soft=%s", soft_name)
            || !$value$plusargs("decisions=%s", decisions_name)) begin
            $display("+K=N, +soft=FILE or +decisions=FILE is missing");
            $finish_and_return(2);
        end
        if (K < 40 || K > 6144) begin
            $display("+K=%0d is no block size: they are 40 to 6144", K);
            $finish_and_return(2);
        end
        if (!$value$plusargs("break_block=%d", break_block))
            break_block = -1;
        if (!$value$plusargs("break_bit=%d", break_bit))
            break_bit = 0;
        soft_file = $fopen(soft_name, "r");
        decisions_file = $fopen(decisions_name, "r");
        if (soft_file == 0 || decisions_file == 0) begin
            $display("%0s or %0s cannot be read", soft_name, decisions_name);
            $finish_and_return(2);
        end
        read = $fgets(header, soft_file);
        model = $morvik_create(4, 1, 8);  // processing units, algorithm, width of the tag
        blocks = 0;
        wrong_bits = 0;
        status = 0;
        read_block;
        while (read == 4 && status == 0) begin
            status = $morvik_decode(model, sys, par1, par2, K + 4, 8, 0, dout);
            if (status == 0) begin
                compare;
                blocks = blocks + 1;
                read_block;
            end
        end
        $morvik_destroy(model);
        $display("%0d blocks of %0d bits, %0d wrong bits", blocks, K, wrong_bits);
        $finish_and_return(blocks == 0 || status != 0 || wrong_bits != 0);
    end
endmodule
