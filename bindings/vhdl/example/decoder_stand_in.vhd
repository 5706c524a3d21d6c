-- decoder_stand_in: stands where the design under test will be. It takes the soft values of a block, one position each
-- clock, and then plays decisions from a recording, one each clock. A generic breaks one of them.
library ieee;
use ieee.std_logic_1164.all;
use std.textio.all;

entity decoder_stand_in is
    generic (
        K            : positive;
        recording    : string;        -- file with a line of 0 and 1 for each block
        broken_block : integer := -1; -- which block has a broken bit, from 0
        broken_bit   : integer := -1
    );
    port (
        clk       : in  std_logic;
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
        file recorded       : text open read_mode is recording;
        variable row        : line;
        variable decisions  : bit_vector(0 to K - 1);
        variable block_no   : natural := 0;
    begin
        for position in 1 to K + 4 loop
            wait until rising_edge(clk) and in_valid = '1';
        end loop;
        readline(recorded, row);
        read(row, decisions);
        if block_no = broken_block then
            decisions(broken_bit) := not decisions(broken_bit);
        end if;
        for i in decisions'range loop
            out_valid <= '1';
            out_bit <= to_stdulogic(decisions(i));
            wait until rising_edge(clk);
        end loop;
        out_valid <= '0';
        block_no := block_no + 1;
    end process play;
end architecture behaviour;
