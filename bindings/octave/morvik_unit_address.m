% MORVIK_UNIT_ADDRESS  The interleaver's address of a step of the interleaved code.
%
%   address = morvik_unit_address(block_size, step)
%
% block_size   K, a block size of 3GPP TS 36.212
% step         0 to K - 1
% address      where the step finds its values in natural order, 0 to K - 1: add 1 to index a vector
%
% Cases, results and errors are as in morvik_unit_intrinsic.
%
% See also morvik_encode.
function address = morvik_unit_address(block_size, step)
    caller = 'morvik_unit_address';
    if nargin < 2
        error('morvik:badCall', '%s: needs block size and step', caller);
    end
    address = morvik_unit_call(caller, {'block_size', 1, block_size; 'step', 1, step});
end
