% MORVIK_LTE_ENCODE  The coded bits of transport blocks: 3GPP TS 36.212, clauses 5.1.1 to 5.1.5.
%
%   coded = morvik_lte_encode(bits, coded_bits, modulation, option, value, ...)
%
% bits          zeros and ones, a transport block in each column; without CRC, which is added
% coded_bits    bits of one transmission (G)
% modulation    as for morvik_lte_map: code blocks are cut at symbols
% coded         logical, coded_bits rows
%
% Options:
%   'version'             redundancy version, 0 to 3 (default 0)
%   'layers'              1 to 4 (N_L, default 1)
%   'soft_buffer_size'    positions of the receiver's soft buffer for a transport block (N_IR); 0 for all (default)
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% Example: what is sent
%
%   symbols = morvik_lte_map(morvik_lte_encode(rand(1000, 50) < 0.5, 2400, '16qam'), '16qam');
%
% See also morvik_lte_map, morvik_lte_recover, morvik_lte_decode.
function coded = morvik_lte_encode(bits, coded_bits, modulation, varargin)
    caller = 'morvik_lte_encode';
    if nargin < 3
        error('morvik:badCall', '%s: needs bits, the number of coded bits and the modulation', caller);
    end
    bits = morvik_lte_bits(caller, 'bits', bits);
    [format, options] = morvik_lte_format(caller, size(bits, 1), coded_bits, modulation, struct('version', 0), varargin);
    coded = morvik_lte_call(caller, 'encode', format, options.version, bits);
end
