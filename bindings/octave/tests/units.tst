% The units of the core: their values, cases in columns, and what is refused.

%!shared alpha, beta, pending, g
%! alpha = 12 * (0:7).' - 40;
%! beta = 20 - 9 * (0:7).';
%! pending = [0; 1; 2; 3; 4; 6; 6; 6];
%! g = [-3; -35; -35; -3];

%!test  % values that the tests of all bindings have
%! assert(morvik_unit_branch(morvik_unit_intrinsic(10, -24), 16), int16(g));
%! [next, next_pending] = morvik_unit_forward(alpha, g, 'pending', pending, 'algorithm', 'table');
%! assert(next, int16([-30; 34; 47; 53; -24; 21; 61; 47]));
%! assert(next_pending, int16([4; 0; 0; 1; 1; 0; 0; 4]));
%! previous = morvik_unit_backward(beta, g, 'algorithm', 'table', 'pending', pending);
%! assert(previous, int16([23; 17; 16; 47; 39; 7; -7; -1]));
%! assert(morvik_unit_ratio(alpha, beta, g, 'algorithm', 'table'), int16(-33));
%! assert(morvik_unit_extrinsic(-101, -19), int16(-48));
%! assert(morvik_unit_extrinsic(-101, -19, 'algorithm', 'table'), int16(-63));
%! assert(morvik_unit_address(40, 7), int16(31));
%! assert(morvik_unit_tail([1; -20; 30], [-100; 50; -6]), int16([40; -160; 104; -96; -152; 48; -8; 192]));
%! assert(morvik_unit_border(alpha), int16([-40; -32; -16; -8; 8; 16; 32; 40]));

%!test  % cases are columns, and an input of one column counts for all
%! assert(morvik_unit_intrinsic(-128:127, 5), int16(floor((-128:127) / 2) + 5));
%! next = morvik_unit_forward(int8([alpha, beta]), g);
%! assert(next, [morvik_unit_forward(alpha, g), morvik_unit_forward(beta, g)]);
%! assert(morvik_unit_forward(alpha.', g.'), morvik_unit_forward(alpha, g));
%! assert(size(morvik_unit_forward(zeros(8, 0), g)), [8, 0]);
%! assert(size(morvik_unit_branch(zeros(1, 0), zeros(1, 0))), [4, 0]);

%!test  % without a table nothing is pending
%! [~, after] = morvik_unit_backward(beta, g, 'algorithm', 'max-log');
%! assert(after, zeros(8, 1, 'int16'));

%!test  % addresses are the interleaver's
%! i = 0:6143;
%! assert(double(morvik_unit_address(6144, i)), mod(263 * i + 480 * i .^ 2, 6144));

%!error id=morvik:badCall morvik_unit_intrinsic(1);
%!error id=morvik:badCall morvik_unit_branch(1);
%!error id=morvik:badCall morvik_unit_forward(zeros(8, 1));
%!error id=morvik:badCall morvik_unit_backward(zeros(8, 1));
%!error id=morvik:badCall morvik_unit_ratio(zeros(8, 1), zeros(8, 1));
%!error id=morvik:badCall morvik_unit_extrinsic(1);
%!error id=morvik:badCall morvik_unit_address(40);
%!error id=morvik:badCall morvik_unit_tail(zeros(3, 1));
%!error id=morvik:badCall morvik_unit_border();
%!error id=morvik:badCall morvik_unit_ratio(alpha, beta, g, 'algorithm');
%!error id=morvik:badOption morvik_unit_ratio(alpha, beta, g, 'pending', pending);
%!error <algorithm has to be one of max-log, scaled, table> morvik_unit_extrinsic(0, 0, 'algorithm', 3);
%!error id=morvik:badValue morvik_unit_branch(0, 128);
%!error <in column 3, a systematic or parity value is not from -128 to 127> morvik_unit_branch(0, [0, 1, 128]);
%!error <column 1, twice the intrinsic value is not from -192 to 190> morvik_unit_branch(2 ^ 40, 0);
%!error <column 1, a metric or the ratio is not from -2048 to 2047> morvik_unit_forward(2048 * ones(8, 1), g);
%!error <not 0 with an algorithm that has no table> morvik_unit_backward(beta, g, 'pending', pending);
%!error <K is not one of the 188 block sizes> morvik_unit_address(41, 0);
%!error <parity has to hold whole numbers> morvik_unit_branch(0, 0.5);
%!error <parity has to hold whole numbers> morvik_unit_branch(0, NaN);
%!error <alpha has to have 8 rows and a column for each case, but it is 4x1> morvik_unit_forward(g, g);
%!error <twice_intrinsic, parity have to have equal numbers of columns, or one> morvik_unit_branch([0, 0], [0, 0, 0]);
%!error id=morvik:badClass morvik_unit_branch(0, true);
%!error id=morvik:badClass morvik_unit_branch(0, sparse(1));
