% The format of transport blocks that a call describes, as the library takes it, and its options, those of the format and
% of `more`.
function [format, options] = morvik_lte_format(caller, transport_block_size, coded_bits, modulation, more, given)
    more.layers = 1;
    more.soft_buffer_size = 0;
    options = morvik_options(caller, more, given);
    if isfield(options, 'version')
        options.version = morvik_lte_number(caller, 'version', options.version, 0, 3);
    end
    layers = morvik_lte_number(caller, 'layers', options.layers, 1, 4);
    symbol = morvik_lte_modulation(caller, modulation) * layers;
    coded_bits = morvik_lte_number(caller, 'coded_bits', coded_bits, 1, 2 ^ 31 - 1);
    if mod(coded_bits, symbol) ~= 0
        error('morvik:badSize', '%s: %d coded bits are no multiple of the %d of a symbol; %d would fit', caller, ...
            coded_bits, symbol, max(symbol, coded_bits - mod(coded_bits, symbol)));
    end
    format = [morvik_lte_number(caller, 'transport_block_size', transport_block_size, 1, 2 ^ 24), coded_bits, ...
        symbol / layers, layers, morvik_lte_number(caller, 'soft_buffer_size', options.soft_buffer_size, 0, 2 ^ 31 - 1)];
end
