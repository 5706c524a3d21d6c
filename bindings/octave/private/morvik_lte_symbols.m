% The bits as a logical matrix, whole symbols in each column.
function bits = morvik_lte_symbols(caller, bits, count)
    bits = morvik_lte_bits(caller, 'bits', bits);
    if mod(size(bits, 1), count) ~= 0
        error('morvik:badSize', '%s: %d rows of bits are no multiple of the %d of a symbol', caller, size(bits, 1), count);
    end
end
