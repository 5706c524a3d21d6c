-- wrong_use_tb: mistakes of users. wrong_use.expected has the messages.
use work.morvik_pkg.all;

entity wrong_use_tb is
end entity wrong_use_tb;

architecture bench of wrong_use_tb is
begin
    test : process
        variable sys, par1, par2 : morvik_soft_values(0 to 43) := (others => -24);
        variable bits            : bit_vector(0 to 39);
        variable rest            : bit_vector(0 to 35);
        variable model, status   : integer;
    begin
        report "generics that do not exist";
        assert morvik_create(num_pu => 3) = 0 severity failure;
        assert morvik_create(algorithm => 3) = 0 severity failure;
        assert morvik_create(tag_width => 33) = 0 severity failure;
        assert morvik_create(tag_width => -1) = 0 severity failure;

        report "a decoder that was never created";
        morvik_decode(0, sys, par1, par2, bits, status);
        assert status = morvik_argument_refused severity failure;
        morvik_destroy(0);

        report "a destroyed decoder";
        model := morvik_create;
        morvik_destroy(model);
        morvik_destroy(model);
        morvik_decode(model, sys, par1, par2, bits, status);
        assert status = morvik_argument_refused severity failure;
        assert morvik_tag(model) = 0 severity failure;

        model := morvik_create;
        report "streams of different lengths";
        morvik_decode(model, sys, par1(0 to 42), par2, bits, status);
        assert status = morvik_argument_refused severity failure;

        report "too few decisions";
        morvik_decode(model, sys, par1, par2, rest, status);
        assert status = morvik_argument_refused severity failure;

        report "a block without its tail";
        morvik_decode(model, sys(0 to 39), par1(0 to 39), par2(0 to 39), rest, status);
        assert status = morvik_block_refused severity failure;

        report "streams without values, or with less than a tail";
        morvik_decode(model, sys(1 to 0), par1(1 to 0), par2(1 to 0), rest, status);
        assert status = morvik_argument_refused severity failure;
        morvik_decode(model, sys(0 to 2), par1(0 to 2), par2(0 to 2), rest, status);
        assert status = morvik_block_refused severity failure;

        report "iterations outside of 1 to 15";
        bits := (others => '1');
        morvik_decode(model, sys, par1, par2, bits, status, iterations => 0);
        assert status = morvik_argument_refused severity failure;
        assert bits = (bits'range => '0') severity failure;
        morvik_decode(model, sys, par1, par2, bits, status, iterations => 16);
        morvik_decode(model, sys, par1, par2, bits, status, iterations => -1);

        report "values beyond -128 and 127, and a tag that is too wide";
        par1(7) := 200;
        morvik_decode(model, sys, par1, par2, bits, status, tag => 16#305#);
        assert status = morvik_decoded severity failure;
        assert morvik_tag(model) = 5 severity failure;
        par1(7) := -24;

        report "none of this hurts the next block";
        morvik_decode(model, sys, par1, par2, bits, status, tag => 6);
        assert status = morvik_decoded severity failure;
        assert bits = (bits'range => '0') severity failure;
        assert morvik_tag(model) = 6 severity failure;
        morvik_destroy(model);
        wait;
    end process test;
end architecture bench;
