% MORVIK_UNIT_TAIL  The backward metrics before the tail, where the backward recursion of the last window starts.
%
%   beta = morvik_unit_tail(systematic, parity)
%
% systematic, parity   soft values of the tail, of the code that is decoded, -128 to 127: three rows
% beta                 eight rows, state 0 first, as a border keeps them
%
% Cases, results and errors are as in morvik_unit_intrinsic.
%
% See also morvik_unit_backward, morvik_unit_border.
function beta = morvik_unit_tail(systematic, parity)
    caller = 'morvik_unit_tail';
    if nargin < 2
        error('morvik:badCall', '%s: needs systematic and parity values', caller);
    end
    beta = morvik_unit_call(caller, {'systematic', 3, systematic; 'parity', 3, parity});
end
