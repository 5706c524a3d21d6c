% What is added to soft buffers: ratios as single, or integers as int16 for soft buffers of `width` bits.
function [received, width] = morvik_lte_received(caller, received, width)
    if isempty(width)
        received = morvik_lte_ratios(caller, 'ratios', received);
        width = 0;
        return
    end
    width = morvik_lte_number(caller, 'width', width, 2, 16);
    if ~(isa(received, 'int8') || isa(received, 'int16')) || ndims(received) > 2
        error('morvik:badClass', ...
            '%s: with a width, ratios have to be integers, a matrix of class int8 or int16, not %s', ...
            caller, class(received));
    end
    received = int16(received);
end
