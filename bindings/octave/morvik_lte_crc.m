% MORVIK_LTE_CRC  The parity bits of blocks: 3GPP TS 36.212, clause 5.1.1.
%
%   parity = morvik_lte_crc(bits)
%   parity = morvik_lte_crc(bits, '24b')
%
% bits      zeros and ones, a block in each column
% kind      '24a', gCRC24A of transport blocks (default), or '24b', gCRC24B of code blocks where there are several
% parity    logical, 24 rows. Over bits with their parity below them, all are 0.
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badValue, morvik:badOption
%
% See also morvik_lte_segment, morvik_lte_encode.
function parity = morvik_lte_crc(bits, kind)
    if nargin < 1
        error('morvik:badCall', 'morvik_lte_crc: needs a matrix of bits');
    elseif nargin < 2
        kind = '24a';
    end
    place = morvik_choice('morvik_lte_crc', 'kind', kind, {'24a', '24b'});
    parity = morvik_lte_call('morvik_lte_crc', 'crc', morvik_lte_bits('morvik_lte_crc', 'bits', bits), place - 1);
end
