% MORVIK_LTE_SOFT_VALUES  Turns log-likelihood ratios into soft values of the core, or of soft buffers.
%
%   values = morvik_lte_soft_values(ratios, scale)
%   values = morvik_lte_soft_values(ratios, scale, width)
%
% ratios    ln(P(1) / P(0)), finite
% scale     soft value for a ratio of 1, such as morvik_lte_scale tells
% width     bits of a value, 2 to 16: 8 for the core (default), others for soft buffers
% values    scaled, rounded with halves away from 0, clipped to -2^(width - 1) ... 2^(width - 1) - 1: int8 where width
%           is 8, else int16
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badValue
%
% See also morvik_lte_scale, morvik_lte_demap, morvik_lte_recover, morvik_lte_deinterleave, morvik_decode.
function values = morvik_lte_soft_values(ratios, scale, width)
    caller = 'morvik_lte_soft_values';
    if nargin < 2
        error('morvik:badCall', '%s: needs ratios and a scale', caller);
    elseif nargin < 3
        width = 8;
    end
    values = morvik_lte_call(caller, 'soft_values', morvik_lte_ratios(caller, 'ratios', ratios), ...
        morvik_lte_positive(caller, 'scale', scale), morvik_lte_number(caller, 'width', width, 2, 16));
end
