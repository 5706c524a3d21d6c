-- morvik_units_pkg: the units of the core as functions, for test benches of single units. docs/units.md explains them.
--
--     twice := morvik_unit_intrinsic(apriori, systematic);
--     g     := morvik_unit_branch(twice, parity);
--     morvik_unit_forward(alpha, pending, g, reached, reached_pending, algorithm => morvik_table);
--
-- All values are integers in eighths. An input that its register cannot hold, or that has bits other than 0 and 1
-- (morvik_integer in morvik_checker_pkg makes integers of registers), is reported with severity error; the results are then
-- morvik_unknown. VHDL-93 and later; analyse morvik_pkg.vhd and morvik_checker_pkg.vhd first.
use work.morvik_checker_pkg.all;
use work.morvik_pkg.all;

package morvik_units_pkg is

    -- Twice the intrinsic value.
    impure function morvik_unit_intrinsic (apriori, systematic : integer) return integer;

    -- The four branch metrics.
    impure function morvik_unit_branch (twice_intrinsic, parity : integer) return morvik_metrics;

    -- A step of the forward recursion. With an algorithm other than morvik_table, all pending corrections are 0.
    procedure morvik_unit_forward (
        alpha, pending, g        : in  morvik_metrics;
        reached, reached_pending : out morvik_metrics;
        algorithm                : in  integer := morvik_scaled
    );

    -- A step of the backward recursion.
    procedure morvik_unit_backward (
        beta, pending, g         : in  morvik_metrics;
        reached, reached_pending : out morvik_metrics;
        algorithm                : in  integer := morvik_scaled
    );

    -- The log-likelihood ratio.
    impure function morvik_unit_ratio (
        alpha, beta, g : morvik_metrics;
        algorithm      : integer := morvik_scaled
    ) return integer;

    impure function morvik_unit_extrinsic (
        ratio, twice_intrinsic : integer;
        algorithm              : integer := morvik_scaled
    ) return integer;

    -- The interleaver's address of a step of the interleaved code.
    impure function morvik_unit_address (block_size, step : integer) return integer;

    -- The backward metrics before the tail; three systematic and three parity values.
    impure function morvik_unit_tail (systematic, parity : morvik_metrics) return morvik_metrics;

    -- A column as a border keeps it.
    impure function morvik_unit_border (column : morvik_metrics) return morvik_metrics;

    -- The functions of the C library, on which the ones above are built.
    procedure morvik_vhdl_unit_put (value : in integer);
    impure function morvik_vhdl_unit_compute (number, algorithm : integer) return integer;
    impure function morvik_vhdl_unit_result (number : integer) return integer;
    impure function morvik_vhdl_unit_message return integer;

    attribute foreign of morvik_vhdl_unit_put : procedure is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_unit_put";
    attribute foreign of morvik_vhdl_unit_compute : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_unit_compute";
    attribute foreign of morvik_vhdl_unit_result : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_unit_result";
    attribute foreign of morvik_vhdl_unit_message : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_unit_message";

end package morvik_units_pkg;

