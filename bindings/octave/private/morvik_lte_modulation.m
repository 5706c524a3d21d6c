% The bits of a symbol.
function count = morvik_lte_modulation(caller, modulation)
    counts = [1, 2, 4, 6, 8];
    count = counts(morvik_choice(caller, 'modulation', modulation, {'bpsk', 'qpsk', '16qam', '64qam', '256qam'}));
end
