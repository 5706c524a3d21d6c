% MORVIK_UNIT_FORWARD  A step of the forward recursion.
%
%   next = morvik_unit_forward(alpha, g)
%   [next, pending] = morvik_unit_forward(alpha, g, option, value, ...)
%
% alpha     forward metrics before the step, -2048 to 2047: eight rows, state 0 first
% g         branch metrics of the step, -128 to 127: four rows
% next      the metrics behind it
% pending   the corrections that are added one decision later: zeros, unless the algorithm is 'table'
%
% Options and their defaults:
%
%   pending     zeros      the corrections pending with alpha, 0 to 6
%   algorithm   'scaled'   'max-log', 'scaled' or 'table'
%
% Cases and results are as in morvik_unit_intrinsic, and so are errors, with morvik:badOption.
%
% See also morvik_unit_branch, morvik_unit_border, morvik_unit_ratio.
function [next, pending] = morvik_unit_forward(alpha, g, varargin)
    caller = 'morvik_unit_forward';
    if nargin < 2
        error('morvik:badCall', '%s: needs forward metrics and branch metrics', caller);
    end
    options = morvik_options(caller, struct('pending', zeros(8, 1), 'algorithm', 'scaled'), varargin);
    reached = morvik_unit_call(caller, {'alpha', 8, alpha; 'pending', 8, options.pending; 'g', 4, g}, options);
    next = reached(1:8, :);
    pending = reached(9:16, :);
end
