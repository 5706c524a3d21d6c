% The rate matching of code blocks that the options describe: K, filler bits, positions, redundancy version.
function [matching, buffers, filler] = morvik_lte_matching(caller, K, given)
    defaults = struct('version', 0, 'fillers', 0, 'buffer_size', 0, 'buffers', [], 'filler', -128);
    options = morvik_lte_options(caller, defaults, given);
    K = morvik_lte_number(caller, 'K', K, 0, 6144);
    matching = [K, morvik_lte_number(caller, 'fillers', options.fillers, 0, 6143), ...
        morvik_lte_number(caller, 'buffer_size', options.buffer_size, 0, 2 ^ 31 - 1), ...
        morvik_lte_number(caller, 'version', options.version, 0, 3)];
    buffers = options.buffers;
    filler = double(morvik_lte_ratios(caller, 'filler', options.filler));
end
