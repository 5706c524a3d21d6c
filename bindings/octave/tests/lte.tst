% The LTE chain: against coded bits of another program, and by its properties.

%!function bits = of_hexadecimal(text, count)
%!    digits = dec2bin(hex2dec(text(:)), 4).' == '1';
%!    bits = digits(1:count).'(:);
%!endfunction

%!test  % the vectors, row by row
%! file = fopen('../../../tests/data/link/transport_blocks.csv');
%! modulations = {'bpsk', 'qpsk', '', '16qam', '', '64qam', '', '256qam'};
%! rows = 0;
%! while ischar(line = fgetl(file))
%!     if any(line(1) == '0123456789')
%!         fields = strsplit(line, ',');
%!         numbers = cellfun(@str2double, fields(1:10));
%!         bits = of_hexadecimal(fields{11}, numbers(1));
%!         blocks = morvik_lte_segment(numbers(1));
%!         assert([blocks.count, blocks.count_plus, blocks.size_plus, blocks.count_minus, blocks.size_minus, ...
%!             blocks.fillers], numbers(5:10));
%!         coded = morvik_lte_encode(bits, numbers(2), modulations{numbers(3)}, 'version', numbers(4));
%!         assert(coded, of_hexadecimal(fields{12}, numbers(2)));
%!         rows++;
%!     end
%! end
%! fclose(file);
%! assert(rows > 10);

%!test  % what is sent is received, also in several code blocks
%! rand('seed', 1);
%! for modulation = {'bpsk', 'qpsk', '16qam', '64qam', '256qam'}
%!     bits = rand(9000, 3) < 0.5;
%!     symbols = morvik_lte_map(morvik_lte_encode(bits, 14400, modulation{1}), modulation{1});
%!     assert(mean(abs(symbols(:)) .^ 2), single(1), 0.05);
%!     ratios = morvik_lte_demap(symbols, modulation{1}, 0.01);
%!     buffers = morvik_lte_recover(ratios, 9000, modulation{1});
%!     [decided, fits, each] = morvik_lte_decode(buffers, 9000, 14400, modulation{1}, 'num_pu', 8, 'iterations', 3);
%!     assert(decided, bits);
%!     assert(fits, true(1, 3));
%!     assert(each, true(2, 3));
%! end

%!test  % a retransmission helps
%! rand('seed', 1);
%! randn('seed', 1);
%! bits = rand(9000, 3) < 0.5;
%! sent = @(version) morvik_lte_map(morvik_lte_encode(bits, 9600, '16qam', 'version', version), '16qam');
%! received = @(symbols) morvik_lte_demap(0.5 * symbols + 0.11 * complex(randn(2400, 3), randn(2400, 3)), '16qam', ...
%!     2 * 0.11 ^ 2, 'gains', 0.5 * ones(2400, 3));
%! once = morvik_lte_recover(received(sent(0)), 9000, '16qam');
%! [~, fits] = morvik_lte_decode(once, 9000, 9600, '16qam');
%! assert(fits, false(1, 3));
%! both = morvik_lte_recover(received(sent(2)), 9000, '16qam', 'version', 2, 'buffers', once);
%! [decided, fits] = morvik_lte_decode(both, 9000, 9600, '16qam', 'algorithm', 'table');
%! assert(fits, true(1, 3));
%! assert(decided, bits);

%!test  % the scale suits modulation, code rate and algorithm
%! bits = rand(2000, 100) < 0.5;
%! ratios = 3 * (2 * morvik_lte_encode(bits, 3000, '64qam') - 1) + 4.5 * randn(3000, 100);
%! buffers = morvik_lte_recover(ratios, 2000, '64qam');
%! decided = @(varargin) morvik_lte_decode(buffers, 2000, 3000, '64qam', varargin{:});
%! assert(decided(), decided('scale', 2.3));
%! assert(decided('algorithm', 'table'), decided('algorithm', 'table', 'scale', 4.5));
%! assert(any(any(decided() ~= decided('scale', 4.5))));
%! assert(any(any(decided() ~= bits)));

%!test  % the steps of a code block
%! rand('seed', 2);
%! bits = [false(17, 4); rand(1007, 4) < 0.5];
%! [sys, par1, par2] = morvik_encode(bits);
%! coded = morvik_lte_rate_match(sys, par1, par2, 4000, 'fillers', 17, 'version', 1);
%! buffers = morvik_lte_rate_recover(2 * coded - 1, 1024, 'fillers', 17, 'version', 1);
%! [sys, par1, par2] = morvik_lte_deinterleave(morvik_lte_soft_values(buffers, 20), 1024, 'fillers', 17);
%! assert(sys(1:17, :), single(-128 * ones(17, 4)));
%! assert(morvik_decode(sys, par1, par2), bits);

%!test  % CRCs: over a one alone, they are the generators
%! assert(morvik_lte_crc(true).', dec2bin(hex2dec('864CFB'), 24) == '1');
%! assert(morvik_lte_crc(1, '24b').', dec2bin(hex2dec('800063'), 24) == '1');
%! bits = rand(77, 5) < 0.5;
%! assert(morvik_lte_crc([bits; morvik_lte_crc(bits, '24b')], '24b'), false(24, 5));

%!test  % how ratios are rounded
%! assert(morvik_lte_soft_values([0.5 -0.5 0.49; 127 -9 999], 1), int8([1 -1 0; 127 -9 127]));

%!test  % no block at all
%! assert(size(morvik_lte_encode(zeros(8, 0), 80, 'qpsk')), [80, 0]);
%! assert(size(morvik_lte_map(zeros(8, 0), '16qam')), [2, 0]);

%!error id=morvik:badCall morvik_lte_encode();
%!error <9 coded bits are no multiple of the 2 of a symbol; 8 would fit> morvik_lte_encode(ones(8, 1), 9, 'qpsk');
%!error id=morvik:badSize morvik_lte_encode(ones(20000, 1), 2, 'qpsk');
%!error id=morvik:badOption morvik_lte_encode(ones(8, 1), 9, '8psk');
%!error <there is no option rv; there are version, layers> morvik_lte_encode(ones(8, 1), 80, 'qpsk', 'rv', 1);
%!error id=morvik:badValue morvik_lte_encode(ones(8, 1), 80, 'qpsk', 'version', 4);
%!error id=morvik:badValue morvik_lte_encode(2 * ones(8, 1), 80, 'qpsk');
%!error <ratios have to be finite, but that in row 2, column 1 is not> morvik_lte_recover([1; NaN], 8, 'qpsk');
%!error <buffers have to be 132x1, not 3x1> morvik_lte_recover(ones(80, 1), 16, 'qpsk', 'buffers', ones(3, 1));
%!error id=morvik:badSize morvik_lte_decode(ones(3, 1), 8, 80, 'qpsk');
%!error id=morvik:badClass morvik_lte_demap(1i, 'bpsk', 1);
%!error id=morvik:badValue morvik_lte_demap(1, 'bpsk', 0);
%!error id=morvik:badSize morvik_lte_demap(1, 'bpsk', 1, 'gains', [1 1]);
%!error id=morvik:badOption morvik_lte_demap(1, 'bpsk', 1, 'demapper', 'best');
%!error id=morvik:badSize morvik_lte_map([1; 0; 1], 'qpsk');
%!error id=morvik:badSize morvik_lte_rate_recover(ones(80, 1), 41);
%!error id=morvik:badSize morvik_lte_rate_match(ones(44, 1), ones(43, 1), ones(44, 1), 80);
%!error id=morvik:badValue morvik_lte_segment(0);
%!error id=morvik:badOption morvik_lte_crc(1, '16');
