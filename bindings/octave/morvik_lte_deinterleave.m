% MORVIK_LTE_DEINTERLEAVE  Puts the values of soft buffers into the three streams of a decoder.
%
%   [sys, par1, par2] = morvik_lte_deinterleave(buffers, K, option, value, ...)
%
% buffers            soft buffers as from morvik_lte_rate_recover, or the int8 that morvik_lte_soft_values makes of them, a
%                    block in each column
% K                  block size
% sys, par1, par2    int8 or single, as the buffers are, K + 4 rows. What was not sent and lies outside of the buffer is 0.
%
% Options:
%   'filler'         the value of filler bits in sys and par1 (default -128, the core's strongest 0)
%   'fillers', 'buffer_size'    as for morvik_lte_rate_match
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_rate_recover, morvik_lte_soft_values, morvik_decode.
function [sys, par1, par2] = morvik_lte_deinterleave(buffers, K, varargin)
    caller = 'morvik_lte_deinterleave';
    if nargin < 2
        error('morvik:badCall', '%s: needs soft buffers and the block size', caller);
    end
    [matching, options] = morvik_lte_matching(caller, K, struct('filler', -128), varargin);
    if isa(buffers, 'int8')
        filler = morvik_lte_number(caller, 'filler', options.filler, -128, 127);
    else
        buffers = morvik_lte_ratios(caller, 'buffers', buffers);
        filler = double(morvik_lte_ratios(caller, 'filler', options.filler));
        if ~isscalar(filler)
            error('morvik:badSize', '%s: filler has to be one number', caller);
        end
    end
    rows = morvik_lte_call(caller, 'buffer_size', matching);
    if size(buffers, 1) ~= rows || ndims(buffers) > 2
        error('morvik:badSize', '%s: buffers have to be of %d rows, not %d', caller, rows, size(buffers, 1));
    end
    [sys, par1, par2] = morvik_lte_call(caller, 'deinterleave', matching, buffers, filler);
end
