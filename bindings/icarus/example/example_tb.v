// example_tb: a self-checking test bench in plain Verilog. It decodes the blocks of a set of vectors by the model, and
// compares with the decisions of a device under test, for which the set's own stand in.
//
//     +set=DIR                      made by: morvik vectors --out DIR --format memh
//     +break_block=B +break_bit=I   turns bit I of block B over, as a bug of the device would
module example_tb;
    reg [8 * 256 - 1:0] set, line, name;
    integer blocks_file, stimulus_file, decisions_file, break_block, break_bit;
    integer model, num_pu, algorithm, width, status, blocks, bits, wrong_bits, read, K, i;
    reg device;

    // Words of the set; docs/vectors.md describes their layout.
    reg [147:0] block;
    reg [23:0] position;

    reg signed [7:0] sys [0:6147];  // room for the largest block: K + 4 positions
    reg signed [7:0] par1 [0:6147];
    reg signed [7:0] par2 [0:6147];
    reg dout [0:6143];

    task fail;
        begin
            $display("%0s is no set of 'morvik vectors' with --format memh, --streams packed and --width 8", set);
            $finish_and_return(2);
        end
    endtask

    // The manifest has the core's configuration, one parameter per line.
    task read_manifest;
        integer file;
        begin
            $sformat(name, "%0s/manifest.json", set);
            file = $fopen(name, "r");
            width = 0;
            if (file != 0) begin
                while ($fgets(line, file) != 0) begin
                    read = $sscanf(line, " \"num_pu\": %d", num_pu);
                    read = $sscanf(line, " \"algorithm\": %s", name);
                    if (read == 1)
                        algorithm = name == "\"max-log\"," ? 0 : name == "\"scaled\"," ? 1 : 2;
                    read = $sscanf(line, " \"width\": %d", width);
                end
                $fclose(file);
            end
            if (width != 8)
                fail;
        end
    endtask

    // Opens a table's words and skips the layout comment.
    task open_words(input [8 * 16 - 1:0] table_name, output integer file);
        begin
            $sformat(name, "%0s/%0s.memh", set, table_name);
            file = $fopen(name, "r");
            if (file == 0)
                fail;
            read = $fgets(line, file);
        end
    endtask

    task read_stimulus;
        for (i = 0; i < K + 4; i = i + 1) begin
            read = $fscanf(stimulus_file, "%h", position);
            sys[i] = position[7:0];
            par1[i] = position[15:8];
            par2[i] = position[23:16];
        end
    endtask

    task compare;
        for (i = 0; i < K; i = i + 1) begin
            read = $fscanf(decisions_file, "%h", device);
            if (blocks == break_block && i == break_bit)
                device = !device;
            if (device !== dout[i]) begin
                wrong_bits = wrong_bits + 1;
                $display("block %0d, bit %0d: the device decides %b, the model %b", blocks, i, device, dout[i]);
            end
        end
    endtask

    initial begin
        if (!$value$plusargs("set=%s", set)) begin
            $display("+set=DIR is missing");
            $finish_and_return(2);
        end
        if (!$value$plusargs("break_block=%d", break_block))
            break_block = -1;
        if (!$value$plusargs("break_bit=%d", break_bit))
            break_bit = 0;
        read_manifest;
        open_words("blocks", blocks_file);
        open_words("stimulus", stimulus_file);
        open_words("expected", decisions_file);
        model = $morvik_create(num_pu, algorithm, 8);  // processing units, algorithm, width of the tag
        blocks = 0;
        bits = 0;
        wrong_bits = 0;
        status = 0;
        while ($fscanf(blocks_file, "%h", block) == 1 && status == 0) begin
            K = block[15:0];
            read_stimulus;
            status = $morvik_decode(model, sys, par1, par2, K + 4, block[19:16], 0, dout);
            if (status == 0) begin
                compare;
                blocks = blocks + 1;
                bits = bits + K;
            end
        end
        $morvik_destroy(model);
        $display("%0d blocks, %0d bits, %0d wrong bits", blocks, bits, wrong_bits);
        $finish_and_return(blocks == 0 || status != 0 || wrong_bits != 0);
    end
endmodule
