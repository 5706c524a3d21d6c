-- units_tb: each unit with the values that the tests of all bindings have, and what is refused. units.expected has the
-- messages.
library ieee;
use ieee.std_logic_1164.all;

use work.morvik_checker_pkg.all;
use work.morvik_pkg.all;
use work.morvik_units_pkg.all;

entity units_tb is
end entity units_tb;

architecture bench of units_tb is
    function image (values : morvik_metrics) return string is
    begin
        if values'length = 1 then
            return integer'image(values(values'left));
        end if;
        return integer'image(values(values'left)) & " " & image(values(values'left + 1 to values'right));
    end function image;
begin
    test : process
        constant pending      : morvik_metrics(0 to 7) := (0, 1, 2, 3, 4, 6, 6, 6);
        constant zeros        : morvik_metrics(0 to 7) := (others => 0);
        constant systematic   : morvik_metrics(0 to 2) := (1, -20, 30);
        constant parity       : morvik_metrics(0 to 2) := (-100, 50, -6);
        variable alpha, beta  : morvik_metrics(0 to 7);
        variable g            : morvik_metrics(0 to 3);
        variable row, carried : morvik_metrics(0 to 7);
        variable number       : integer;
    begin
        for i in 0 to 7 loop
            alpha(i) := 12 * i - 40;
            beta(i)  := 20 - 9 * i;
        end loop;
        g := morvik_unit_branch(morvik_unit_intrinsic(10, -24), 16);
        report "branch " & image(g);
        morvik_unit_forward(alpha, pending, g, row, carried, algorithm => morvik_table);
        report "forward " & image(row) & ", pending " & image(carried);
        morvik_unit_backward(beta, pending, g, row, carried, algorithm => morvik_table);
        report "backward " & image(row) & ", pending " & image(carried);
        report "ratio " & integer'image(morvik_unit_ratio(alpha, beta, g, algorithm => morvik_table));
        report "extrinsic " & integer'image(morvik_unit_extrinsic(-101, -19)) & ", not scaled " &
            integer'image(morvik_unit_extrinsic(-101, -19, algorithm => morvik_table));
        report "address " & integer'image(morvik_unit_address(40, 7));
        report "tail " & image(morvik_unit_tail(systematic, parity));
        report "border " & image(morvik_unit_border(alpha));

        report "refused";
        alpha(3) := 2048;
        morvik_unit_forward(alpha, zeros, g, row, carried);
        assert row(0) = morvik_unknown and carried(7) = morvik_unknown severity failure;
        alpha(3) := morvik_integer("00000000000X");
        assert morvik_unit_ratio(alpha, beta, g) = morvik_unknown severity failure;
        morvik_unit_backward(beta, pending, g, row, carried);
        row := morvik_unit_border(alpha(0 to 6));
        number := morvik_unit_address(41, 0);
        assert number = morvik_unknown severity failure;
        report "done";
        wait;
    end process test;
end architecture bench;
