% MORVIK_UNIT_BRANCH  The branch metrics of a step.
%
%   g = morvik_unit_branch(twice_intrinsic, parity)
%
% twice_intrinsic   as morvik_unit_intrinsic gives it, -192 to 190
% parity            parity soft values, -128 to 127
% g                 four rows, g0 to g3, clipped to -128 ... 127
%
% Cases, results and errors are as in morvik_unit_intrinsic.
%
% See also morvik_unit_forward, morvik_unit_backward, morvik_unit_ratio.
function g = morvik_unit_branch(twice_intrinsic, parity)
    caller = 'morvik_unit_branch';
    if nargin < 2
        error('morvik:badCall', '%s: needs twice the intrinsic value and parity', caller);
    end
    g = morvik_unit_call(caller, {'twice_intrinsic', 1, twice_intrinsic; 'parity', 1, parity});
end
