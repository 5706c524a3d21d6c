% MORVIK_UNIT_BORDER  Metrics as a border between segments or windows keeps them.
%
%   border = morvik_unit_border(column)
%
% column   metrics, -2048 to 2047: eight rows, state 0 first
% border   the same without the three lowest bits
%
% Cases, results and errors are as in morvik_unit_intrinsic.
%
% See also morvik_unit_forward, morvik_unit_backward.
function border = morvik_unit_border(column)
    caller = 'morvik_unit_border';
    if nargin < 1
        error('morvik:badCall', '%s: needs a column of metrics', caller);
    end
    border = morvik_unit_call(caller, {'column', 8, column});
end
