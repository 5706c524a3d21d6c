% MORVIK_LTE_RATE_RECOVER  Adds the ratios of a transmission to the soft buffers of code blocks.
%
%   buffers = morvik_lte_rate_recover(ratios, K, option, value, ...)
%
% ratios     log-likelihood ratios ln(P(1) / P(0)), a block in each column; with the option width, integers of class
%            int8 or int16, as morvik_lte_soft_values gives them
% K          block size
% buffers    soft buffers: the circular buffer without its dummy and filler bits, single, or int16 with a width
%
% Options:
%   'buffers'    what earlier transmissions left; [] before the first one (default)
%   'width'      bits of a soft buffer's values, 2 to 16: each sum is clipped to them; [] adds in floating point (default)
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
    defaults = struct('version', 0, 'buffers', [], 'width', []);
    [matching, options] = morvik_lte_matching(caller, K, defaults, varargin);
    [ratios, width] = morvik_lte_received(caller, ratios, options.width);
    rows = morvik_lte_call(caller, 'buffer_size', matching);
    before = morvik_lte_buffers(caller, options.buffers, class(ratios), rows, size(ratios, 2));
    buffers = morvik_lte_call(caller, 'rate_recover', matching, ratios, before, width);
end
