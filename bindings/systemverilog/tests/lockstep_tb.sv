// lockstep_tb: a stand-in for a core gives the values of a replay, one operation after the other, and the checker stops it
// at the first wrong one.
//
//     +replay=FILE   written by fault_core ... replay
module lockstep_tb;
    import morvik_pkg::*;

    string name;
    int file, num_pu, algorithm, iterations, positions;
    int signal, half_iteration, step, answer;
    soft_values_t sys, par1, par2;
    metrics_t row;
    morvik_checker check;

    function automatic bit next();
        int got;
        got = $fscanf(file, "%d %d %d %d %d %d %d %d %d %d %d", signal, half_iteration, step,
            row[0], row[1], row[2], row[3], row[4], row[5], row[6], row[7]);
        return got == 11;
    endfunction

    initial begin
        if ($value$plusargs("replay=%s", name) == 0)
            $fatal(1, "+replay=FILE is missing");
        file = $fopen(name, "r");
        answer = $fscanf(file, "%d %d %d %d", num_pu, algorithm, iterations, positions);
        sys = new[positions];
        par1 = new[positions];
        par2 = new[positions];
        for (int i = 0; i < positions; i++)
            answer = $fscanf(file, "%d %d %d", sys[i], par1[i], par2[i]);
        check = new(num_pu, algorithm);
        answer = check.start(sys, par1, par2, iterations);
        while (answer == CHECKER_AGREES && next())
            if (signal == SIGNAL_G || signal == SIGNAL_ALPHA || signal == SIGNAL_BETA)
                answer = check.observe_row(signal, half_iteration, step, row);
            else
                answer = check.observe(signal, half_iteration, step, row[0]);
        $fclose(file);
        if (answer != CHECKER_AGREES)
            $fatal(1, "stopped");
        if (check.report() == CHECKER_AGREES && check.seen(SIGNAL_LLR) == check.expected(SIGNAL_LLR))
            $display("the core agrees");
        check.destroy();
        $finish;
    end
endmodule
