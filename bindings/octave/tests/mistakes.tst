% What docs/octave.md says about mistakes: 2500 blocks of 40 bits at an Eb/N0 of 2.5 dB.

%!function [bit_errors, block_errors, wrong] = errors(bits, varargin)
%!    wrong = morvik_decode(varargin{:}) ~= bits;
%!    bit_errors = mean(wrong(:));
%!    block_errors = mean(any(wrong));
%!endfunction

%!shared K, bits, sys, par1, par2, quantised
%! randn('seed', 1);
%! rand('seed', 1);
%! K = 40;
%! variance = (3 * K + 12) / (2 * K) / 10 ^ 0.25;
%! bits = rand(K, 2500) < 0.5;
%! [sys, par1, par2] = morvik_encode(bits);
%! receive = @(stream) 2 * stream - 1 + sqrt(variance) * randn(size(stream));
%! sys = receive(sys);
%! par1 = receive(par1);
%! par2 = receive(par2);
%! quantised = @(scale) {round(scale * sys), round(scale * par1), round(scale * par2)};

%!test  % as it should be
%! [~, block_errors] = errors(bits, quantised(8){:});
%! assert(block_errors < 0.03);

%!test  % the other sign: most bits are inverted
%! [bit_errors, block_errors] = errors(bits, quantised(-8){:});
%! assert(bit_errors > 0.8 && block_errors == 1);

%!test  % parity streams swapped: a quarter of the bits is wrong
%! bit_errors = errors(bits, quantised(8){[1 3 2]});
%! assert(bit_errors, 0.27, 0.03);

%!test  % the last bit first: half of the bits are wrong
%! soft = cellfun(@(stream) [flipud(stream(1:K, :)); stream(K + 1:K + 4, :)], quantised(8), 'UniformOutput', false);
%! bit_errors = errors(bits, soft{:});
%! assert(bit_errors, 0.5, 0.02);

%!test  % each encoder's tail in rows: many blocks are wrong, most of all at their ends
%! [s, p, q] = quantised(8){:};
%! soft = {s, p, q};
%! soft{1}(K + 1:K + 4, :) = [s(K + 1, :); q(K + 1, :); p(K + 2, :); s(K + 3, :)];
%! soft{2}(K + 1:K + 4, :) = [p(K + 1, :); s(K + 2, :); q(K + 2, :); q(K + 3, :)];
%! soft{3}(K + 1:K + 4, :) = [p(K + 3, :); s(K + 4, :); q(K + 4, :); p(K + 4, :)];
%! [~, block_errors, wrong] = errors(bits, soft{:});
%! assert(block_errors > 0.1);
%! assert(mean(wrong(K - 7:K, :)(:)) > 2 * mean(wrong(1:K - 8, :)(:)));

%!test  % a scale of 1 costs much, and nearly all with the table; one of 64 costs much, and says so
%! [~, block_errors] = errors(bits, quantised(1){:});
%! assert(block_errors > 0.06);
%! [~, block_errors] = errors(bits, quantised(1){:}, 'algorithm', 'table');
%! assert(block_errors > 0.9);
%! warning('off', 'all', 'local');
%! [~, block_errors] = errors(bits, quantised(64){:});
%! assert(block_errors > 0.06);

%!warning id=morvik:saturated morvik_decode(quantised(64){:});
