% MORVIK_LTE_STREAMS  The soft values of each code block, for morvik_decode.
%
%   streams = morvik_lte_streams(buffers, transport_block_size, coded_bits, modulation, option, value, ...)
%
% buffers                 as from morvik_lte_recover, a transport block in each column. Those of integers, int16, are
%                         only clipped
% transport_block_size    bits of a transport block (A)
% coded_bits              bits of one transmission (G)
% modulation              as for morvik_lte_encode
% streams                 a cell for each code block, with sys, par1 and par2 in its three columns: int8 of K + 4 rows
%
% Options:
%   'scale'        soft value for a ratio of 1; [] is that of morvik_lte_scale (default)
%   'algorithm'    of the core, for which the scale is chosen (default 'scaled')
%   'layers', 'soft_buffer_size'    as for morvik_lte_encode
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% Example: decisions of an own loop
%
%   streams = morvik_lte_streams(buffers, 6000, 9000, '16qam');
%   decisions = cell(1, size(streams, 1));
%   for r = 1:size(streams, 1)
%       decisions{r} = morvik_decode(streams{r, :}, 'iterations', 4);
%   end
%   [bits, fits] = morvik_lte_join(decisions, 6000, 9000, '16qam');
%
% See also morvik_lte_join, morvik_lte_decode, morvik_decode.
function streams = morvik_lte_streams(buffers, transport_block_size, coded_bits, modulation, varargin)
    caller = 'morvik_lte_streams';
    if nargin < 4
        error('morvik:badCall', '%s: needs soft buffers, two sizes and the modulation', caller);
    end
    [format, options] = morvik_lte_format(caller, transport_block_size, coded_bits, modulation, ...
        struct('scale', [], 'algorithm', 'scaled'), varargin);
    streams = morvik_lte_values(caller, format, buffers, modulation, options.scale, options.algorithm);
end
