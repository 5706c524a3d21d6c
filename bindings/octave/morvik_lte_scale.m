% MORVIK_LTE_SCALE  The scale of soft values that suits a modulation and a code rate, as measured (docs/scale.md).
%
%   scale = morvik_lte_scale(modulation, code_rate)
%   scale = morvik_lte_scale(modulation, code_rate, algorithm)
%
% modulation    as for morvik_lte_map
% code_rate     bits of a transport block for each coded bit that was sent, in all transmissions: above 0
% algorithm     of the core: 'max-log', 'scaled' (default) or 'table'
% scale         soft value for a ratio of 1
%
% Errors:   morvik:badCall, morvik:badValue, morvik:badOption
%
% See also morvik_lte_soft_values, morvik_lte_decode.
function scale = morvik_lte_scale(modulation, code_rate, algorithm)
    caller = 'morvik_lte_scale';
    if nargin < 2
        error('morvik:badCall', '%s: needs the modulation and a code rate', caller);
    elseif nargin < 3
        algorithm = 'scaled';
    end
    number = morvik_choice(caller, 'algorithm', algorithm, {'max-log', 'scaled', 'table'}) - 1;
    scale = morvik_lte_call(caller, 'ratio_scale', number, morvik_lte_modulation(caller, modulation), ...
        morvik_lte_positive(caller, 'code_rate', code_rate));
end
