-- checker_use_tb: what users do wrong with a checker. checker_use.expected has the messages.
library ieee;
use ieee.std_logic_1164.all;

use work.morvik_checker_pkg.all;
use work.morvik_pkg.all;

entity checker_use_tb is
end entity checker_use_tb;

architecture bench of checker_use_tb is
begin
    test : process
        variable sys, par1, par2     : morvik_soft_values(0 to 43) := (others => -24);
        variable row                 : morvik_metrics(7 downto 0);
        variable one, other, answer  : integer;
        variable content             : std.textio.line;
        file counts                  : std.textio.text;
    begin
        report "a configuration that does not exist";
        assert morvik_checker_create(num_pu => 3) = 0 severity failure;

        report "no checker";
        morvik_observe(0, morvik_llr, 0, 0, 0, answer);
        assert answer = morvik_refused severity failure;
        morvik_report(0, answer);
        assert answer = morvik_refused severity failure;

        report "no block";
        one := morvik_checker_create;
        morvik_observe(one, morvik_llr, 0, 0, 0, answer);
        assert answer = morvik_refused severity failure;
        assert morvik_ratio(one, 0) = morvik_unknown severity failure;
        morvik_report(one, answer);
        assert answer = morvik_refused severity failure;

        report "blocks that are refused";
        morvik_checker_start(one, sys, par1(0 to 42), par2, answer);
        assert answer = morvik_refused severity failure;
        morvik_checker_start(one, sys(0 to 39), par1(0 to 39), par2(0 to 39), answer);
        assert answer = morvik_refused severity failure;
        morvik_checker_start(one, sys, par1, par2, answer, iterations => 0);
        assert answer = morvik_refused severity failure;

        report "places and values that are refused";
        morvik_checker_start(one, sys, par1, par2, answer, iterations => 1);
        assert answer = morvik_agrees severity failure;
        morvik_observe(one, 23, 0, 0, 0, answer);
        assert answer = morvik_refused severity failure;
        morvik_observe(one, morvik_llr, 2, 0, 0, answer);
        assert answer = morvik_refused severity failure;
        morvik_observe(one, morvik_llr, 0, 0, std_logic_vector'("0111111111111"), answer);
        assert answer = morvik_refused severity failure;
        morvik_observe(one, morvik_g, 0, 0, row, answer);
        assert answer = morvik_refused severity failure;
        assert morvik_value(one, morvik_llr, 0, 41) = morvik_unknown severity failure;

        report "a row, and part of a block";
        for i in 0 to 7 loop
            row(7 - i) := morvik_value(one, morvik_beta + i, 1, 7);
        end loop;
        morvik_observe(one, morvik_beta, 1, 7, row, answer);
        assert answer = morvik_agrees severity failure;
        morvik_report(one, answer, partial => true);
        assert answer = morvik_agrees severity failure;
        morvik_report(one, answer);
        assert answer = morvik_incomplete severity failure;

        report "x, beside another checker";
        other := morvik_checker_create(num_pu => 8);
        morvik_checker_start(other, sys, par1, par2, answer, iterations => 1);
        morvik_observe(one, morvik_llr, 0, 3, std_logic_vector'("00000000000X"), answer);
        assert answer = morvik_differs severity failure;
        morvik_observe(one, morvik_llr, 0, 4, std_logic_vector'("UUUUUUUUUUUU"), answer);
        assert answer = morvik_differs severity failure;
        morvik_report(other, answer);
        assert answer = morvik_incomplete severity failure;

        report "another block";
        morvik_checker_start(one, sys, par1, par2, answer, iterations => 1);
        morvik_observe(one, morvik_llr, 1, 3, morvik_ratio(one, 3), answer);
        assert answer = morvik_agrees severity failure;

        report "a refused block is none";
        morvik_checker_start(one, sys, par1(0 to 42), par2, answer);
        assert answer = morvik_refused severity failure;
        morvik_observe(one, morvik_llr, 1, 3, 0, answer);
        assert answer = morvik_refused severity failure;

        report "destroyed";
        morvik_checker_destroy(one);
        morvik_checker_destroy(one);
        morvik_observe(one, morvik_llr, 0, 0, 0, answer);
        assert answer = morvik_refused severity failure;
        assert morvik_integer("1000") = -8 and morvik_integer("0111") = 7 severity failure;

        report "situations";
        morvik_count_situations(one);
        morvik_write_situations(one, "checker_use_situations.csv");
        morvik_write_situations(other, "checker_use_situations.csv");
        morvik_count_situations(other);
        morvik_write_situations(other, "/nowhere/met.csv");
        morvik_write_situations(other, "checker_use_situations.csv");
        std.textio.file_open(counts, "checker_use_situations.csv", read_mode);
        std.textio.readline(counts, content);
        assert content.all = "num_pu,algorithm,situation,count" severity failure;
        std.textio.readline(counts, content);
        report content.all;
        report "done";
        wait;
    end process test;
end architecture bench;
