% MORVIK_LTE_RATE_RECOVER  Adds the ratios of a transmission to the soft buffers of code blocks.
%
%   buffers = morvik_lte_rate_recover(ratios, K, option, value, ...)
%
% ratios     log-likelihood ratios ln(P(1) / P(0)), a block in each column
% K          block size
% buffers    soft buffers, single: the circular buffer without its dummy and filler bits
%
% Options:
%   'buffers'    what earlier transmissions left; [] before the first one (default)
%   'version', 'fillers', 'buffer_size'    as for morvik_lte_rate_match
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_deinterleave, morvik_lte_rate_match, morvik_lte_recover.
function buffers = morvik_lte_rate_recover(ratios, K, varargin)
    caller = 'morvik_lte_rate_recover';
    if nargin < 2
        error('morvik:badCall', '%s: needs ratios and the block size', caller);
    end
    ratios = morvik_lte_ratios(caller, 'ratios', ratios);
    [matching, before] = morvik_lte_matching(caller, K, varargin);
    rows = morvik_lte_call(caller, 'buffer_size', matching);
    before = morvik_lte_buffers(caller, before, rows, size(ratios, 2));
    buffers = morvik_lte_call(caller, 'rate_recover', matching, ratios, before);
end
