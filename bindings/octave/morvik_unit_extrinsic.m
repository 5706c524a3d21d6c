% MORVIK_UNIT_EXTRINSIC  The extrinsic value of a step.
%
%   extrinsic = morvik_unit_extrinsic(ratio, twice_intrinsic)
%   extrinsic = morvik_unit_extrinsic(ratio, twice_intrinsic, 'algorithm', algorithm)
%
% ratio             log-likelihood ratios, -2048 to 2047
% twice_intrinsic   as morvik_unit_intrinsic gives it, -192 to 190
% algorithm         'max-log', 'scaled' (default), which multiplies by 0.75, or 'table'
% extrinsic         clipped to -128 ... 127
%
% Cases and results are as in morvik_unit_intrinsic, and so are errors, with morvik:badOption.
%
% See also morvik_unit_ratio, morvik_unit_intrinsic.
function extrinsic = morvik_unit_extrinsic(ratio, twice_intrinsic, varargin)
    caller = 'morvik_unit_extrinsic';
    if nargin < 2
        error('morvik:badCall', '%s: needs the ratio and twice the intrinsic value', caller);
    end
    options = morvik_options(caller, struct('algorithm', 'scaled'), varargin);
    extrinsic = morvik_unit_call(caller, {'ratio', 1, ratio; 'twice_intrinsic', 1, twice_intrinsic}, options);
end
