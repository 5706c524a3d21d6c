% MORVIK_LTE_DEINTERLEAVE  Puts the values of soft buffers into the three streams of a decoder.
%
%   [sys, par1, par2] = morvik_lte_deinterleave(buffers, K, option, value, ...)
%
% buffers            soft buffers as from morvik_lte_rate_recover, or what was made of them, a block in each column
% K                  block size
% sys, par1, par2    single, K + 4 rows. What was not sent and lies outside of the buffer is 0.
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
    [matching, ~, filler] = morvik_lte_matching(caller, K, varargin);
    rows = morvik_lte_call(caller, 'buffer_size', matching);
    buffers = morvik_lte_buffers(caller, buffers, rows, size(buffers, 2));
    [sys, par1, par2] = morvik_lte_call(caller, 'deinterleave', matching, buffers, filler);
end
