// core_stand_in: takes the place of the core in environment_tb. It has the model inside, takes a position in each clock, has
// several blocks in flight, and gives a decision in each clock, in the order of the blocks or as they are finished.
//
//     +out_of_order    short blocks overtake long ones
//     +fault=NAME      in the block with tag 3: flip (a bit), ratio (a wrong ratio inside), x (an unknown bit), short (a bit
//                      is missing); drop (no decisions); extra (they come twice)
module core_stand_in (
    input logic clk,
    input logic in_valid, in_last,
    input logic signed [7:0] sys, par1, par2,
    input logic [3:0] iterations,
    input logic [7:0] in_tag,
    output logic out_valid = 0, out_last = 0, out_bit = 0,
    output logic out_unknown = 0,  // for simulators that have no x
    output logic [7:0] out_tag = 0
);
    import morvik_pkg::*;

    class job;
        morvik_checker model;  // has all ratios of the block
        int K, ready;
        int last_half_iteration;
        logic [7:0] tag;
    endclass

    // What a test bench can see of the inside: the ratio behind each decision, in the last half-iteration.
    logic signed [11:0] llr = 0;
    logic [12:0] llr_step = 0;
    logic [4:0] llr_half_iteration = 0;

    int taken_sys[6148], taken_par1[6148], taken_par2[6148];
    int positions = 0, now = 0, step = 0;
    job jobs[$];
    job leaving = null;
    string fault = "";

    initial void'($value$plusargs("fault=%s", fault));

    function automatic job begun();
        soft_values_t all_sys, all_par1, all_par2;
        job made;
        all_sys = new[positions];
        all_par1 = new[positions];
        all_par2 = new[positions];
        for (int i = 0; i < positions; i++) begin
            all_sys[i] = taken_sys[i];
            all_par1[i] = taken_par1[i];
            all_par2[i] = taken_par2[i];
        end
        made = new;
        made.model = new;
        void'(made.model.start(all_sys, all_par1, all_par2, 32'(iterations)));
        made.K = positions - 4;
        made.ready = now + 4 * made.K;
        made.last_half_iteration = 2 * 32'(iterations) - 1;
        made.tag = in_tag;
        return made;
    endfunction

    // The next block to leave, or null.
    function automatic job chosen();
        job next;
        int place;
        place = -1;
        foreach (jobs[i])
            if (jobs[i].ready <= now && place < 0 && (i == 0 || $test$plusargs("out_of_order") != 0))
                place = i;
        if (place < 0)
            return null;
        next = jobs[place];
        if (next.tag == 3 && fault == "extra") begin
            fault = "";
            return next;  // and again later
        end
        jobs.delete(place);
        return next;
    endfunction

    function automatic void give();
        logic signed [11:0] ratio;
        ratio = 12'(leaving.model.ratio(step));
        if (leaving.tag == 3 && step == 17 && fault == "ratio")
            ratio = ratio ^ 12'd4;
        llr = ratio;
        llr_step = 13'(step);
        llr_half_iteration = 5'(leaving.last_half_iteration);
        out_bit = (ratio >= 0) ^ (leaving.tag == 3 && step == 17 && fault == "flip");
        out_unknown = leaving.tag == 3 && step == 17 && fault == "x";
        out_tag = leaving.tag;
        out_last = step == leaving.K - (leaving.tag == 3 && fault == "short" ? 2 : 1);
    endfunction

    function automatic void take();
        taken_sys[positions] = 32'(sys);
        taken_par1[positions] = 32'(par1);
        taken_par2[positions] = 32'(par2);
        positions++;
        if (!in_last)
            return;
        if (in_tag != 3 || fault != "drop")
            jobs.push_back(begun());
        positions = 0;
    endfunction

    initial forever begin
        @(posedge clk);
        now++;
        if (in_valid)
            take();
        if (out_valid && out_last)
            leaving = null;
        if (leaving == null) begin
            leaving = chosen();
            step = 0;
        end
        out_valid = leaving != null;
        if (leaving != null) begin
            give();
            step++;
        end
    end
endmodule
