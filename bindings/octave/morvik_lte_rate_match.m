% MORVIK_LTE_RATE_MATCH  Rate matching of code blocks: 3GPP TS 36.212, clause 5.1.4.1.
%
%   coded = morvik_lte_rate_match(sys, par1, par2, count, option, value, ...)
%
% sys, par1, par2    bits as from morvik_encode, K + 4 rows, a block in each column
% count              bits to send of each block (E)
% coded              logical, count rows
%
% Options:
%   'version'        redundancy version, 0 to 3 (default 0)
%   'fillers'        filler bits at the start of each block (F), which are not sent (default 0)
%   'buffer_size'    positions of the circular buffer (N_cb), its dummy and filler bits included; 0 for all (default)
%
% Errors:   morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:badOption
%
% See also morvik_lte_rate_recover, morvik_lte_encode, morvik_encode.
function coded = morvik_lte_rate_match(sys, par1, par2, count, varargin)
    caller = 'morvik_lte_rate_match';
    if nargin < 4
        error('morvik:badCall', '%s: needs sys, par1, par2 and the number of bits to send', caller);
    end
    sys = morvik_lte_bits(caller, 'sys', sys);
    par1 = morvik_lte_bits(caller, 'par1', par1);
    par2 = morvik_lte_bits(caller, 'par2', par2);
    if ~isequal(size(sys), size(par1), size(par2))
        error('morvik:badSize', '%s: sys, par1 and par2 have to be matrices of one size', caller);
    end
    count = morvik_lte_number(caller, 'count', count, 0, 2 ^ 31 - 1);
    matching = morvik_lte_matching(caller, size(sys, 1) - 4, struct('version', 0), varargin);
    coded = morvik_lte_call(caller, 'rate_match', matching, sys, par1, par2, count);
end
