// example_tb: a self-checking test bench. It hands recorded blocks to a device under test and to the model, and compares
// what they decide.
//
//     +K=N              block size
//     +soft=FILE        soft values: a header, then a row BLOCK,SYS,PAR1,PAR2 for each of the K + 4 positions of a block
//     +decisions=FILE   what the stand-in for the device plays
module example_tb;
    import morvik_pkg::*;

    bit clk = 0;
    initial forever #5 clk = !clk;

    localparam int longest_idle = 100_000;  // clocks: more than a core needs for a block

    int K;
    logic din_valid = 0;
    logic signed [7:0] sys, par1, par2;
    logic dout_valid, dout;

    dut_stand_in dut (.*);

    morvik_decoder model;
    int file, blocks = 0, wrong_bits = 0;

    // Reads the next block; returns 0 at the end of the file.
    function automatic bit read_block(
        output soft_values_t soft_sys,
        output soft_values_t soft_par1,
        output soft_values_t soft_par2
    );
        int number;
        soft_sys = new[K + 4];
        soft_par1 = new[K + 4];
        soft_par2 = new[K + 4];
        for (int i = 0; i < K + 4; i++)
            if ($fscanf(file, "%d,%d,%d,%d", number, soft_sys[i], soft_par1[i], soft_par2[i]) != 4)
                return 0;
        return 1;
    endfunction

    // Everything is driven and looked at between two rising edges.
    task automatic drive(input soft_values_t soft_sys, input soft_values_t soft_par1, input soft_values_t soft_par2);
        for (int i = 0; i < K + 4; i++) begin
            @(negedge clk);
            din_valid = 1;
            sys = 8'(soft_sys[i]);
            par1 = 8'(soft_par1[i]);
            par2 = 8'(soft_par2[i]);
        end
        @(negedge clk);
        din_valid = 0;
    endtask

    // The scoreboard: compares the device's decisions, as they come, with the model's.
    task automatic compare();
        for (int i = 0; i < K; i++) begin
            for (int idle = 0; !dout_valid; idle++) begin
                if (idle == longest_idle)
                    $fatal(1, "the device gives no decisions");
                @(negedge clk);
            end
            if (dout !== model.dout[i]) begin
                wrong_bits++;
                $display("block %0d, bit %0d: the device decides %b, the model %b", blocks, i, dout, model.dout[i]);
            end
            @(negedge clk);
        end
    endtask

    initial begin
        string name, header;
        int read;
        bit more;
        soft_values_t soft_sys, soft_par1, soft_par2;
        if (!$value$plusargs("K=%d", K) || !$value$plusargs("soft=%s", name))
            $fatal(1, "+K=N or +soft=FILE is missing");
        if (K < 40 || K > 6144)
            $fatal(1, "+K=%0d is no block size: they are 40 to 6144", K);
        file = $fopen(name, "r");
        if (file == 0)
            $fatal(1, "%s cannot be read", name);
        read = $fgets(header, file);
        if (read == 0)
            $fatal(1, "%s is empty", name);
        model = new(4, ALGORITHM_SCALED);
        more = read_block(soft_sys, soft_par1, soft_par2);
        while (more) begin
            if (model.decode(soft_sys, soft_par1, soft_par2, 8) != 0)
                $fatal(1, "the model does not decode: %s", model.message);
            drive(soft_sys, soft_par1, soft_par2);
            compare();
            blocks++;
            more = read_block(soft_sys, soft_par1, soft_par2);
        end
        model.destroy();
        $display("%0d blocks of %0d bits, %0d wrong bits", blocks, K, wrong_bits);
        if (blocks == 0 || wrong_bits != 0)
            $fatal(1, "the device does not decide as the model does");
        $finish;
    end
endmodule
