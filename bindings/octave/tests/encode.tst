% morvik_encode.

%!test  % random bits come back, also of more blocks than are encoded at once
%! rand('seed', 1);
%! for K = [40, 104, 512, 6144]
%!     bits = rand(K, 70) < 0.5;
%!     [sys, par1, par2] = morvik_encode(bits);
%!     assert(size(sys), [K + 4, 70]);
%!     assert(sys(1:K, :), bits);
%!     assert(morvik_decode(16 * sys - 8, 16 * par1 - 8, 16 * par2 - 8, 'iterations', 2), bits);
%! end

%!test  % a one alone: the first parity is (1 + D + D^3) / (1 + D^2 + D^3)
%! [~, par1, par2] = morvik_encode([1; zeros(39, 1)]);
%! assert(class(par1), 'logical');
%! assert(par1(1:8), logical([1 1 1 1 0 0 1 0].'));
%! assert(par2(1:8), par1(1:8));

%!test  % a row gives rows, other classes give the same
%! bits = rand(1, 40) < 0.5;
%! [sys, par1, par2] = morvik_encode(int8(bits));
%! assert(size(par2), [1, 44]);
%! [sys_column, par1_column, par2_column] = morvik_encode(double(bits.'));
%! assert([sys; par1; par2].', [sys_column, par1_column, par2_column]);

%!test  % no block at all
%! [~, ~, par2] = morvik_encode(zeros(40, 0));
%! assert(size(par2), [44, 0]);

%!error id=morvik:badCall morvik_encode();
%!error id=morvik:badSize morvik_encode(zeros(41, 1));
%!error <41 is no block size of the LTE turbo code: there are 41 rows, but every column is> morvik_encode(zeros(41, 1));
%!error id=morvik:badSize morvik_encode(zeros(40, 1, 2));
%!error id=morvik:badSize morvik_encode([]);
%!error id=morvik:badValue morvik_encode(2 * ones(40, 1));
%!error id=morvik:badValue morvik_encode(NaN(40, 1));
%!error id=morvik:badClass morvik_encode(repmat('0', 40, 1));
%!error id=morvik:badClass morvik_encode({1});
%!error id=morvik:badClass morvik_encode(sparse(40, 1));
%!error id=morvik:badClass morvik_encode(complex(zeros(40, 1), 1));
