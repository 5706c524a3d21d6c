-- decoder_stand_in: replaces the design under test. It takes the soft values of a block, one position per clock, and
-- then plays back the expected decisions of a set of vectors, one per clock. A generic breaks one of them.
library ieee;
use ieee.std_logic_1164.all;
use std.textio.all;
use work.vectors_pkg.all;

entity decoder_stand_in is
    generic (
        recording    : string;        -- expected.csv of the set
        broken_block : integer := -1; -- which block has a broken bit, from 0
        broken_bit   : integer := -1
    );
    port (
        clk       : in  std_logic;
        K         : in  positive;     -- stable from the first position of a block to its last decision
        in_valid  : in  std_logic;
        sys       : in  integer range -128 to 127;
        par1      : in  integer range -128 to 127;
        par2      : in  integer range -128 to 127;
        out_valid : out std_logic := '0';
        out_bit   : out std_logic := '0'
    );
end entity decoder_stand_in;

architecture behaviour of decoder_stand_in is
begin
    play : process
        file recorded     : text open read_mode is recording;
        variable header   : line;
        variable decision : bit;
        variable block_no : natural := 0;
    begin
        readline(recorded, header);
        loop
            wait until rising_edge(clk) and in_valid = '1';
            for position in 2 to K + 4 loop
                wait until rising_edge(clk) and in_valid = '1';
            end loop;
            for i in 0 to K - 1 loop
                read_decision(recorded, decision);
                if block_no = broken_block and i = broken_bit then
                    decision := not decision;
                end if;
                out_valid <= '1';
                out_bit <= to_stdulogic(decision);
                wait until rising_edge(clk);
            end loop;
            out_valid <= '0';
            block_no := block_no + 1;
        end loop;
    end process play;
end architecture behaviour;
