// conformance_tb: decodes every block of the conformance file and compares. +blocks=FILE names the file.
module conformance_tb;
    import morvik_pkg::*;

    int file;

    function automatic int next();
        int value;
        if ($fscanf(file, "%d", value) != 1)
            $fatal(1, "the conformance file ends early");
        return value;
    endfunction

    // Decodes the next block of the file; returns whether the decisions are the expected ones.
    function automatic bit check_block(int number);
        morvik_decoder model;
        soft_values_t sys, par1, par2;
        int K, num_pu, algorithm, iterations, wrong;
        K = next();
        num_pu = next();
        algorithm = next();
        iterations = next();
        sys = new[K + 4];
        par1 = new[K + 4];
        par2 = new[K + 4];
        for (int i = 0; i < K + 4; i++) begin
            sys[i] = next();
            par1[i] = next();
            par2[i] = next();
        end
        model = new(num_pu, algorithm, 8);
        void'(model.decode(sys, par1, par2, iterations, number));
        wrong = 0;
        for (int i = 0; i < K; i++)
            if (next() != (model.dout.size() == K ? int'(model.dout[i]) : -1))
                wrong++;
        if (model.status != 0 || wrong != 0 || model.dout_tag != number)
            $display("block %0d: status %0d, %0d wrong decisions, tag %0d", number, model.status, wrong, model.dout_tag);
        model.destroy();
        return model.status == 0 && wrong == 0 && model.dout_tag == number;
    endfunction

    initial begin
        string name;
        int blocks, good;
        if (!$value$plusargs("blocks=%s", name))
            $fatal(1, "+blocks=FILE is missing");
        file = $fopen(name, "r");
        if (file == 0)
            $fatal(1, "%s cannot be read", name);
        blocks = next();
        good = 0;
        for (int number = 0; number < blocks; number++)
            if (check_block(number))
                good++;
        $display("%0d of %0d blocks as expected", good, blocks);
        if (blocks == 0 || good != blocks)
            $fatal(1, "the model decides otherwise");
        $finish;
    end
endmodule
