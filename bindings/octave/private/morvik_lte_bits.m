% The bits as a logical matrix.
function bits = morvik_lte_bits(caller, name, bits)
    if ~(islogical(bits) || isnumeric(bits) && isreal(bits)) || issparse(bits) || ndims(bits) > 2
        error('morvik:badClass', '%s: %s have to be a full logical or numeric matrix', caller, name);
    elseif ~islogical(bits) && any(bits(:) ~= 0 & bits(:) ~= 1)
        error('morvik:badValue', '%s: %s have to be 0 or 1', caller, name);
    end
    bits = logical(bits);
end
