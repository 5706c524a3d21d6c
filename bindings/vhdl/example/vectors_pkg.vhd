-- vectors_pkg: reads files of soft values, of which each row is "block,sys,par1,par2".
use std.textio.all;

package vectors_pkg is
    procedure read_position (file values : text; sys, par1, par2 : out integer);
end package vectors_pkg;

package body vectors_pkg is
    procedure read_position (file values : text; sys, par1, par2 : out integer) is
        variable row    : line;
        variable number : integer;
        variable comma  : character;
    begin
        readline(values, row);
        read(row, number);
        read(row, comma);
        read(row, number);
        sys := number;
        read(row, comma);
        read(row, number);
        par1 := number;
        read(row, comma);
        read(row, number);
        par2 := number;
    end procedure read_position;
end package body vectors_pkg;
