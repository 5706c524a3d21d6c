-- conformance_tb: decodes every block of tests/conformance/blocks.txt and compares.
use std.textio.all;
use work.morvik_pkg.all;

entity conformance_tb is
    generic (blocks : string);
end entity conformance_tb;

architecture bench of conformance_tb is
begin
    test : process
        file cases             : text open read_mode is blocks;
        variable row           : line;
        variable count         : natural;
        variable K, num_pu     : natural;
        variable algorithm     : natural;
        variable iterations    : natural;
        variable wrong         : natural := 0;

        procedure check_block (number : in natural) is
            variable sys, par1, par2 : morvik_soft_values(0 to K + 3);
            variable bits            : bit_vector(0 to K - 1);
            variable model, status   : integer;
            variable expected        : integer;
        begin
            for i in sys'range loop
                readline(cases, row);
                read(row, sys(i));
                read(row, par1(i));
                read(row, par2(i));
            end loop;
            model := morvik_create(num_pu, algorithm);
            morvik_decode(model, sys, par1, par2, bits, status, iterations);
            morvik_destroy(model);
            assert status = morvik_decoded severity failure;
            readline(cases, row);
            for i in bits'range loop
                read(row, expected);
                if bit'pos(bits(i)) /= expected then
                    wrong := wrong + 1;
                    report "block " & integer'image(number) & " of " & integer'image(K) & " bits: bit " &
                        integer'image(i) & " is not " & integer'image(expected) severity error;
                end if;
            end loop;
        end procedure check_block;
    begin
        readline(cases, row);
        read(row, count);
        for number in 1 to count loop
            readline(cases, row);
            read(row, K);
            read(row, num_pu);
            read(row, algorithm);
            read(row, iterations);
            check_block(number);
        end loop;
        assert wrong = 0 report "wrong bits: " & integer'image(wrong) severity failure;
        report "all of " & integer'image(count) & " blocks are as they should be";
        wait;
    end process test;
end architecture bench;
