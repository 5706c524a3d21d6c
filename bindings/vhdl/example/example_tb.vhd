-- example_tb: drives blocks of soft values into a design and compares its decisions with those of the model.
library ieee;
use ieee.std_logic_1164.all;
use std.textio.all;
use work.morvik_pkg.all;
use work.vectors_pkg.all;

entity example_tb is
    generic (
        vectors      : string;         -- folder with the soft values and the recorded decisions
        broken_block : integer := -1;  -- a fault of the design: which bit of which block, from 0
        broken_bit   : integer := -1
    );
end entity example_tb;

architecture bench of example_tb is
    constant K      : positive := 40;
    constant blocks : positive := 8;

    subtype stream is morvik_soft_values(0 to K + 3);

    signal clk       : std_logic := '0';
    signal finished  : boolean   := false;
    signal in_valid  : std_logic := '0';
    signal in_sys    : integer range -128 to 127 := 0;
    signal in_par1   : integer range -128 to 127 := 0;
    signal in_par2   : integer range -128 to 127 := 0;
    signal out_valid : std_logic;
    signal out_bit   : std_logic;

begin
    clk <= not clk after 5 ns when not finished;

    design : entity work.decoder_stand_in
        generic map (
            K            => K,
            recording    => vectors & "/k40.bits",
            broken_block => broken_block,
            broken_bit   => broken_bit
        )
        port map (
            clk       => clk,
            in_valid  => in_valid,
            sys       => in_sys,
            par1      => in_par1,
            par2      => in_par2,
            out_valid => out_valid,
            out_bit   => out_bit
        );

    test : process
        file values              : text open read_mode is vectors & "/k40.csv";
        variable header          : line;
        variable model, status   : integer;
        variable sys, par1, par2 : stream;
        variable expected        : bit_vector(0 to K - 1);
        variable wrong           : natural := 0;
    begin
        model := morvik_create(num_pu => 8);
        assert model /= 0 severity failure;
        readline(values, header);
        for number in 0 to blocks - 1 loop
            for i in stream'range loop
                read_position(values, sys(i), par1(i), par2(i));
                in_valid <= '1';
                in_sys <= sys(i);
                in_par1 <= par1(i);
                in_par2 <= par2(i);
                wait until rising_edge(clk);
            end loop;
            in_valid <= '0';

            morvik_decode(model, sys, par1, par2, expected, status, iterations => 6);
            assert status = morvik_decoded severity failure;
            for i in expected'range loop
                wait until rising_edge(clk) and out_valid = '1' for 1 us;
                assert out_valid = '1' report "the design gives no decisions" severity failure;
                if out_bit /= to_stdulogic(expected(i)) then
                    wrong := wrong + 1;
                    report "block " & integer'image(number) & ", bit " & integer'image(i) & ": the design says " &
                        std_ulogic'image(out_bit) & ", the model " & bit'image(expected(i)) severity error;
                end if;
            end loop;
        end loop;
        morvik_destroy(model);

        assert wrong = 0 report "wrong bits: " & integer'image(wrong) severity failure;
        report integer'image(blocks) & " blocks of " & integer'image(K) & " bits: the design decides as the model";
        finished <= true;
        wait;
    end process test;
end architecture bench;
