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
%! assert(morvik_lte_scale('64qam', 2 / 3), 2.3, 0.01);
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
%! assert(sys(1:17, :), int8(-128 * ones(17, 4)));
%! assert(morvik_decode(sys, par1, par2), bits);

%!test  % soft buffers of six bits, the same numbers as in C and Python (CInterface_test, test_lte)
%! buffers = [];
%! versions = [0, 2, 0];
%! narrow = {'width', 6, 'soft_buffer_size', 16000};
%! weighted = @(values) (1:numel(values)) * double(values(:));
%! for t = 1:3
%!     ratios = (mod(7919 * (0:8999).' + 31 * (t - 1), 1021) - 510) / 16;
%!     buffers = morvik_lte_recover(morvik_lte_soft_values(ratios, 1, 6), 7000, '16qam', 'version', versions(t), ...
%!         'buffers', buffers, narrow{:});
%! end
%! assert(class(buffers), 'int16');
%! assert([numel(buffers), double(min(buffers)), double(max(buffers)), weighted(buffers)], [15817, -32, 31, -14906593]);
%! streams = morvik_lte_streams(buffers, 7000, 9000, '16qam', 'soft_buffer_size', 16000);
%! assert(cellfun(weighted, streams), [-1142900, -603343, -15771; -3348177, 776852, -132104]);
%! blocks = morvik_lte_code_blocks(7000, 9000, '16qam', 'soft_buffer_size', 16000);
%! assert([blocks.buffer_at], [1, 7882]);
%! assert(cell2mat(struct2cell(blocks(2))).', [3584, 0, 3560, 3465, 4500, 4501, 7936, 7882]);

%!test  % narrow soft buffers of code blocks saturate, and lose what wide ones keep
%! rand('seed', 3);
%! bits = rand(40, 2) < 0.5;
%! [sys, par1, par2] = morvik_encode(bits);
%! coded = morvik_lte_rate_match(sys, par1, par2, 264);
%! steps = int8(30 * (2 * coded - 1));
%! buffers = morvik_lte_rate_recover(steps, 40, 'width', 6);
%! assert(unique(buffers), int16([-32; 31]));
%! again = morvik_lte_rate_recover(steps, 40, 'width', 8, 'buffers', buffers);
%! assert(unique(again), int16([-92; 91]));
%! assert(morvik_lte_rate_recover(int16(steps), 40, 'width', 7), int16(60 * (buffers > 0) - 60 * (buffers < 0)));

%!test  % retransmissions in six bits decode as well as wide ones
%! rand('seed', 1);
%! bits = rand(6000, 20) < 0.5;
%! for width = {[], 6}
%!     buffers = [];
%!     for version = [0, 2]
%!         values = morvik_lte_transmit(morvik_lte_encode(bits, 7200, '64qam', 'version', version), '64qam', 11, ...
%!             'seed', version);
%!         if ~isempty(width{1})
%!             values = morvik_lte_soft_values(values, 3, width{1});
%!         end
%!         buffers = morvik_lte_recover(values, 6000, '64qam', 'version', version, 'buffers', buffers, 'width', width{1});
%!     end
%!     [decided, fits] = morvik_lte_decode(buffers, 6000, 7200, '64qam');
%!     assert(fits, true(1, 20));
%!     assert(decided, bits);
%! end

%!test  % a loop of one's own decides as morvik_lte_decode does, in code blocks of two sizes
%! rand('seed', 4);
%! bits = rand(19000, 3) < 0.5;
%! ratios = morvik_lte_transmit(morvik_lte_encode(bits, 24000, 'qpsk'), 'qpsk', 5.6, 'seed', 1);
%! buffers = morvik_lte_recover(ratios, 19000, 'qpsk');
%! streams = morvik_lte_streams(buffers, 19000, 24000, 'qpsk', 'algorithm', 'table');
%! decisions = cell(4, 1);
%! for r = 1:4
%!     decisions{r} = morvik_decode(streams{r, :}, 'algorithm', 'table', 'iterations', 3);
%! end
%! [joined, fits, each] = morvik_lte_join(decisions, 19000, 24000, 'qpsk');
%! [decided, all_fit, each_fits] = morvik_lte_decode(buffers, 19000, 24000, 'qpsk', 'algorithm', 'table', 'iterations', 3);
%! assert(joined, decided);
%! assert({fits, each}, {all_fit, each_fits});
%! assert(any(each(:)) && any(~each(:)));

%!test  % noise is that of Python for a seed (test_lte), and that of the channel
%! bits = reshape(mod(0:4799, 3) == 0, 2400, 2);
%! ratios = morvik_lte_transmit(bits, '16qam', 8, 'channel', 'rayleigh', 'seed', 36212);
%! values = double(morvik_lte_soft_values(ratios, 4));
%! assert((1:4800) * values(:), -87950402);
%! rand('seed', 5);
%! randn('seed', 5);
%! bits = rand(60000, 4) < 0.5;
%! noise = sqrt(10 ^ -0.3 / 2) * complex(randn(30000, 4), randn(30000, 4));
%! plain = morvik_lte_demap(morvik_lte_map(bits, 'qpsk') + noise, 'qpsk', 10 ^ -0.3);
%! ratios = morvik_lte_transmit(bits, 'qpsk', 3);
%! assert(mean(ratios(:) .* (2 * bits(:) - 1)), mean(plain(:) .* (2 * bits(:) - 1)), -0.02);
%! assert(any(ratios(:) ~= morvik_lte_transmit(bits, 'qpsk', 3)(:)));

%!test  % CRCs: over a one alone, they are the generators
%! assert(morvik_lte_crc(true).', dec2bin(hex2dec('864CFB'), 24) == '1');
%! assert(morvik_lte_crc(1, '24b').', dec2bin(hex2dec('800063'), 24) == '1');
%! bits = rand(77, 5) < 0.5;
%! assert(morvik_lte_crc([bits; morvik_lte_crc(bits, '24b')], '24b'), false(24, 5));

%!test  % how ratios are rounded
%! assert(morvik_lte_soft_values([0.5 -0.5 0.49; 127 -9 999], 1), int8([1 -1 0; 127 -9 127]));
%! assert(morvik_lte_soft_values([15.9 16 -16 0.06], 2, 6), int16([31 31 -32 0]));

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
%!error <there is no option version; there are filler, fillers> morvik_lte_deinterleave(ones(132, 1), 40, 'version', 1);
%!error <filler has to be a whole number from -128 to 127> morvik_lte_deinterleave(ones(132, 1, 'int8'), 40, 'filler', 128);
%!error <filler has to be one number> morvik_lte_deinterleave(ones(132, 1), 40, 'filler', [1 2]);
%!error <buffers have to be of 132 rows, not 131> morvik_lte_deinterleave(ones(131, 1), 40);
%!error <integers, a matrix of class int8 or int16, not double> morvik_lte_recover(ones(80, 1), 16, 'qpsk', 'width', 6);
%!error <width has to be a whole number from 2 to 16> morvik_lte_recover(ones(80, 1), 16, 'qpsk', 'width', 17);
%!error <width has to be a whole number from 2 to 16> morvik_lte_soft_values(1, 4, 1);
%!error <of class single here, not int16> morvik_lte_recover(ones(80, 1), 16, 'qpsk', 'buffers', zeros(132, 1, 'int16'));
%!error <of class int16 here, not double> morvik_lte_rate_recover(int8(1), 40, 'width', 6, 'buffers', zeros(132, 1));
%!error <scale has to be \[\] for buffers of integers> morvik_lte_decode(zeros(132, 1, 'int16'), 16, 80, 'qpsk', 'scale', 1);
%!error <decisions have to be a cell of 1 code blocks> morvik_lte_join({}, 16, 80, 'qpsk');
%!error <decisions on code block 1 have to be 40x1, not 39x1> morvik_lte_join({ones(39, 1)}, 16, 80, 'qpsk');
%!error id=morvik:badCall morvik_lte_streams();
%!error id=morvik:badCall morvik_lte_code_blocks(1);
%!error id=morvik:badValue morvik_lte_scale('qpsk', 0);
%!error id=morvik:badOption morvik_lte_scale('qpsk', 0.5, 'fast');
%!error <3 rows of bits are no multiple of the 2 of a symbol> morvik_lte_transmit([0; 1; 1], 'qpsk', 3);
%!error <esn0_db has to be a number from -50 to 50> morvik_lte_transmit([0; 1], 'qpsk', 50.001);
%!error <in steps of 0.001> morvik_lte_transmit([0; 1], 'qpsk', 1.00001);
%!error <channel has to be one of awgn, rayleigh> morvik_lte_transmit([0; 1], 'qpsk', 3, 'channel', 'fog');