package body morvik_units_pkg is

    constant states : integer := 8;

    procedure put_row (values : in morvik_metrics) is
    begin
        for i in values'range loop
            morvik_vhdl_unit_put(values(i));
        end loop;
    end procedure put_row;

    -- Computes, and reports a refusal.
    procedure compute (number, algorithm : in integer) is
    begin
        if morvik_vhdl_unit_compute(number, algorithm) = 0 then
            morvik_report_line(morvik_taken(morvik_vhdl_unit_message));
        end if;
    end procedure compute;

    impure function row_of (first, count : integer) return morvik_metrics is
        variable values : morvik_metrics(0 to count - 1);
    begin
        for i in values'range loop
            values(i) := morvik_vhdl_unit_result(first + i);
        end loop;
        return values;
    end function row_of;

    impure function morvik_unit_intrinsic (apriori, systematic : integer) return integer is
    begin
        morvik_vhdl_unit_put(apriori);
        morvik_vhdl_unit_put(systematic);
        compute(0, morvik_scaled);
        return morvik_vhdl_unit_result(0);
    end function morvik_unit_intrinsic;

    impure function morvik_unit_branch (twice_intrinsic, parity : integer) return morvik_metrics is
    begin
        morvik_vhdl_unit_put(twice_intrinsic);
        morvik_vhdl_unit_put(parity);
        compute(1, morvik_scaled);
        return row_of(0, 4);
    end function morvik_unit_branch;

    procedure advance (
        number                   : in  integer;
        column, pending, g       : in  morvik_metrics;
        reached, reached_pending : out morvik_metrics;
        algorithm                : in  integer
    ) is
    begin
        put_row(column);
        put_row(pending);
        put_row(g);
        compute(number, algorithm);
        reached := row_of(0, states);
        reached_pending := row_of(states, states);
    end procedure advance;

    procedure morvik_unit_forward (
        alpha, pending, g        : in  morvik_metrics;
        reached, reached_pending : out morvik_metrics;
        algorithm                : in  integer := morvik_scaled
    ) is
    begin
        advance(2, alpha, pending, g, reached, reached_pending, algorithm);
    end procedure morvik_unit_forward;

    procedure morvik_unit_backward (
        beta, pending, g         : in  morvik_metrics;
        reached, reached_pending : out morvik_metrics;
        algorithm                : in  integer := morvik_scaled
    ) is
    begin
        advance(3, beta, pending, g, reached, reached_pending, algorithm);
    end procedure morvik_unit_backward;

    impure function morvik_unit_ratio (
        alpha, beta, g : morvik_metrics;
        algorithm      : integer := morvik_scaled
    ) return integer is
    begin
        put_row(alpha);
        put_row(beta);
        put_row(g);
        compute(4, algorithm);
        return morvik_vhdl_unit_result(0);
    end function morvik_unit_ratio;

    impure function morvik_unit_extrinsic (
        ratio, twice_intrinsic : integer;
        algorithm              : integer := morvik_scaled
    ) return integer is
    begin
        morvik_vhdl_unit_put(ratio);
        morvik_vhdl_unit_put(twice_intrinsic);
        compute(5, algorithm);
        return morvik_vhdl_unit_result(0);
    end function morvik_unit_extrinsic;

    impure function morvik_unit_address (block_size, step : integer) return integer is
    begin
        morvik_vhdl_unit_put(block_size);
        morvik_vhdl_unit_put(step);
        compute(6, morvik_scaled);
        return morvik_vhdl_unit_result(0);
    end function morvik_unit_address;

    impure function morvik_unit_tail (systematic, parity : morvik_metrics) return morvik_metrics is
    begin
        put_row(systematic);
        put_row(parity);
        compute(7, morvik_scaled);
        return row_of(0, states);
    end function morvik_unit_tail;

    impure function morvik_unit_border (column : morvik_metrics) return morvik_metrics is
    begin
        put_row(column);
        compute(8, morvik_scaled);
        return row_of(0, states);
    end function morvik_unit_border;

    -- Never called: the library's functions replace them.

    procedure morvik_vhdl_unit_put (value : in integer) is
    begin
        report "morvik_vhdl_unit_put is foreign" severity failure;
    end procedure morvik_vhdl_unit_put;

    impure function morvik_vhdl_unit_compute (number, algorithm : integer) return integer is
    begin
        report "morvik_vhdl_unit_compute is foreign" severity failure;
        return 0;
    end function morvik_vhdl_unit_compute;

    impure function morvik_vhdl_unit_result (number : integer) return integer is
    begin
        report "morvik_vhdl_unit_result is foreign" severity failure;
        return 0;
    end function morvik_vhdl_unit_result;

    impure function morvik_vhdl_unit_message return integer is
    begin
        report "morvik_vhdl_unit_message is foreign" severity failure;
        return 0;
    end function morvik_vhdl_unit_message;

end package body morvik_units_pkg;
