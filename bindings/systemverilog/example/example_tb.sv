// example_tb: a self-checking test bench. It passes the blocks of a set of vectors to a device under test and to the
// model, and compares their decisions.
//
//     +set=DIR   made by: morvik vectors --out DIR --format memh
module example_tb;
    import morvik_pkg::*;

    bit clk = 0;
    initial forever #5 clk = !clk;

    localparam int longest_idle = 100_000;  // clocks: more than a core needs for a block

    // The words of a set; docs/vectors.md describes their layout.
    typedef struct packed {
        bit [31:0] first_bit, first_position, expected_tag, tag;
        bit [3:0] iterations;
        bit [15:0] block_size;
    } block_word;
    typedef struct packed {
        bit signed [7:0] par2, par1, sys;
    } position_word;

    string set;
    block_word blocks[int];
    position_word stimulus[int];

    int K;
    logic din_valid = 0;
    logic signed [7:0] sys, par1, par2;
    logic dout_valid, dout;

    dut_stand_in dut (.*);

    morvik_decoder model;
    int bits = 0, wrong_bits = 0;

    // The manifest has the core's configuration, one parameter per line.
    function automatic void read_manifest(output int num_pu, output int algorithm);
        int file, width;
        string line, name;
        file = $fopen({set, "/manifest.json"}, "r");
        if (file == 0)
            $fatal(1, "%s/manifest.json cannot be read: +set=DIR is a folder that 'morvik vectors' made", set);
        while ($fgets(line, file) != 0) begin
            void'($sscanf(line, " \"num_pu\": %d", num_pu));
            void'($sscanf(line, " \"algorithm\": %s", name));
            void'($sscanf(line, " \"width\": %d", width));
        end
        $fclose(file);
        algorithm = name == "\"max-log\"," ? ALGORITHM_MAX_LOG : name == "\"table\"," ? ALGORITHM_TABLE : ALGORITHM_SCALED;
        if (width != 8)
            $fatal(1, "%s has soft values of %0d bits, this test bench reads --width 8", set, width);
    endfunction

    // The model decides at once, before the device.
    function automatic void decode(input block_word block);
        soft_values_t soft_sys, soft_par1, soft_par2;
        position_word position;
        soft_sys = new[K + 4];
        soft_par1 = new[K + 4];
        soft_par2 = new[K + 4];
        for (int i = 0; i < K + 4; i++) begin
            position = stimulus[block.first_position + i];
            soft_sys[i] = int'(position.sys);
            soft_par1[i] = int'(position.par1);
            soft_par2[i] = int'(position.par2);
        end
        if (model.decode(soft_sys, soft_par1, soft_par2, int'(block.iterations)) != 0)
            $fatal(1, "the model does not decode: %s", model.message);
    endfunction

    // All signals are driven and sampled between two rising edges.
    task automatic drive(input block_word block);
        for (int i = 0; i < K + 4; i++) begin
            @(negedge clk);
            din_valid = 1;
            {par2, par1, sys} = stimulus[block.first_position + i];
        end
        @(negedge clk);
        din_valid = 0;
    endtask

    // The scoreboard: compares the device's decisions, as they come, with the model's.
    task automatic compare(input int number);
        for (int i = 0; i < K; i++) begin
            for (int idle = 0; !dout_valid; idle++) begin
                if (idle == longest_idle)
                    $fatal(1, "the device gives no decisions");
                @(negedge clk);
            end
            bits++;
            if (dout !== model.dout[i]) begin
                wrong_bits++;
                $display("block %0d, bit %0d: the device decides %b, the model %b", number, i, dout, model.dout[i]);
            end
            @(negedge clk);
        end
    endtask

    initial begin
        int num_pu, algorithm;
        if (!$value$plusargs("set=%s", set))
            $fatal(1, "+set=DIR is missing");
        read_manifest(num_pu, algorithm);
        $readmemh({set, "/blocks.memh"}, blocks);
        $readmemh({set, "/stimulus.memh"}, stimulus);
        if (blocks.num() == 0 || stimulus.num() == 0)
            $fatal(1, "%s lacks blocks.memh or stimulus.memh: this test bench reads --format memh --streams packed", set);
        model = new(num_pu, algorithm);
        for (int number = 0; number < blocks.num(); number++) begin
            K = int'(blocks[number].block_size);
            decode(blocks[number]);
            drive(blocks[number]);
            compare(number);
        end
        model.destroy();
        $display("%0d blocks, %0d bits, %0d wrong bits", blocks.num(), bits, wrong_bits);
        if (wrong_bits != 0)
            $fatal(1, "the device does not decide as the model does");
        $finish;
    end
endmodule
