// conformance_tb: decodes every block of the conformance file and compares. +blocks=FILE names the file.
module conformance_tb;
    reg [8 * 256 - 1:0] name;
    integer file, blocks, good, number, K, num_pu, algorithm, iterations, model, status, wrong, value, i, read;

    reg signed [31:0] sys [1:6148];  // another width and another first index than the example
    reg signed [7:0] par1 [6147:0];
    reg signed [7:0] par2 [0:6147];
    reg [3:0] dout [0:6143];

    task next;
        begin
            read = $fscanf(file, "%d", value);
            if (read != 1) begin
                $display("the conformance file ends early");
                $finish_and_return(2);
            end
        end
    endtask

    task check_block;
        begin
            next; K = value;
            next; num_pu = value;
            next; algorithm = value;
            next; iterations = value;
            for (i = 0; i < K + 4; i = i + 1) begin
                next; sys[i + 1] = value;
                next; par1[i] = value;
                next; par2[i] = value;
            end
            model = $morvik_create(num_pu, algorithm, 8);
            status = $morvik_decode(model, sys, par1, par2, K + 4, iterations, number, dout);
            wrong = 0;
            for (i = 0; i < K; i = i + 1) begin
                next;
                if (dout[i] !== value)
                    wrong = wrong + 1;
            end
            if (status == 0 && wrong == 0 && $morvik_tag(model) == number)
                good = good + 1;
            else
                $display("block %0d: status %0d, %0d wrong decisions, tag %0d", number, status, wrong, $morvik_tag(model));
            $morvik_destroy(model);
        end
    endtask

    initial begin
        if (!$value$plusargs("blocks=%s", name)) begin
            $display("+blocks=FILE is missing");
            $finish_and_return(2);
        end
        file = $fopen(name, "r");
        next; blocks = value;
        good = 0;
        for (number = 0; number < blocks; number = number + 1)
            check_block;
        $display("%0d of %0d blocks as expected", good, blocks);
        $finish_and_return(blocks == 0 || good != blocks);
    end
endmodule
