% MORVIK_LTE_TRANSMIT  Sends bits over a channel: morvik_lte_map, noise and fading, and morvik_lte_demap.
%
%   ratios = morvik_lte_transmit(bits, modulation, esn0_db, option, value, ...)
%
% bits          coded bits, a transmission in each column
% modulation    as for morvik_lte_map
% esn0_db       Es/N0 in dB, -50 to 50 in steps of 0.001
% ratios        log-likelihood ratios ln(P(1) / P(0)), single, of the size of bits
%
% Takes a tenth of the time of randn and the two functions.
%
% Options:
%   'channel'     white Gaussian noise, 'awgn' (default); with Rayleigh fading of each symbol, 'rayleigh', or of each
%                 transmission, 'block-rayleigh', which the receiver knows
%   'demapper'    as for morvik_lte_demap
%   'seed'        a whole number from 0 to 2^53, which decides all noise of a call, the same on every machine; [] draws it
%                 by rand (default)
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_encode, morvik_lte_recover.
function ratios = morvik_lte_transmit(bits, modulation, esn0_db, varargin)
    caller = 'morvik_lte_transmit';
    if nargin < 3
        error('morvik:badCall', '%s: needs bits, the modulation and Es/N0', caller);
    end
    options = morvik_options(caller, struct('channel', 'awgn', 'demapper', 'max-log', 'seed', []), varargin);
    count = morvik_lte_modulation(caller, modulation);
    bits = morvik_lte_symbols(caller, bits, count);
    channel = morvik_choice(caller, 'channel', options.channel, {'awgn', 'rayleigh', 'block-rayleigh'}) - 1;
    demapper = morvik_choice(caller, 'demapper', options.demapper, {'max-log', 'exact'}) - 1;
    is_number = isnumeric(esn0_db) && isscalar(esn0_db) && isreal(esn0_db);
    if ~is_number || ~(abs(esn0_db) <= 50) || abs(1000 * esn0_db - round(1000 * esn0_db)) > 1e-6
        error('morvik:badValue', '%s: esn0_db has to be a number from -50 to 50, in steps of 0.001', caller);
    end
    seed = options.seed;
    if isempty(seed)
        seed = floor(2 ^ 53 * rand());
    end
    seed = morvik_lte_number(caller, 'seed', seed, 0, 2 ^ 53);
    ratios = morvik_lte_call(caller, 'transmit', count, channel, demapper, round(1000 * double(esn0_db)), seed, bits);
end
