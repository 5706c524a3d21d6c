% MORVIK_LTE_JOIN  Puts the decisions on code blocks together to transport blocks, and checks their CRCs.
%
%   [bits, fits, code_blocks_fit] = morvik_lte_join(decisions, transport_block_size, coded_bits, modulation, ...
%                                                   option, value, ...)
%
% decisions               a cell with the decisions on each code block, K rows, a transport block in each column
% transport_block_size    bits of a transport block (A)
% coded_bits              bits of one transmission (G)
% modulation              as for morvik_lte_encode
% bits                    logical, transport_block_size rows
% fits                    whether all CRCs of a transport block fit: logical, one row
% code_blocks_fit         whether the CRC of each code block fits: logical, a row for each code block
%
% Options:
%   'layers', 'soft_buffer_size'    as for morvik_lte_encode
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_streams, morvik_lte_decode.
function [bits, fits, code_blocks_fit] = morvik_lte_join(decisions, transport_block_size, coded_bits, modulation, varargin)
    caller = 'morvik_lte_join';
    if nargin < 4
        error('morvik:badCall', '%s: needs decisions, two sizes and the modulation', caller);
    end
    format = morvik_lte_format(caller, transport_block_size, coded_bits, modulation, struct(), varargin);
    blocks = morvik_lte_call(caller, 'code_blocks', format);
    if ~iscell(decisions) || numel(decisions) ~= size(blocks, 2)
        error('morvik:badSize', '%s: decisions have to be a cell of %d code blocks', caller, size(blocks, 2));
    end
    for r = 1:numel(decisions)
        decisions{r} = morvik_lte_bits(caller, 'decisions', decisions{r});
        if ~isequal(size(decisions{r}), [blocks(1, r), size(decisions{1}, 2)])
            error('morvik:badSize', '%s: decisions on code block %d have to be %dx%d, not %dx%d', caller, r, ...
                blocks(1, r), size(decisions{1}, 2), size(decisions{r}));
        end
    end
    [bits, fits, code_blocks_fit] = morvik_lte_call(caller, 'join', format, decisions);
end
