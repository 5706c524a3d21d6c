% Soft buffers of a size as single, or [].
function buffers = morvik_lte_buffers(caller, buffers, rows, columns)
    buffers = morvik_lte_ratios(caller, 'buffers', buffers);
    if ~isempty(buffers) && ~isequal(size(buffers), [rows, columns])
        error('morvik:badSize', '%s: buffers have to be %dx%d, not %dx%d', caller, rows, columns, size(buffers));
    end
end
