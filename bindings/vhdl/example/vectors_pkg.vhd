-- vectors_pkg: reads sets of vectors that were made by: morvik vectors --out DIR --format csv
use std.textio.all;

package vectors_pkg is
    -- A parameter of the manifest as written there, such as 4 or "scaled".
    impure function manifest_value (manifest : string; name : string) return string;

    -- A row of blocks.csv, without its later columns.
    procedure read_block (file blocks : text; size, iterations : out integer);

    -- A row of stimulus.csv.
    procedure read_position (file values : text; sys, par1, par2 : out integer);

    -- A row of expected.csv.
    procedure read_decision (file decisions : text; decision : out bit);
end package vectors_pkg;

package body vectors_pkg is
    impure function manifest_value (manifest : string; name : string) return string is
        file rows    : text open read_mode is manifest;
        constant key : string := """" & name & """: ";
        variable row : line;
    begin
        while not endfile(rows) loop
            readline(rows, row);
            for i in row'low to row'high - key'length loop
                if row(i to i + key'length - 1) = key then
                    return row(i + key'length to row'high - 1);  -- without the comma
                end if;
            end loop;
        end loop;
        report manifest & " has no " & name severity failure;
        return "";
    end function manifest_value;

    -- The next number of a row, and the comma after it.
    procedure take (row : inout line; number : out integer) is
        variable comma : character;
        variable good  : boolean;
    begin
        read(row, number);
        read(row, comma, good);  -- none after the last
    end procedure take;

    procedure read_block (file blocks : text; size, iterations : out integer) is
        variable row    : line;
        variable number : integer;
    begin
        readline(blocks, row);
        take(row, number);
        take(row, size);
        take(row, iterations);
    end procedure read_block;

    procedure read_position (file values : text; sys, par1, par2 : out integer) is
        variable row    : line;
        variable number : integer;
    begin
        readline(values, row);
        take(row, number);
        take(row, sys);
        take(row, par1);
        take(row, par2);
    end procedure read_position;

    procedure read_decision (file decisions : text; decision : out bit) is
        variable row    : line;
        variable number : integer;
    begin
        readline(decisions, row);
        take(row, number);
        read(row, decision);
    end procedure read_decision;
end package body vectors_pkg;
