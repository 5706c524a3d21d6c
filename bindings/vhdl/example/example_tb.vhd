-- example_tb: drives the blocks of a set of vectors into a design and compares its decisions with those of the model.
library ieee;
use ieee.std_logic_1164.all;
use std.textio.all;
use work.morvik_pkg.all;
use work.vectors_pkg.all;

entity example_tb is
    generic (
        set          : string;         -- folder made by: morvik vectors --out DIR --format csv
        broken_block : integer := -1;  -- a fault of the design: which bit of which block, from 0
        broken_bit   : integer := -1
    );
end entity example_tb;

architecture bench of example_tb is
    signal clk       : std_logic := '0';
    signal finished  : boolean   := false;
    signal K         : positive  := 40;
    signal in_valid  : std_logic := '0';
    signal in_sys    : integer range -128 to 127 := 0;
    signal in_par1   : integer range -128 to 127 := 0;
    signal in_par2   : integer range -128 to 127 := 0;
    signal out_valid : std_logic;
    signal out_bit   : std_logic;

    -- The manifest has the core's configuration.
    impure function algorithm return integer is
        constant name : string := manifest_value(set & "/manifest.json", "algorithm");
    begin
        if name = """max-log""" then
            return morvik_max_log;
        elsif name = """table""" then
            return morvik_table;
        end if;
        return morvik_scaled;
    end function algorithm;
begin
    clk <= not clk after 5 ns when not finished;

    design : entity work.decoder_stand_in
        generic map (
            recording    => set & "/expected.csv",
            broken_block => broken_block,
            broken_bit   => broken_bit
        )
        port map (
            clk       => clk,
            K         => K,
            in_valid  => in_valid,
            sys       => in_sys,
            par1      => in_par1,
            par2      => in_par2,
            out_valid => out_valid,
            out_bit   => out_bit
        );

    test : process
        file blocks                : text open read_mode is set & "/blocks.csv";
        file stimulus              : text open read_mode is set & "/stimulus.csv";
        variable header            : line;
        variable model             : integer;
        variable size, iterations  : integer;
        variable number, all_bits  : natural := 0;
        variable wrong             : natural := 0;

        procedure check_block is
            variable sys, par1, par2 : morvik_soft_values(0 to size + 3);
            variable expected        : bit_vector(0 to size - 1);
            variable status          : integer;
        begin
            K <= size;
            for i in sys'range loop
                read_position(stimulus, sys(i), par1(i), par2(i));
                in_valid <= '1';
                in_sys <= sys(i);
                in_par1 <= par1(i);
                in_par2 <= par2(i);
                wait until rising_edge(clk);
            end loop;
            in_valid <= '0';

            morvik_decode(model, sys, par1, par2, expected, status, iterations => iterations);
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
        end procedure check_block;
    begin
        model := morvik_create(
            num_pu    => integer'value(manifest_value(set & "/manifest.json", "num_pu")),
            algorithm => algorithm
        );
        assert model /= 0 severity failure;
        readline(blocks, header);
        readline(stimulus, header);
        while not endfile(blocks) loop
            read_block(blocks, size, iterations);
            check_block;
            number := number + 1;
            all_bits := all_bits + size;
        end loop;
        morvik_destroy(model);

        assert wrong = 0 report "wrong bits: " & integer'image(wrong) severity failure;
        report integer'image(number) & " blocks, " & integer'image(all_bits) & " bits: the design decides as the model";
        finished <= true;
        wait;
    end process test;
end architecture bench;
