% morvik_decode: classes, shapes, options, and what is said about wrong calls.

%!shared soft, wide
%! soft = -24 * ones(44, 1);
%! wide = -24 * ones(44, 3);

%!test  % classes of the results
%! [bits, ratios, tags] = morvik_decode(soft, soft, soft);
%! assert(bits, false(40, 1));
%! assert(class(ratios), 'int16');
%! assert(tags, uint32(0));
%! assert(morvik_decode(soft, soft, soft, 'class', 'int8'), zeros(40, 1, 'int8'));

%!test  % columns are blocks; the signs of the ratios are the decisions
%! [sys, par1, par2] = morvik_encode(eye(40));
%! [bits, ratios] = morvik_decode(16 * sys - 8, 16 * par1 - 8, 16 * par2 - 8);
%! assert(bits, logical(eye(40)));
%! assert(ratios > 0, bits);

%!test  % a row gives rows
%! [bits, ratios, tags] = morvik_decode(soft.', soft.', soft.', 'tags', 9);
%! assert(bits, false(1, 40));
%! assert(size(ratios), [1, 40]);
%! assert(tags, uint32(9));

%!test  % each block has its tag
%! [~, ~, tags] = morvik_decode(wide, wide, wide, 'tags', [1; 2; 255]);
%! assert(tags, uint32([1 2 255]));

%!test  % no block at all
%! [bits, ratios, tags] = morvik_decode(zeros(44, 0), zeros(44, 0), zeros(44, 0));
%! assert({size(bits), size(ratios), size(tags)}, {[40 0], [40 0], [1 0]});

%!test  % mixed classes
%! assert(morvik_decode(int8(soft), soft, single(soft)), false(40, 1));

%!warning <RSC1 systematic value in position 0 saturated negatively> morvik_decode(10 * soft, soft, soft);
%!warning id=morvik:saturated morvik_decode(10 * soft, soft, soft);
%!warning id=morvik:tagTruncated morvik_decode(soft, soft, soft, 'tags', 256);

%!test  % a width of 32 keeps no bit of a tag, as the hardware
%! warning('off', 'morvik:tagTruncated', 'local');
%! [~, ~, tags] = morvik_decode(soft, soft, soft, 'tags', 2^32 - 1, 'tag_width', 32);
%! assert(tags, uint32(0));
%! [~, ~, tags] = morvik_decode(soft, soft, soft, 'tags', 2^32 - 1, 'tag_width', 31);
%! assert(tags, uint32(2^31 - 1));

%!test  % a call that warns gives its result, and the warning can be switched off
%! warning('off', 'morvik:saturated', 'local');
%! lastwarn('');
%! assert(morvik_decode(10 * soft, soft, soft), false(40, 1));
%! assert(lastwarn(), '');

%!error id=morvik:badCall morvik_decode();
%!error id=morvik:badCall morvik_decode(soft, soft);
%!error id=morvik:badCall morvik_decode(soft, soft, soft, 'num_pu');
%!error <sys, par1 and par2 have to be matrices of one size, but they are 44x1, 43x1 and 44x1> morvik_decode(soft, soft(1:43), soft);
%!error id=morvik:badSize morvik_decode(soft, soft.', soft);
%!error id=morvik:badSize morvik_decode([], [], []);
%!error <sys, par1 and par2 are empty \(0x5\)> morvik_decode(zeros(0, 5), zeros(0, 5), zeros(0, 5));
%!error id=morvik:badSize morvik_decode(soft(1:40), soft(1:40), soft(1:40));
%!error <Block size not supported: there are 40 rows, but every column is a block of K \+ 4 values, the tail included> morvik_decode(soft(1:40), soft(1:40), soft(1:40));
%!error <there are 3 rows> morvik_decode(wide.', wide.', wide.');
%!error id=morvik:badSize morvik_decode(10 * soft(1:40), soft(1:40), soft(1:40));
%!error id=morvik:badSize morvik_decode(ones(44, 2, 2), ones(44, 2, 2), ones(44, 2, 2));
%!error id=morvik:badValue morvik_decode(soft + 0.5, soft, soft);
%!error <par1 has to hold whole numbers .* round\(8 \* received\)> morvik_decode(soft, soft / 7, soft);
%!error id=morvik:badValue morvik_decode(soft, NaN(44, 1), soft);
%!error id=morvik:badValue morvik_decode(soft, soft, Inf(44, 1));
%!error id=morvik:badValue morvik_decode(soft, soft, soft * 1e6);
%!error id=morvik:badClass morvik_decode('soft', 'soft', 'soft');
%!error id=morvik:badClass morvik_decode(soft > 0, soft > 0, soft > 0);
%!error id=morvik:badClass morvik_decode({soft}, {soft}, {soft});
%!error <sys has to be a full matrix of real numbers, not sparse double> morvik_decode(sparse(soft), soft, soft);
%!error <par2 has to be a full matrix of real numbers, not complex double> morvik_decode(soft, soft, complex(soft, 1));
%!error <sys is of class uint8, which has no negative values> morvik_decode(uint8(soft), uint8(soft), uint8(soft));
%!error <there is no option 'units'; there are num_pu, algorithm, iterations, tag_width, tags, class> morvik_decode(soft, soft, soft, 'units', 2);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 5, 2);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 'num_pu', 3);
%!error <C_NUM_PU must be either 2, 4 or 8> morvik_decode(soft, soft, soft, 'num_pu', 3);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 'num_pu', 2.5);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 'num_pu', [2 4]);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 'num_pu', []);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 'num_pu', NaN);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 'num_pu', '2');
%!error <there is no algorithm 'turbo'; there are max-log, scaled, table> morvik_decode(soft, soft, soft, 'algorithm', 'turbo');
%!error <algorithm has to be a text, not of class double> morvik_decode(soft, soft, soft, 'algorithm', 1);
%!error <Number of iterations must be in the range 1 to 15> morvik_decode(soft, soft, soft, 'iterations', 0);
%!error <Number of iterations must be in the range 1 to 15> morvik_decode(soft, soft, soft, 'iterations', -1);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 'iterations', 1e10);
%!error <C_TAG_WIDTH must be in range 0 to 32> morvik_decode(soft, soft, soft, 'tag_width', 33);
%!error <2 tags were given for 1 blocks> morvik_decode(soft, soft, soft, 'tags', [1 2]);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 'tags', -1);
%!error id=morvik:badOption morvik_decode(soft, soft, soft, 'tags', 'x');
%!error <there is no class 'double'; there are logical, int8> morvik_decode(soft, soft, soft, 'class', 'double');
