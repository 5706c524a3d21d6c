% MORVIK_LTE_RECOVER  Adds the ratios of a transmission to the soft buffers of transport blocks.
%
%   buffers = morvik_lte_recover(ratios, transport_block_size, modulation, option, value, ...)
%
% ratios                  ln(P(1) / P(0)) of the coded bits, as from morvik_lte_demap, a transport block in each column
% transport_block_size    bits of a transport block (A)
% modulation              as for morvik_lte_encode
% buffers                 soft buffers, single
%
% Options:
%   'buffers'    what earlier transmissions left; [] before the first one (default)
%   'version', 'layers', 'soft_buffer_size'    as for morvik_lte_encode
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_decode, morvik_lte_demap.
function buffers = morvik_lte_recover(ratios, transport_block_size, modulation, varargin)
    caller = 'morvik_lte_recover';
    if nargin < 3
        error('morvik:badCall', '%s: needs ratios, the size of a transport block and the modulation', caller);
    end
    ratios = morvik_lte_ratios(caller, 'ratios', ratios);
    [format, options] = morvik_lte_format(caller, transport_block_size, size(ratios, 1), modulation, ...
        struct('buffers', []), varargin);
    rows = morvik_lte_call(caller, 'transport_buffer', format);
    before = morvik_lte_buffers(caller, options.buffers, rows, size(ratios, 2));
    buffers = morvik_lte_call(caller, 'recover', format, options.version, ratios, before);
end
