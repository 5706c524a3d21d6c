% The rate matching of code blocks that a call describes, as the library takes it: K, filler bits, positions and redundancy
% version; and its options, those of rate matching and of `more`.
function [matching, options] = morvik_lte_matching(caller, K, more, given)
    more.fillers = 0;
    more.buffer_size = 0;
    options = morvik_options(caller, more, given);
    version = 0;
    if isfield(options, 'version')
        version = morvik_lte_number(caller, 'version', options.version, 0, 3);
    end
    matching = [morvik_lte_number(caller, 'K', K, 0, 6144), ...
        morvik_lte_number(caller, 'fillers', options.fillers, 0, 6143), ...
        morvik_lte_number(caller, 'buffer_size', options.buffer_size, 0, 2 ^ 31 - 1), version];
end
