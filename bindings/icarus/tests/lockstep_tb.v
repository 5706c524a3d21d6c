// lockstep_tb: a stand-in for a core gives the values of a replay, one operation after the other, and the checker stops it
// at the first wrong one.
//
//     +replay=FILE   written by fault_core ... replay
module lockstep_tb;
    reg [8*1024:1] name;
    integer file, got, i, num_pu, algorithm, iterations, positions, checker, answer;
    integer signal, half_iteration, step;
    integer soft [0:2];
    integer row [0:7];
    reg signed [7:0] sys [0:6147];
    reg signed [7:0] par1 [0:6147];
    reg signed [7:0] par2 [0:6147];

    // The core's registers.
    reg [95:0] metrics;
    reg signed [11:0] scalar;

    task next;
        begin
            got = $fscanf(file, "%d %d %d", signal, half_iteration, step);
            for (i = 0; i < 8; i = i + 1) begin
                got = $fscanf(file, "%d", row[i]);
                metrics[12*i +: 12] = row[i];
            end
            scalar = row[0];
        end
    endtask

    initial begin
        if (!$value$plusargs("replay=%s", name)) begin
            $display("+replay=FILE is missing");
            $finish_and_return(1);
        end
        file = $fopen(name, "r");
        got = $fscanf(file, "%d %d %d %d", num_pu, algorithm, iterations, positions);
        for (i = 0; i < positions; i = i + 1) begin
            got = $fscanf(file, "%d %d %d", soft[0], soft[1], soft[2]);
            sys[i] = soft[0];
            par1[i] = soft[1];
            par2[i] = soft[2];
        end
        checker = $morvik_checker_create(num_pu, algorithm);
        answer = $morvik_checker_start(checker, sys, par1, par2, positions, iterations);
        next;
        while (answer == 0 && got == 1) begin
            if (signal == 1)
                answer = $morvik_observe(checker, "g", half_iteration, step,
                    metrics[0 +: 12], metrics[12 +: 12], metrics[24 +: 12], metrics[36 +: 12]);
            else if (signal == 5 || signal == 13)
                answer = $morvik_observe(checker, signal, half_iteration, step,
                    metrics[0 +: 12], metrics[12 +: 12], metrics[24 +: 12], metrics[36 +: 12],
                    metrics[48 +: 12], metrics[60 +: 12], metrics[72 +: 12], metrics[84 +: 12]);
            else
                answer = $morvik_observe(checker, signal, half_iteration, step, scalar);
            next;
        end
        if (answer != 0) begin
            $display("stopped");
            $finish_and_return(1);
        end else begin
            if ($morvik_report(checker, 0) == 0)
                $display("the core agrees");
            $morvik_checker_destroy(checker);
        end
    end
endmodule
