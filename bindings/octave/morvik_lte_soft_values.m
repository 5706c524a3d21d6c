% MORVIK_LTE_SOFT_VALUES  Turns log-likelihood ratios into soft values of the core.
%
%   values = morvik_lte_soft_values(ratios, scale)
%
% ratios    ln(P(1) / P(0)), finite
% scale     steps for a ratio of 1, such as 4; docs/scale.md tells the best ones
% values    int8: scaled, rounded with halves away from 0, clipped to -128 ... 127
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badValue
%
% See also morvik_lte_demap, morvik_lte_deinterleave, morvik_decode.
function values = morvik_lte_soft_values(ratios, scale)
    caller = 'morvik_lte_soft_values';
    if nargin < 2
        error('morvik:badCall', '%s: needs ratios and a scale', caller);
    end
    values = morvik_lte_call(caller, 'soft_values', morvik_lte_ratios(caller, 'ratios', ratios), ...
        morvik_lte_positive(caller, 'scale', scale));
end
