% The soft values of each code block of a format: a cell with sys, par1 and par2 in its columns.
function streams = morvik_lte_values(caller, format, buffers, modulation, scale, algorithm)
    kind = 'single';
    if isa(buffers, 'int16')
        kind = 'int16';
        if ~isempty(scale)
            error('morvik:badValue', '%s: scale has to be [] for buffers of integers, which were scaled before', caller);
        end
    end
    rows = morvik_lte_call(caller, 'transport_buffer', format);
    buffers = morvik_lte_buffers(caller, buffers, kind, rows, size(buffers, 2));
    if isempty(scale)
        scale = morvik_lte_scale(modulation, format(1) / format(2), algorithm);
    end
    scale = morvik_lte_positive(caller, 'scale', scale);
    blocks = morvik_lte_segment(format(1));
    streams = cell(blocks.count, 3);
    for r = 1:blocks.count
        [streams{r, :}] = morvik_lte_call(caller, 'block_values', format, r - 1, buffers, scale);
    end
end
