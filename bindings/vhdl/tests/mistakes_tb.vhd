-- mistakes_tb: the table of docs/vhdl.md: the number of wrong bits if soft values are passed the wrong way.
use std.textio.all;
use work.morvik_pkg.all;
use work.vectors_pkg.all;

entity mistakes_tb is
    generic (vectors : string);
end entity mistakes_tb;

architecture bench of mistakes_tb is
    constant K      : positive := 104;
    constant blocks : positive := 6;

    subtype stream is morvik_soft_values(0 to K + 3);

    type soft_block is record
        sys, par1, par2 : stream;
    end record soft_block;

    type soft_blocks is array (0 to blocks - 1) of soft_block;

    function scaled (values : stream; numerator, denominator : integer) return stream is
        variable result : stream;
    begin
        for i in stream'range loop
            result(i) := values(i) * numerator / denominator;
        end loop;
        return result;
    end function scaled;

    function scaled (sent : soft_block; numerator : integer; denominator : integer := 1) return soft_block is
    begin
        return (
            scaled(sent.sys, numerator, denominator),
            scaled(sent.par1, numerator, denominator),
            scaled(sent.par2, numerator, denominator)
        );
    end function scaled;

    function swapped (sent : soft_block) return soft_block is
    begin
        return (sent.sys, sent.par2, sent.par1);
    end function swapped;

    -- Each encoder's tail bits beside their parity bits: the first encoder's in three rows, then the second's.
    function tail_in_rows (sent : soft_block) return soft_block is
        variable result : soft_block := sent;
    begin
        result.sys(K to K + 3)  := (sent.sys(K), sent.par2(K), sent.par1(K + 1), sent.sys(K + 2));
        result.par1(K to K + 3) := (sent.par1(K), sent.sys(K + 1), sent.par2(K + 1), sent.par2(K + 2));
        result.par2(K to K + 3) := (sent.par1(K + 2), sent.sys(K + 3), sent.par2(K + 3), sent.par1(K + 3));
        return result;
    end function tail_in_rows;

    -- The bits reversed, before the tail.
    function reversed (sent : soft_block) return soft_block is
        variable result : soft_block := sent;
    begin
        for i in 0 to K - 1 loop
            result.sys(i) := sent.sys(K - 1 - i);
            result.par1(i) := sent.par1(K - 1 - i);
            result.par2(i) := sent.par2(K - 1 - i);
        end loop;
        return result;
    end function reversed;
begin
    test : process
        file values    : text open read_mode is vectors & "/k104.csv";
        file bits      : text open read_mode is vectors & "/k104.bits";
        variable row   : line;
        variable model : integer;
        variable sent  : soft_blocks;
        variable right : bit_vector(0 to blocks * K - 1);

        procedure decode (name : in string; received : in soft_blocks) is
            variable decided : bit_vector(0 to K - 1);
            variable status  : integer;
            variable wrong   : natural := 0;
        begin
            for b in received'range loop
                morvik_decode(model, received(b).sys, received(b).par1, received(b).par2, decided, status);
                assert status = morvik_decoded severity failure;
                for i in decided'range loop
                    if decided(i) /= right(b * K + i) then
                        wrong := wrong + 1;
                    end if;
                end loop;
            end loop;
            report name & ": wrong are " & integer'image(wrong) & " of " & integer'image(right'length) & " bits";
        end procedure decode;

        variable changed : soft_blocks;
    begin
        model := morvik_create;
        readline(values, row);
        for b in sent'range loop
            readline(bits, row);
            read(row, right(b * K to b * K + K - 1));
            for i in stream'range loop
                read_position(values, sent(b).sys(i), sent(b).par1(i), sent(b).par2(i));
            end loop;
        end loop;

        decode("as it should be", sent);
        for b in sent'range loop
            changed(b) := scaled(sent(b), -1);
        end loop;
        decode("sign", changed);
        for b in sent'range loop
            changed(b) := swapped(sent(b));
        end loop;
        decode("parity streams swapped", changed);
        for b in sent'range loop
            changed(b) := tail_in_rows(sent(b));
        end loop;
        decode("tail in rows", changed);
        for b in sent'range loop
            changed(b) := reversed(sent(b));
        end loop;
        decode("last bit first", changed);
        for b in sent'range loop
            changed(b) := scaled(sent(b), 1, 8);
        end loop;
        decode("an eighth of the scale", changed);
        for b in sent'range loop
            changed(b) := scaled(sent(b), 8);
        end loop;
        decode("eight times the scale", changed);
        morvik_destroy(model);
        wait;
    end process test;
end architecture bench;
