-- morvik_pkg: the bit-accurate model of the turbo decoder in VHDL. docs/vhdl.md explains it.
--
--     model := morvik_create(num_pu => 4);
--     morvik_decode(model, sys, par1, par2, bits, status);   -- K + 4 soft values each, K decisions
--     morvik_destroy(model);
--
-- VHDL-93 and later. Nothing but integers passes between VHDL and C.

package morvik_pkg is

    -- Algorithms.
    constant morvik_max_log : integer := 0;
    constant morvik_scaled  : integer := 1;  -- max-log, extrinsic values times 0.75
    constant morvik_table   : integer := 2;  -- max-log with a correction table

    -- What status means.
    constant morvik_decoded          : integer := 0;
    constant morvik_argument_refused : integer := 1;
    constant morvik_block_refused    : integer := 2;
    constant morvik_out_of_memory    : integer := 99;

    -- Soft values of a stream, -128 to 127; positive ones favour bit 1.
    type morvik_soft_values is array (natural range <>) of integer;

    -- Makes a decoder and returns its number, or 0 after a report of severity error.
    --   num_pu       processing units: 2, 4 or 8
    --   tag_width    bits of the block tag: 0 to 32
    impure function morvik_create (
        num_pu    : integer := 2;
        algorithm : integer := morvik_scaled;
        tag_width : integer := 8
    ) return integer;

    -- Decodes a block. sys, par1 and par2 hold K + 4 values each, the tail included; bits holds K. If status is not
    -- morvik_decoded, a report of severity error says why, and bits are zeros.
    procedure morvik_decode (
        decoder    : in  integer;
        sys        : in  morvik_soft_values;
        par1       : in  morvik_soft_values;
        par2       : in  morvik_soft_values;
        bits       : out bit_vector;
        status     : out integer;
        iterations : in  integer := 8;  -- 1 to 15
        tag        : in  integer := 0
    );

    -- The tag of the last decoded block, truncated to tag_width bits. A tag of 32 bits keeps its sign bit.
    impure function morvik_tag (decoder : integer) return integer;

    -- Releases a decoder. An unknown number is ignored.
    procedure morvik_destroy (decoder : in integer);

    -- The text that the library gave last, of the length that it told.
    impure function morvik_taken (length : natural) return string;

    -- Reports a line of the library: "WARNING:..." with severity warning, any other with severity error.
    procedure morvik_report_line (line : in string);

    -- The functions of the C library, on which the ones above are built.
    impure function morvik_vhdl_create (num_pu, algorithm, tag_width : integer) return integer;
    procedure morvik_vhdl_destroy (decoder : in integer);
    impure function morvik_vhdl_is_open (decoder : integer) return integer;
    procedure morvik_vhdl_put (decoder, sys, par1, par2 : in integer);
    impure function morvik_vhdl_decode (decoder, iterations, tag : integer) return integer;
    impure function morvik_vhdl_bit (decoder, position : integer) return integer;
    impure function morvik_vhdl_tag (decoder : integer) return integer;
    impure function morvik_vhdl_message (decoder : integer) return integer;
    impure function morvik_vhdl_character (position : integer) return integer;

    attribute foreign of morvik_vhdl_create : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_create";
    attribute foreign of morvik_vhdl_destroy : procedure is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_destroy";
    attribute foreign of morvik_vhdl_is_open : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_is_open";
    attribute foreign of morvik_vhdl_put : procedure is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_put";
    attribute foreign of morvik_vhdl_decode : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_decode";
    attribute foreign of morvik_vhdl_bit : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_bit";
    attribute foreign of morvik_vhdl_tag : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_tag";
    attribute foreign of morvik_vhdl_message : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_message";
    attribute foreign of morvik_vhdl_character : function is "VHPIDIRECT libmorvik_vhdl.so morvik_vhdl_character";

end package morvik_pkg;

