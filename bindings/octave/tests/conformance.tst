% The blocks of tests/conformance/blocks.txt: the same bits as everywhere, from all classes of soft values.

%!test
%! file = fopen('../../../tests/conformance/blocks.txt');
%! values = fscanf(file, '%d');
%! fclose(file);
%! algorithms = {'max-log', 'scaled', 'table'};
%! classes = {@double, @int8, @int16, @int32};
%! count = values(1);
%! assert(count > 0);
%! next = 2;
%! for block = 1:count
%!     [K, num_pu, algorithm, iterations] = num2cell(values(next:next + 3)){:};
%!     next += 4;
%!     streams = reshape(values(next:next + 3 * (K + 4) - 1), 3, K + 4).';
%!     next += numel(streams);
%!     expected = logical(values(next:next + K - 1));
%!     next += K;
%!     for class = classes
%!         soft = class{1}(streams);
%!         bits = morvik_decode(soft(:, 1), soft(:, 2), soft(:, 3), 'num_pu', num_pu, ...
%!             'algorithm', algorithms{algorithm + 1}, 'iterations', iterations);
%!         assert(bits, expected);
%!     end
%! end
%! assert(next, numel(values) + 1);
