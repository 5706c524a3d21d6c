% MORVIK_LTE_DECODE  Decodes the soft buffers of transport blocks with the core, and checks their CRCs.
%
%   [bits, fits, code_blocks_fit] = morvik_lte_decode(buffers, transport_block_size, coded_bits, modulation, ...
%                                                     option, value, ...)
%
% buffers                 as from morvik_lte_recover, a transport block in each column. Those of integers, int16, are
%                         only clipped
% transport_block_size    bits of a transport block (A)
% coded_bits              bits of one transmission (G)
% modulation              as for morvik_lte_encode
% bits                    decisions, logical, transport_block_size rows
% fits                    whether all CRCs of a transport block fit: logical, one row
% code_blocks_fit         whether the CRC of each code block fits: logical, a row for each code block
%
% Options:
%   'scale'    soft value for a ratio of 1; [] is that of morvik_lte_scale (default)
%   'num_pu', 'algorithm', 'iterations'    as for morvik_decode
%   'layers', 'soft_buffer_size'           as for morvik_lte_encode
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_recover, morvik_lte_streams, morvik_decode.
function [bits, fits, code_blocks_fit] = morvik_lte_decode(buffers, transport_block_size, coded_bits, modulation, varargin)
    caller = 'morvik_lte_decode';
    if nargin < 4
        error('morvik:badCall', '%s: needs soft buffers, two sizes and the modulation', caller);
    end
    [format, options] = morvik_lte_format(caller, transport_block_size, coded_bits, modulation, ...
        struct('scale', [], 'num_pu', 2, 'algorithm', 'scaled', 'iterations', 8), varargin);
    streams = morvik_lte_values(caller, format, buffers, modulation, options.scale, options.algorithm);
    blocks = morvik_lte_segment(transport_block_size);
    decisions = cell(1, blocks.count);
    for alike = {1:blocks.count_minus, blocks.count_minus + 1:blocks.count}  % those of one size in one call
        if ~isempty(alike{1})
            decided = morvik_decode([streams{alike{1}, 1}], [streams{alike{1}, 2}], [streams{alike{1}, 3}], ...
                'num_pu', options.num_pu, 'algorithm', options.algorithm, 'iterations', options.iterations);
            columns = repmat(size(buffers, 2), 1, numel(alike{1}));
            decisions(alike{1}) = mat2cell(decided, size(decided, 1), columns);
        end
    end
    [bits, fits, code_blocks_fit] = morvik_lte_call(caller, 'join', format, decisions);
end
