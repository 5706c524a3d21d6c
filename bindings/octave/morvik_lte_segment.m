% MORVIK_LTE_SEGMENT  How a transport block is divided into code blocks: 3GPP TS 36.212, clause 5.1.2.
%
%   blocks = morvik_lte_segment(transport_block_size)
%
% transport_block_size    bits without their CRC (A), 1 to 2^24
% blocks                  a structure: count (C), fillers (F), size_plus (K+), count_plus (C+), size_minus (K-),
%                         count_minus (C-). The first count_minus code blocks are the smaller ones.
%
% Errors:   morvik:badCall, morvik:badValue
%
% See also morvik_lte_crc, morvik_lte_encode.
function blocks = morvik_lte_segment(transport_block_size)
    if nargin < 1
        error('morvik:badCall', 'morvik_lte_segment: needs the size of a transport block');
    end
    bits = morvik_lte_number('morvik_lte_segment', 'transport_block_size', transport_block_size, 1, 2 ^ 24);
    numbers = num2cell(morvik_lte_call('morvik_lte_segment', 'segment', bits));
    names = {'count', 'fillers', 'size_plus', 'count_plus', 'size_minus', 'count_minus'};
    blocks = cell2struct(numbers(:), names(:), 1);
end
