% MORVIK_LTE_RECOVER  Adds the ratios of a transmission to the soft buffers of transport blocks.
%
%   buffers = morvik_lte_recover(ratios, transport_block_size, modulation, option, value, ...)
%
% ratios                  ln(P(1) / P(0)) of the coded bits, as from morvik_lte_demap, a transport block in each column;
%                         with the option width, integers of class int8 or int16, as from morvik_lte_soft_values
% transport_block_size    bits of a transport block (A)
% modulation              as for morvik_lte_encode
% buffers                 soft buffers, single, or int16 with a width
%
% Options:
%   'buffers'    what earlier transmissions left; [] before the first one (default)
%   'width'      bits of a soft buffer's values, 2 to 16: each sum is clipped to them; [] adds in floating point (default)
%   'version', 'layers', 'soft_buffer_size'    as for morvik_lte_encode
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% Example: soft buffers of 6 bits
%
%   buffers = morvik_lte_recover(morvik_lte_soft_values(ratios, 2, 6), 1000, 'qpsk', 'width', 6);
%
% See also morvik_lte_decode, morvik_lte_demap, morvik_lte_soft_values.
function buffers = morvik_lte_recover(ratios, transport_block_size, modulation, varargin)
    caller = 'morvik_lte_recover';
    if nargin < 3
        error('morvik:badCall', '%s: needs ratios, the size of a transport block and the modulation', caller);
    end
    [format, options] = morvik_lte_format(caller, transport_block_size, size(ratios, 1), modulation, ...
        struct('version', 0, 'buffers', [], 'width', []), varargin);
    [ratios, width] = morvik_lte_received(caller, ratios, options.width);
    rows = morvik_lte_call(caller, 'transport_buffer', format);
    before = morvik_lte_buffers(caller, options.buffers, class(ratios), rows, size(ratios, 2));
    buffers = morvik_lte_call(caller, 'recover', format, options.version, ratios, before, width);
end
