% MORVIK_UNIT_BACKWARD  A step of the backward recursion.
%
%   previous = morvik_unit_backward(beta, g)
%   [previous, pending] = morvik_unit_backward(beta, g, option, value, ...)
%
% beta      backward metrics behind the step, -2048 to 2047: eight rows, state 0 first
% g         branch metrics of the step, -128 to 127: four rows
% previous  the metrics before it
% pending   the corrections that are added one decision later: zeros, unless the algorithm is 'table'
%
% Options and their defaults:
%
%   pending     zeros      the corrections pending with beta, 0 to 6
%   algorithm   'scaled'   'max-log', 'scaled' or 'table'
%
% Cases and results are as in morvik_unit_intrinsic, and so are errors, with morvik:badOption.
%
% See also morvik_unit_branch, morvik_unit_border, morvik_unit_ratio.
function [previous, pending] = morvik_unit_backward(beta, g, varargin)
    caller = 'morvik_unit_backward';
    if nargin < 2
        error('morvik:badCall', '%s: needs backward metrics and branch metrics', caller);
    end
    options = morvik_options(caller, struct('pending', zeros(8, 1), 'algorithm', 'scaled'), varargin);
    reached = morvik_unit_call(caller, {'beta', 8, beta; 'pending', 8, options.pending; 'g', 4, g}, options);
    previous = reached(1:8, :);
    pending = reached(9:16, :);
end
