% MORVIK_UNIT_RATIO  The log-likelihood ratio of a step.
%
%   ratio = morvik_unit_ratio(alpha, beta, g)
%   ratio = morvik_unit_ratio(alpha, beta, g, 'algorithm', algorithm)
%
% alpha, beta   forward metrics before the step and backward metrics behind it, -2048 to 2047: eight rows, state 0 first
% g             branch metrics of the step, -128 to 127: four rows
% algorithm     'max-log', 'scaled' (default) or 'table'
% ratio         -2048 to 2047
%
% Cases and results are as in morvik_unit_intrinsic, and so are errors, with morvik:badOption.
%
% See also morvik_unit_forward, morvik_unit_backward, morvik_unit_extrinsic.
function ratio = morvik_unit_ratio(alpha, beta, g, varargin)
    caller = 'morvik_unit_ratio';
    if nargin < 3
        error('morvik:badCall', '%s: needs forward, backward and branch metrics', caller);
    end
    options = morvik_options(caller, struct('algorithm', 'scaled'), varargin);
    ratio = morvik_unit_call(caller, {'alpha', 8, alpha; 'beta', 8, beta; 'g', 4, g}, options);
end
