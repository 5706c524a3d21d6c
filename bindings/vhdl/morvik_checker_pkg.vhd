-- morvik_checker_pkg: compares the values of a core with the model while the simulation runs. docs/checker.md explains it.
--
--     check := morvik_checker_create(num_pu => 4);
--     morvik_checker_start(check, sys, par1, par2, status, iterations => 8);  -- K + 4 soft values each
--     morvik_observe(check, morvik_llr, half_iteration, step, llr, answer);   -- reports the first difference
--     morvik_report(check, standing);
--
-- VHDL-93 and later; analyse morvik_pkg.vhd first. Nothing but integers passes between VHDL and C.
library ieee;
use ieee.std_logic_1164.all;

use work.morvik_pkg.all;

package morvik_checker_pkg is

    -- Signals: morvik_alpha + 3 is alpha3.
    constant morvik_intrinsic : integer := 0;
    constant morvik_g         : integer := 1;   -- branch metrics g0 to g3
    constant morvik_alpha     : integer := 5;   -- forward metrics alpha0 to alpha7
    constant morvik_beta      : integer := 13;  -- backward metrics beta0 to beta7
    constant morvik_llr       : integer := 21;  -- log-likelihood ratio
    constant morvik_extrinsic : integer := 22;

    -- What a checker answers.
    constant morvik_agrees     : integer := 0;
    constant morvik_differs    : integer := 1;
    constant morvik_refused    : integer := 2;
    constant morvik_incomplete : integer := 3;

    -- A value with bits that are not 0 or 1, and what stands where the core computes no value.
    constant morvik_unknown : integer := integer'low;

    -- A row: the four or eight values of morvik_g, morvik_alpha or morvik_beta.
    type morvik_metrics is array (natural range <>) of integer;

    -- Makes a checker and returns its number, or 0 after a report of severity error.
    impure function morvik_checker_create (
        num_pu    : integer := 2;
        algorithm : integer := morvik_scaled
    ) return integer;

    -- Begins a block: K + 4 soft values of each stream, the tail included. What was observed before is forgotten. If status
    -- is not morvik_agrees, a report of severity error says why.
    procedure morvik_checker_start (
        checker    : in  integer;
        sys        : in  morvik_soft_values;
        par1       : in  morvik_soft_values;
        par2       : in  morvik_soft_values;
        status     : out integer;
        iterations : in  integer := 8  -- 1 to 15
    );

    -- Takes a value of the core, in eighths. The first difference of a block is a report of severity error. The answer is
    -- morvik_agrees, morvik_differs, or morvik_refused after a report of severity error.
    procedure morvik_observe (
        checker, number, half_iteration, step : in integer;
        value                                 : in integer;
        answer                                : out integer
    );

    -- The same for a register: its bits in two's complement.
    procedure morvik_observe (
        checker, number, half_iteration, step : in integer;
        value                                 : in std_logic_vector;
        answer                                : out integer
    );

    -- The same for a row.
    procedure morvik_observe (
        checker, number, half_iteration, step : in integer;
        values                                : in morvik_metrics;
        answer                                : out integer
    );

    -- Bits in two's complement, at most 32, as an integer; morvik_unknown if one is not 0 or 1.
    function morvik_integer (bits : std_logic_vector) return integer;

    -- What the core computes, or morvik_unknown where it computes nothing.
    impure function morvik_value (checker, number, half_iteration, step : integer) return integer;

    -- The log-likelihood ratio of a bit after the last half-iteration, in eighths.
    impure function morvik_ratio (checker, position : integer) return integer;

    -- Reports how much of the block was observed, and all differences. standing is morvik_agrees, morvik_differs, or
    -- morvik_incomplete after a report of severity error if values are missing; if `partial`, they may be.
    procedure morvik_report (
        checker  : in  integer;
        standing : out integer;
        partial  : in  boolean := false
    );

    -- Counts from now on how often values that are right meet each situation of the arithmetic, those of this block
    -- included. This takes longer than observing them.
    procedure morvik_count_situations (checker : in integer);

    -- Writes these counts, for `morvik coverage`, or reports with severity error if there are none.
    procedure morvik_write_situations (checker : in integer; file_name : in string);

    -- Releases a checker. An unknown number is ignored.
    procedure morvik_checker_destroy (checker : in integer);

    -- The functions of the C library, on which the ones above are built.
    impure function morvik_vhdl_checker_create (num_pu, algorithm : integer) return integer;
    procedure morvik_vhdl_checker_destroy (checker : in integer);
    impure function morvik_vhdl_checker_is_open (checker : integer) return integer;
    procedure morvik_vhdl_checker_put (checker, sys, par1, par2 : in integer);
    procedure morvik_vhdl_checker_forget (checker : in integer);
    impure function morvik_vhdl_checker_start (checker, iterations : integer) return integer;
    impure function morvik_vhdl_checker_observe (checker, number, half_iteration, step, value : integer) return integer;
    impure function morvik_vhdl_checker_observe_row (
        checker, number, half_iteration, step,
        value0, value1, value2, value3, value4, value5, value6, value7 : integer
    ) return integer;
    impure function morvik_vhdl_checker_value (checker, number, half_iteration, step : integer) return integer;
    impure function morvik_vhdl_checker_ratio (checker, position : integer) return integer;
    impure function morvik_vhdl_checker_standing (checker : integer) return integer;
    impure function morvik_vhdl_checker_report (checker : integer) return integer;
    impure function morvik_vhdl_checker_count_situations (checker : integer) return integer;
    impure function morvik_vhdl_checker_situations (checker : integer) return integer;
    impure function morvik_vhdl_checker_message (checker : integer) return integer;

    attribute foreign of morvik_vhdl_checker_create : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_create";
    attribute foreign of morvik_vhdl_checker_destroy : procedure is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_destroy";
    attribute foreign of morvik_vhdl_checker_is_open : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_is_open";
    attribute foreign of morvik_vhdl_checker_put : procedure is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_put";
    attribute foreign of morvik_vhdl_checker_forget : procedure is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_forget";
    attribute foreign of morvik_vhdl_checker_start : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_start";
    attribute foreign of morvik_vhdl_checker_observe : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_observe";
    attribute foreign of morvik_vhdl_checker_observe_row : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_observe_row";
    attribute foreign of morvik_vhdl_checker_value : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_value";
    attribute foreign of morvik_vhdl_checker_ratio : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_ratio";
    attribute foreign of morvik_vhdl_checker_standing : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_standing";
    attribute foreign of morvik_vhdl_checker_report : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_report";
    attribute foreign of morvik_vhdl_checker_count_situations : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_count_situations";
    attribute foreign of morvik_vhdl_checker_situations : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_situations";
    attribute foreign of morvik_vhdl_checker_message : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_checker_message";

