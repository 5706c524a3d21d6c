% MORVIK_LTE_CODE_BLOCKS  Where the code blocks of a transport block lie.
%
%   blocks = morvik_lte_code_blocks(transport_block_size, coded_bits, modulation, option, value, ...)
%
% transport_block_size    bits of a transport block (A)
% coded_bits              bits of one transmission (G)
% modulation              as for morvik_lte_encode
% blocks                  a structure array, an element for each code block, with the fields
%     size, fillers             its bits (K), and how many filler bits are at its start
%     payload, payload_at       bits of the transport block and its CRC that it carries, and the first of them, from 1
%     coded_bits, coded_at      its bits in a transmission (E), and the first of them, from 1
%     buffer_size, buffer_at    its rows in soft buffers as from morvik_lte_recover, and the first of them, from 1
%
% Options:
%   'layers', 'soft_buffer_size'    as for morvik_lte_encode
%
% Errors:   morvik:badCall, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_segment, morvik_lte_streams.
function blocks = morvik_lte_code_blocks(transport_block_size, coded_bits, modulation, varargin)
    caller = 'morvik_lte_code_blocks';
    if nargin < 3
        error('morvik:badCall', '%s: needs two sizes and the modulation', caller);
    end
    format = morvik_lte_format(caller, transport_block_size, coded_bits, modulation, struct(), varargin);
    names = {'size', 'fillers', 'payload', 'payload_at', 'coded_bits', 'coded_at', 'buffer_size', 'buffer_at'};
    blocks = cell2struct(num2cell(morvik_lte_call(caller, 'code_blocks', format)), names, 1).';
end
