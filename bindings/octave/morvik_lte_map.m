% MORVIK_LTE_MAP  Maps bits to symbols of mean energy 1: 3GPP TS 36.211, clauses 7.1.2 to 7.1.5.
%
%   symbols = morvik_lte_map(bits, modulation)
%
% bits          zeros and ones, a block in each column
% modulation    'qpsk', '16qam', '64qam' or '256qam', or 'bpsk' of one dimension, which sends 1 as 1 and 0 as -1
% symbols       single, complex but for 'bpsk': a row for as many bits as a symbol has
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_demap, morvik_lte_encode.
function symbols = morvik_lte_map(bits, modulation)
    caller = 'morvik_lte_map';
    if nargin < 2
        error('morvik:badCall', '%s: needs bits and the modulation', caller);
    end
    count = morvik_lte_modulation(caller, modulation);
    bits = morvik_lte_symbols(caller, bits, count);
    symbols = morvik_lte_call(caller, 'map', count, bits);
    if count > 1
        symbols = complex(symbols(1:2:end, :), symbols(2:2:end, :));
    end
end
