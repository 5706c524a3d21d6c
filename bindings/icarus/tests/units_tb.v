// units_tb: each unit with the values that the tests of all bindings have, and what is refused. The messages are in
// units_tb.txt.
module units_tb;
    reg [95:0] alpha, beta, row;  // eight metrics of 12 bits, that of state 0 in the lowest
    reg [23:0] pending, carried;  // of 3 bits
    reg [31:0] g;                 // four branch metrics of 8 bits
    reg [23:0] systematic, parity;
    reg [8:0] twice;              // not signed
    reg signed [11:0] ratio;
    integer i, status, number;

    initial begin
        for (i = 0; i < 8; i = i + 1) begin
            alpha[12 * i +: 12] = 12 * i - 40;
            beta[12 * i +: 12] = 20 - 9 * i;
            pending[3 * i +: 3] = i < 5 ? i : 6;
        end
        systematic = {8'd30, -8'd20, 8'd1};
        parity = {-8'd6, 8'd50, -8'd100};
        status = $morvik_unit_intrinsic(10, -24, twice);
        $display("%0d: intrinsic %0d", status, $signed(twice));
        status = $morvik_unit_branch(twice, 8'd16, g);
        $display("%0d: branch %0d %0d %0d %0d", status, $signed(g[7:0]), $signed(g[15:8]), $signed(g[23:16]), $signed(g[31:24]));
        status = $morvik_unit_forward(2, alpha, pending, g, row, carried);
        show("forward");
        $display("   pending %0d %0d %0d %0d %0d %0d %0d %0d", carried[2:0], carried[5:3], carried[8:6], carried[11:9],
            carried[14:12], carried[17:15], carried[20:18], carried[23:21]);
        status = $morvik_unit_backward(2, beta, pending, g, row, carried);
        show("backward");
        status = $morvik_unit_ratio(2, alpha, beta, g, ratio);
        $display("%0d: ratio %0d", status, ratio);
        status = $morvik_unit_extrinsic(1, -101, -19, number);
        $display("%0d: extrinsic %0d", status, number);
        status = $morvik_unit_extrinsic(2, -101, -19, number);
        $display("%0d: not scaled %0d", status, number);
        status = $morvik_unit_address(40, 7, number);
        $display("%0d: address %0d", status, number);
        status = $morvik_unit_tail(systematic, parity, row);
        show("tail");
        status = $morvik_unit_border(alpha, row);
        show("border");
        $display("refused");
        status = $morvik_unit_branch(8'd1, 128, g);
        pending[3] = 1'bx;
        status = $morvik_unit_forward(2, alpha, pending, g, row, carried);
        status = $morvik_unit_extrinsic(3, 0, 0, number);
        status = $morvik_unit_address(40, 40, number);
        status = $morvik_unit_intrinsic(8'bx, 0, number);
        show("unchanged");
    end

    task show(input [79:0] name);
        $display("%0d: %0s %0d %0d %0d %0d %0d %0d %0d %0d", status, name, $signed(row[11:0]), $signed(row[23:12]),
            $signed(row[35:24]), $signed(row[47:36]), $signed(row[59:48]), $signed(row[71:60]), $signed(row[83:72]),
            $signed(row[95:84]));
    endtask
endmodule
