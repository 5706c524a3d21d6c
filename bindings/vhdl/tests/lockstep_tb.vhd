-- lockstep_tb: a stand-in for a core gives the values of a replay, one operation after the other, and the checker stops it
-- at the first wrong one.
library ieee;
use ieee.std_logic_1164.all;
use ieee.numeric_std.all;
use std.textio.all;

use work.morvik_checker_pkg.all;
use work.morvik_pkg.all;

entity lockstep_tb is
    generic (replay : string);  -- written by fault_core ... replay
end entity lockstep_tb;

architecture bench of lockstep_tb is
    type integers is array (natural range <>) of integer;

    procedure read_row (file rows : text; numbers : out integers) is
        variable row    : line;
        variable number : integer;
    begin
        readline(rows, row);
        for i in numbers'range loop
            read(row, number);
            numbers(i) := number;
        end loop;
        deallocate(row);
    end procedure read_row;
begin
    test : process
        file rows              : text open read_mode is replay;
        variable head          : integers(0 to 3);
        variable soft          : integers(0 to 2);
        variable operation     : integers(0 to 10);
        variable metrics       : morvik_metrics(0 to 7);
        variable scalar        : std_logic_vector(11 downto 0);
        variable check, answer : integer;

        procedure start (positions : in natural) is
            variable sys, par1, par2 : morvik_soft_values(0 to positions - 1);
        begin
            for i in sys'range loop
                read_row(rows, soft);
                sys(i) := soft(0);
                par1(i) := soft(1);
                par2(i) := soft(2);
            end loop;
            morvik_checker_start(check, sys, par1, par2, answer, iterations => head(2));
        end procedure start;
    begin
        read_row(rows, head);
        check := morvik_checker_create(head(0), head(1));
        start(head(3));
        while answer = morvik_agrees and not endfile(rows) loop
            read_row(rows, operation);
            for i in metrics'range loop
                metrics(i) := operation(3 + i);
            end loop;
            scalar := std_logic_vector(to_signed(operation(3), 12));
            case operation(0) is
                when morvik_g =>
                    morvik_observe(check, morvik_g, operation(1), operation(2), metrics(0 to 3), answer);
                when morvik_alpha | morvik_beta =>
                    morvik_observe(check, operation(0), operation(1), operation(2), metrics, answer);
                when others =>
                    morvik_observe(check, operation(0), operation(1), operation(2), scalar, answer);
            end case;
        end loop;
        assert answer = morvik_agrees report "stopped" severity failure;
        morvik_report(check, answer);
        assert answer = morvik_agrees severity failure;
        report "the core agrees";
        morvik_checker_destroy(check);
        wait;
    end process test;
end architecture bench;
