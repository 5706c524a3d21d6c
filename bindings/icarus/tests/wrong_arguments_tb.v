// wrong_arguments_tb: calls that are refused when the design is loaded.
module wrong_arguments_tb;
    integer status;
    reg [32:0] wide_values [0:43];
    reg signed [7:0] values [0:43];
    reg dout [0:39];
    real number, numbers [0:43];
    wire nets [0:39];

    initial begin
        status = $morvik_create(2, 1);
        status = $morvik_decode(1, values, values, wide_values, 44, 8, 0, dout);
        status = $morvik_decode(1, values, status, values, 44, 8, 0, dout);
        status = $morvik_create(2, values, 8);
        status = $morvik_create(number, 1, 8);
        status = $morvik_create(2, 1.5, 8);
        status = $morvik_create(2, "scaled", 8);
        status = $morvik_create(2, 1, number + 1);
        status = $morvik_decode(1, numbers, values, values, 44, 8, 0, dout);
        status = $morvik_decode(1, values, dout, values, 44, 8, 0, dout);
        status = $morvik_decode(1, values, values, values, 44, 8, 0, nets);
        $morvik_destroy(1, 2);
        status = $morvik_unit_branch(1, dout[0]);
        status = $morvik_unit_branch(1, 2, dout[0]);
        status = $morvik_unit_branch(1, values, status);
        status = $morvik_unit_branch(1, number, status);
        status = $morvik_unit_branch(1, 2, 3);
        status = $morvik_unit_extrinsic(values, 2, 3, status);
        status = $morvik_unit_address(40, 2, nets[0]);
        status = $morvik_unit_intrinsic(1, 2, status[7:0]);
        $display("the simulation has begun");
    end
endmodule
