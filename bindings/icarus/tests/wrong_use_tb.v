// wrong_use_tb: what test benches do wrong while they run. The messages are in wrong_use_tb.txt.
module wrong_use_tb;
    integer model, status, i;
    reg signed [8:0] sys [0:6199];
    reg signed [7:0] par1 [0:6199];
    reg signed [7:0] par2 [0:6199];
    reg signed [7:0] short_par [0:42];
    reg dout [0:6195];
    reg short_dout [0:38];

    initial begin
        for (i = 0; i < 6200; i = i + 1) begin
            sys[i] = -24;
            par1[i] = -24;
            par2[i] = -24;
        end
        $display("create");
        model = $morvik_create(3, 1, 8);
        if (model != 0)
            $display("a decoder came of it");
        model = $morvik_create(2, 3, 8);
        model = $morvik_create(2, 1, 33);
        $display("decode without one");
        status = $morvik_decode(model, sys, par1, par2, 44, 8, 0, dout);
        model = $morvik_create(2, 1, 8);
        $display("sizes");
        status = $morvik_decode(model, sys, par1, par2, 40, 8, 0, dout);
        status = $morvik_decode(model, sys, par1, par2, 45, 8, 0, dout);
        status = $morvik_decode(model, sys, par1, par2, 6149, 8, 0, dout);
        status = $morvik_decode(model, sys, par1, par2, 0, 8, 0, dout);
        status = $morvik_decode(model, sys, par1, par2, -1, 8, 0, dout);
        status = $morvik_decode(model, sys, short_par, par2, 44, 8, 0, dout);
        status = $morvik_decode(model, sys, par1, par2, 44, 8, 0, short_dout);
        $display("values, status %0d", status);
        status = $morvik_decode(model, sys, par1, par2, 44, 0, 0, dout);
        par2[7] = 8'b0000_x000;
        status = $morvik_decode(model, sys, par1, par2, 44, 8, 0, dout);
        par2[7] = -24;
        status = $morvik_decode(model, sys, par1, par2, 64'h1_0000_002c, 8, 0, dout);
        status = $morvik_decode(model, sys, par1, par2, 44, 64'sh8000_0008, 0, dout);
        status = $morvik_decode(model, sys, par1, par2, 44, 8, 36'h0_0000_0005, dout);
        $display("status %0d, tag %0d", status, $morvik_tag(model));
        status = $morvik_decode(model, sys, par1, par2, 44, -64'sd1, 0, dout);
        status = $morvik_decode(model, sys, par1, par2, 44, 4'bx, 0, dout);
        $display("warnings");
        sys[3] = -200;
        status = $morvik_decode(model, sys, par1, par2, 44, 8, 'h123, dout);
        $display("status %0d, tag %0d, first bit %b", status, $morvik_tag(model), dout[0]);
        $display("after destroy");
        $morvik_destroy(model);
        status = $morvik_decode(model, sys, par1, par2, 44, 8, 0, dout);
        i = $morvik_tag(model);
        $morvik_destroy(model);
    end
endmodule