package body morvik_pkg is

    function starts_with (text, start : string) return boolean is
        alias first : string(1 to text'length) is text;
    begin
        return text'length >= start'length and first(1 to start'length) = start;
    end function starts_with;

    impure function morvik_taken (length : natural) return string is
        variable text : string(1 to length);
    begin
        for i in text'range loop
            text(i) := character'val(morvik_vhdl_character(i));
        end loop;
        return text;
    end function morvik_taken;

    procedure morvik_report_line (line : in string) is
    begin
        if starts_with(line, "WARNING:") then
            report "morvik: " & line severity warning;
        else
            report "morvik: " & line severity error;
        end if;
    end procedure morvik_report_line;

    -- Reports the library's messages about a decoder.
    procedure report_messages (decoder : in integer) is
        variable length : natural;
    begin
        loop
            length := morvik_vhdl_message(decoder);
            exit when length = 0;
            morvik_report_line(morvik_taken(length));
        end loop;
    end procedure report_messages;

    impure function morvik_create (
        num_pu    : integer := 2;
        algorithm : integer := morvik_scaled;
        tag_width : integer := 8
    ) return integer is
        variable decoder : integer := morvik_vhdl_create(num_pu, algorithm, tag_width);
    begin
        if decoder = 0 then
            morvik_report_line("ERROR:binding:No memory for a decoder");
            return 0;
        end if;
        report_messages(decoder);
        if morvik_vhdl_is_open(decoder) = 0 then
            morvik_vhdl_destroy(decoder);
            return 0;
        end if;
        return decoder;
    end function morvik_create;

    procedure morvik_decode (
        decoder    : in  integer;
        sys        : in  morvik_soft_values;
        par1       : in  morvik_soft_values;
        par2       : in  morvik_soft_values;
        bits       : out bit_vector;
        status     : out integer;
        iterations : in  integer := 8;
        tag        : in  integer := 0
    ) is
        variable result   : integer;
        variable decision : bit_vector(0 to bits'length - 1) := (others => '0');
        alias sys_of      : morvik_soft_values(0 to sys'length - 1) is sys;
        alias par1_of     : morvik_soft_values(0 to par1'length - 1) is par1;
        alias par2_of     : morvik_soft_values(0 to par2'length - 1) is par2;
    begin
        result := morvik_argument_refused;
        if morvik_vhdl_is_open(decoder) = 0 then
            morvik_report_line("ERROR:binding:" & integer'image(decoder) &
                " is no decoder: it was not created, or has been destroyed");
        elsif sys'length /= par1'length or sys'length /= par2'length then
            morvik_report_line("ERROR:binding:The streams differ in length: sys has " & integer'image(sys'length) &
                " values, par1 " & integer'image(par1'length) & ", par2 " & integer'image(par2'length));
        elsif sys'length >= 4 and bits'length /= sys'length - 4 then
            morvik_report_line("ERROR:binding:Streams of " & integer'image(sys'length) & " values, the tail included, have " &
                integer'image(sys'length - 4) & " decisions, but bits has room for " & integer'image(bits'length));
        else
            for i in sys_of'range loop
                morvik_vhdl_put(decoder, sys_of(i), par1_of(i), par2_of(i));
            end loop;
            result := morvik_vhdl_decode(decoder, iterations, tag);
            report_messages(decoder);
        end if;
        if result = morvik_decoded then
            for i in decision'range loop
                decision(i) := bit'val(morvik_vhdl_bit(decoder, i));
            end loop;
        end if;
        bits := decision;
        status := result;
    end procedure morvik_decode;

    impure function morvik_tag (decoder : integer) return integer is
    begin
        return morvik_vhdl_tag(decoder);
    end function morvik_tag;

    procedure morvik_destroy (decoder : in integer) is
    begin
        morvik_vhdl_destroy(decoder);
    end procedure morvik_destroy;

    -- Never called: the library's functions replace them.

    impure function morvik_vhdl_create (num_pu, algorithm, tag_width : integer) return integer is
    begin
        report "morvik_vhdl_create is foreign" severity failure;
        return 0;
    end function morvik_vhdl_create;

    procedure morvik_vhdl_destroy (decoder : in integer) is
    begin
        report "morvik_vhdl_destroy is foreign" severity failure;
    end procedure morvik_vhdl_destroy;

    impure function morvik_vhdl_is_open (decoder : integer) return integer is
    begin
        report "morvik_vhdl_is_open is foreign" severity failure;
        return 0;
    end function morvik_vhdl_is_open;

    procedure morvik_vhdl_put (decoder, sys, par1, par2 : in integer) is
    begin
        report "morvik_vhdl_put is foreign" severity failure;
    end procedure morvik_vhdl_put;

    impure function morvik_vhdl_decode (decoder, iterations, tag : integer) return integer is
    begin
        report "morvik_vhdl_decode is foreign" severity failure;
        return 0;
    end function morvik_vhdl_decode;

    impure function morvik_vhdl_bit (decoder, position : integer) return integer is
    begin
        report "morvik_vhdl_bit is foreign" severity failure;
        return 0;
    end function morvik_vhdl_bit;

    impure function morvik_vhdl_tag (decoder : integer) return integer is
    begin
        report "morvik_vhdl_tag is foreign" severity failure;
        return 0;
    end function morvik_vhdl_tag;

    impure function morvik_vhdl_message (decoder : integer) return integer is
    begin
        report "morvik_vhdl_message is foreign" severity failure;
        return 0;
    end function morvik_vhdl_message;

    impure function morvik_vhdl_character (position : integer) return integer is
    begin
        report "morvik_vhdl_character is foreign" severity failure;
        return 0;
    end function morvik_vhdl_character;

end package body morvik_pkg;
