% MORVIK_LTE_DEMAP  The log-likelihood ratios of the bits of received symbols.
%
%   ratios = morvik_lte_demap(symbols, modulation, noise_variance, option, value, ...)
%
% symbols           gain * symbol + noise, its phase already turned back, a block in each column
% modulation        as for morvik_lte_map
% noise_variance    of I and Q together (N0), above 0; the one dimension of 'bpsk' has half of it
% ratios            ln(P(1) / P(0)), single: rows for the bits of each symbol
%
% Options:
%   'gains'       the channel's amplitude at each symbol, at least 0; [] where all are 1 (default)
%   'demapper'    'max-log', by the nearest points alone (default), or 'exact', by all points
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_map, morvik_lte_recover, morvik_lte_soft_values.
function ratios = morvik_lte_demap(symbols, modulation, noise_variance, varargin)
    caller = 'morvik_lte_demap';
    if nargin < 3
        error('morvik:badCall', '%s: needs symbols, the modulation and the variance of the noise', caller);
    end
    options = morvik_options(caller, struct('gains', [], 'demapper', 'max-log'), varargin);
    count = morvik_lte_modulation(caller, modulation);
    demapper = morvik_choice(caller, 'demapper', options.demapper, {'max-log', 'exact'}) - 1;
    if ~isnumeric(symbols) || issparse(symbols) || ndims(symbols) > 2 || count == 1 && ~isreal(symbols)
        error('morvik:badClass', '%s: symbols have to be a full matrix of numbers, real for bpsk', caller);
    elseif any(~isfinite(single(symbols(:))))
        error('morvik:badValue', '%s: symbols have to be finite', caller);
    end
    parts = single(real(symbols));
    if count > 1
        parts = reshape([parts(:), single(imag(symbols(:)))].', 2 * size(symbols, 1), size(symbols, 2));
    end
    gains = morvik_lte_ratios(caller, 'gains', options.gains);
    if ~isempty(gains) && (~isequal(size(gains), size(symbols)) || any(gains(:) < 0))
        error('morvik:badSize', '%s: gains have to be at least 0, one for each symbol', caller);
    end
    ratios = morvik_lte_call(caller, 'demap', count, demapper, parts, gains, ...
        morvik_lte_positive(caller, 'noise_variance', noise_variance));
end
