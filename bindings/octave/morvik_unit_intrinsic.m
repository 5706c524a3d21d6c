% MORVIK_UNIT_INTRINSIC  Twice the intrinsic value.
%
%   twice_intrinsic = morvik_unit_intrinsic(apriori, systematic)
%
% apriori           the other decoder's extrinsic values, -128 to 127; 0 in the tail
% systematic        systematic soft values, -128 to 127
% twice_intrinsic   -192 to 190. The signal `intrinsic` of traces is its half, rounded down.
%
% Values are in eighths. A case is a column; an input of one column counts for all cases. The values of a single case may
% also be a row. Results are int16, in columns. docs/units.md explains the units.
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue
%
% See also morvik_unit_branch, morvik_unit_extrinsic.
function twice_intrinsic = morvik_unit_intrinsic(apriori, systematic)
    caller = 'morvik_unit_intrinsic';
    if nargin < 2
        error('morvik:badCall', '%s: needs a-priori and systematic values', caller);
    end
    twice_intrinsic = morvik_unit_call(caller, {'apriori', 1, apriori; 'systematic', 1, systematic});
end
