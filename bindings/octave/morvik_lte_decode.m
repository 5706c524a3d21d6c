% MORVIK_LTE_DECODE  Decodes the soft buffers of transport blocks with the core, and checks their CRCs.
%
%   [bits, fits, code_blocks_fit] = morvik_lte_decode(buffers, transport_block_size, coded_bits, modulation, ...
%                                                     option, value, ...)
%
% buffers                 as from morvik_lte_recover, a transport block in each column
% transport_block_size    bits of a transport block (A)
% coded_bits              bits of one transmission (G)
% modulation              as for morvik_lte_encode
% bits                    decisions, logical, transport_block_size rows
% fits                    whether all CRCs of a transport block fit: logical, one row
% code_blocks_fit         whether the CRC of each code block fits: logical, a row for each code block
%
% Options:
%   'scale'    steps of a soft value for a ratio of 1; [] suits modulation, code rate and algorithm (default)
%   'num_pu', 'algorithm', 'iterations'    as for morvik_decode
%   'layers', 'soft_buffer_size'           as for morvik_lte_encode
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_recover, morvik_decode.
function [bits, fits, code_blocks_fit] = morvik_lte_decode(buffers, transport_block_size, coded_bits, modulation, varargin)
    caller = 'morvik_lte_decode';
    if nargin < 4
        error('morvik:badCall', '%s: needs soft buffers, two sizes and the modulation', caller);
    end
    [format, options] = morvik_lte_format(caller, transport_block_size, coded_bits, modulation, ...
        struct('scale', [], 'num_pu', 2, 'algorithm', 'scaled', 'iterations', 8), varargin);
    rows = morvik_lte_call(caller, 'transport_buffer', format);
    buffers = morvik_lte_buffers(caller, buffers, rows, size(buffers, 2));
    if isempty(options.scale)
        algorithm = morvik_lte_choice(caller, 'algorithm', options.algorithm, {'max-log', 'scaled', 'table'}) - 1;
        rate = transport_block_size / coded_bits;
        options.scale = morvik_lte_call(caller, 'ratio_scale', algorithm, morvik_lte_modulation(caller, modulation), rate);
    end
    scale = morvik_lte_positive(caller, 'scale', options.scale);
    blocks = morvik_lte_segment(transport_block_size);
    decisions = cell(1, blocks.count);
    for r = 1:numel(decisions)
        [sys, par1, par2] = morvik_lte_call(caller, 'block_values', format, r - 1, buffers, scale);
        decisions{r} = morvik_decode(sys, par1, par2, 'num_pu', options.num_pu, 'algorithm', options.algorithm, ...
            'iterations', options.iterations);
    end
    [bits, fits, code_blocks_fit] = morvik_lte_call(caller, 'join', format, decisions);
end
