% MORVIK_ENCODE  Encodes blocks of bits with the turbo code of LTE (3GPP TS 36.212, clause 5.1.3.2).
%
%   [sys, par1, par2] = morvik_encode(bits)
%
% bits              zeros and ones: a matrix of K rows, one block per column, with a block size K of TS 36.212, Table
%                   5.1.3-3 (40 to 6144). A single block may be a row; then the streams are rows, too.
% sys, par1, par2   the systematic and the two parity streams, d(0), d(1), d(2) of TS 36.212: logical, K + 4 rows. The
%                   last four rows are the tail, in the order in which morvik_decode takes it.
%
% Errors:    morvik:badCall, morvik:badClass, morvik:badSize, morvik:badValue, morvik:outOfMemory
%
% Example: what is sent, bit 0 as -1 and bit 1 as 1
%
%   [sys, par1, par2] = morvik_encode(rand(512, 100) < 0.5);
%   sent = 2 * [sys; par1; par2] - 1;
%
% See also morvik_decode.
function [sys, par1, par2] = morvik_encode(bits)
    if nargin < 1
        error('morvik:badCall', 'morvik_encode: needs a matrix of bits');
    end
    if ~(islogical(bits) || isnumeric(bits) && isreal(bits)) || issparse(bits)
        error('morvik:badClass', 'morvik_encode: bits have to be a full logical or numeric matrix');
    end
    if ndims(bits) > 2
        error('morvik:badSize', 'morvik_encode: bits have to be a matrix, not an array of %d dimensions', ndims(bits));
    end
    if any(bits(:) ~= 0 & bits(:) ~= 1)
        error('morvik:badValue', 'morvik_encode: bits have to be 0 or 1');
    end
    is_row = size(bits, 1) == 1;
    if is_row
        bits = bits.';
    end
    [status, messages, sys, par1, par2] = morvik_mex('encode', logical(bits));
    morvik_messages('morvik_encode', status, messages, size(bits, 1), 'bits, with');
    if is_row
        sys = sys.';
        par1 = par1.';
        par2 = par2.';
    end
end
