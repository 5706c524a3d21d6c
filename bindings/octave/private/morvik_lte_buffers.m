% Soft buffers of a class and size, or [].
function buffers = morvik_lte_buffers(caller, buffers, kind, rows, columns)
    if strcmp(kind, 'single') && ~isa(buffers, 'int16')
        buffers = morvik_lte_ratios(caller, 'buffers', buffers);
    elseif ~isempty(buffers) && ~isa(buffers, kind)
        error('morvik:badClass', '%s: buffers have to be of class %s here, not %s', caller, kind, class(buffers));
    end
    if ~isempty(buffers) && ~isequal(size(buffers), [rows, columns])
        error('morvik:badSize', '%s: buffers have to be %dx%d, not %dx%d', caller, rows, columns, size(buffers));
    end
end