end package morvik_checker_pkg;

package body morvik_checker_pkg is

    -- Reports the messages about a checker.
    procedure report_messages (checker : in integer) is
        variable length : natural;
    begin
        loop
            length := morvik_vhdl_checker_message(checker);
            exit when length = 0;
            morvik_report_line(morvik_taken(length));
        end loop;
    end procedure report_messages;

    impure function morvik_checker_create (
        num_pu    : integer := 2;
        algorithm : integer := morvik_scaled
    ) return integer is
        variable checker : integer := morvik_vhdl_checker_create(num_pu, algorithm);
    begin
        if checker = 0 then
            morvik_report_line("ERROR:binding:No memory for a checker");
            return 0;
        end if;
        report_messages(checker);
        if morvik_vhdl_checker_is_open(checker) = 0 then
            morvik_vhdl_checker_destroy(checker);
            return 0;
        end if;
        return checker;
    end function morvik_checker_create;

    -- What follows from an answer: messages about an open checker, or that there is none.
    procedure pass_on (checker, answer : in integer) is
    begin
        if morvik_vhdl_checker_is_open(checker) = 0 then
            morvik_report_line("ERROR:binding:" & integer'image(checker) &
                " is no checker: it was not created, or has been destroyed");
        elsif answer /= morvik_agrees then
            report_messages(checker);
        end if;
    end procedure pass_on;

    procedure morvik_checker_start (
        checker    : in  integer;
        sys        : in  morvik_soft_values;
        par1       : in  morvik_soft_values;
        par2       : in  morvik_soft_values;
        status     : out integer;
        iterations : in  integer := 8
    ) is
        alias sys_of  : morvik_soft_values(0 to sys'length - 1) is sys;
        alias par1_of : morvik_soft_values(0 to par1'length - 1) is par1;
        alias par2_of : morvik_soft_values(0 to par2'length - 1) is par2;
    begin
        status := morvik_refused;
        morvik_vhdl_checker_forget(checker);
        if sys'length /= par1'length or sys'length /= par2'length then
            morvik_report_line("ERROR:binding:The streams differ in length: sys has " & integer'image(sys'length) &
                " values, par1 " & integer'image(par1'length) & ", par2 " & integer'image(par2'length));
        else
            for i in sys_of'range loop
                morvik_vhdl_checker_put(checker, sys_of(i), par1_of(i), par2_of(i));
            end loop;
            status := morvik_vhdl_checker_start(checker, iterations);
            pass_on(checker, morvik_differs);  -- there may be warnings
        end if;
    end procedure morvik_checker_start;

    procedure morvik_observe (
        checker, number, half_iteration, step : in integer;
        value                                 : in integer;
        answer                                : out integer
    ) is
        variable result : integer;
    begin
        result := morvik_vhdl_checker_observe(checker, number, half_iteration, step, value);
        if result /= morvik_agrees then
            pass_on(checker, result);
        end if;
        answer := result;
    end procedure morvik_observe;

    procedure morvik_observe (
        checker, number, half_iteration, step : in integer;
        value                                 : in std_logic_vector;
        answer                                : out integer
    ) is
    begin
        morvik_observe(checker, number, half_iteration, step, morvik_integer(value), answer);
    end procedure morvik_observe;

    procedure morvik_observe (
        checker, number, half_iteration, step : in integer;
        values                                : in morvik_metrics;
        answer                                : out integer
    ) is
        alias given     : morvik_metrics(0 to values'length - 1) is values;
        variable row    : morvik_metrics(0 to 7) := (others => 0);
        variable result : integer := morvik_refused;
    begin
        if (number = morvik_g and values'length = 4) or
            ((number = morvik_alpha or number = morvik_beta) and values'length = 8) then
            row(given'range) := given;
            result := morvik_vhdl_checker_observe_row(checker, number, half_iteration, step,
                row(0), row(1), row(2), row(3), row(4), row(5), row(6), row(7));
            if result /= morvik_agrees then
                pass_on(checker, result);
            end if;
        else
            morvik_report_line("ERROR:binding:Signal " & integer'image(number) & " has no row of " &
                integer'image(values'length) & " values: morvik_g has 4, morvik_alpha and morvik_beta have 8");
        end if;
        answer := result;
    end procedure morvik_observe;

    function morvik_integer (bits : std_logic_vector) return integer is
        alias places    : std_logic_vector(bits'length - 1 downto 0) is bits;
        variable number : integer := 0;
    begin
        for i in places'range loop
            case to_x01(places(i)) is
                when '0' =>
                    number := 2 * number;
                when '1' =>
                    -- The first place counts negatively.
                    if i = places'left then
                        number := -1;
                    else
                        number := 2 * number + 1;
                    end if;
                when others =>
                    return morvik_unknown;
            end case;
        end loop;
        return number;
    end function morvik_integer;

    impure function morvik_value (checker, number, half_iteration, step : integer) return integer is
        variable result : integer := morvik_vhdl_checker_value(checker, number, half_iteration, step);
    begin
        if result = morvik_unknown then
            pass_on(checker, morvik_refused);
        end if;
        return result;
    end function morvik_value;

    impure function morvik_ratio (checker, position : integer) return integer is
        variable result : integer := morvik_vhdl_checker_ratio(checker, position);
    begin
        if result = morvik_unknown then
            pass_on(checker, morvik_refused);
        end if;
        return result;
    end function morvik_ratio;

    procedure morvik_report (
        checker  : in  integer;
        standing : out integer;
        partial  : in  boolean := false
    ) is
        variable result : integer := morvik_vhdl_checker_standing(checker);
        variable length : natural := morvik_vhdl_checker_report(checker);
    begin
        if length > 0 then
            report "morvik: " & morvik_taken(length) severity note;
        end if;
        if result = morvik_incomplete and partial then
            result := morvik_agrees;
        elsif result = morvik_incomplete then
            morvik_report_line("ERROR:checker:Values are missing; set partial if that is intended");
        end if;
        pass_on(checker, result);
        standing := result;
    end procedure morvik_report;

    procedure morvik_count_situations (checker : in integer) is
    begin
        pass_on(checker, morvik_vhdl_checker_count_situations(checker));
    end procedure morvik_count_situations;

    procedure morvik_write_situations (checker : in integer; file_name : in string) is
        file counts : std.textio.text;
        variable opened : file_open_status;
        variable content : std.textio.line;
        variable length : natural := morvik_vhdl_checker_situations(checker);
        variable rows : string(1 to length) := morvik_taken(length);
    begin
        if length = 0 then
            pass_on(checker, morvik_refused);
            return;
        end if;
        std.textio.file_open(opened, counts, file_name, write_mode);
        if opened /= open_ok then
            morvik_report_line("ERROR:checker:" & file_name & ": cannot be written");
            return;
        end if;
        std.textio.write(content, rows(1 to length - 1));  -- writeline ends the last one
        std.textio.writeline(counts, content);
        std.textio.file_close(counts);
    end procedure morvik_write_situations;

    procedure morvik_checker_destroy (checker : in integer) is
    begin
        morvik_vhdl_checker_destroy(checker);
    end procedure morvik_checker_destroy;

    -- Never called: the library's functions replace them.

    impure function morvik_vhdl_checker_create (num_pu, algorithm : integer) return integer is
    begin
        report "morvik_vhdl_checker_create is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_create;

    procedure morvik_vhdl_checker_destroy (checker : in integer) is
    begin
        report "morvik_vhdl_checker_destroy is foreign" severity failure;
    end procedure morvik_vhdl_checker_destroy;

    impure function morvik_vhdl_checker_is_open (checker : integer) return integer is
    begin
        report "morvik_vhdl_checker_is_open is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_is_open;

    procedure morvik_vhdl_checker_put (checker, sys, par1, par2 : in integer) is
    begin
        report "morvik_vhdl_checker_put is foreign" severity failure;
    end procedure morvik_vhdl_checker_put;

    procedure morvik_vhdl_checker_forget (checker : in integer) is
    begin
        report "morvik_vhdl_checker_forget is foreign" severity failure;
    end procedure morvik_vhdl_checker_forget;

    impure function morvik_vhdl_checker_start (checker, iterations : integer) return integer is
    begin
        report "morvik_vhdl_checker_start is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_start;

    impure function morvik_vhdl_checker_observe (
        checker, number,
        half_iteration, step, value : integer
    ) return integer is
    begin
        report "morvik_vhdl_checker_observe is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_observe;

    impure function morvik_vhdl_checker_observe_row (
        checker, number, half_iteration, step,
        value0, value1, value2, value3, value4, value5, value6, value7 : integer
    ) return integer is
    begin
        report "morvik_vhdl_checker_observe_row is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_observe_row;

    impure function morvik_vhdl_checker_value (checker, number, half_iteration, step : integer) return integer is
    begin
        report "morvik_vhdl_checker_value is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_value;

    impure function morvik_vhdl_checker_ratio (checker, position : integer) return integer is
    begin
        report "morvik_vhdl_checker_ratio is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_ratio;

    impure function morvik_vhdl_checker_standing (checker : integer) return integer is
    begin
        report "morvik_vhdl_checker_standing is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_standing;

    impure function morvik_vhdl_checker_report (checker : integer) return integer is
    begin
        report "morvik_vhdl_checker_report is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_report;

    impure function morvik_vhdl_checker_count_situations (checker : integer) return integer is
    begin
        report "morvik_vhdl_checker_count_situations is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_count_situations;

    impure function morvik_vhdl_checker_situations (checker : integer) return integer is
    begin
        report "morvik_vhdl_checker_situations is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_situations;

    impure function morvik_vhdl_checker_message (checker : integer) return integer is
    begin
        report "morvik_vhdl_checker_message is foreign" severity failure;
        return 0;
    end function morvik_vhdl_checker_message;

end package body morvik_checker_pkg;
