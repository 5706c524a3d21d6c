% Encodes a block, corrupts every ninth value of each stream, and decodes it, with its log-likelihood ratios.
%
%   bindings/octave/run examples/soft_output.m
K = 40;
bits = mod((0:K - 1)' .^ 2, 7) < 3;
[sys, par1, par2] = morvik_encode(bits);

received = int8(16 * [sys, par1, par2] - 8);  % bit 0 as -8, bit 1 as 8
for stream = 1:3
    received(stream:9:end, stream) = -received(stream:9:end, stream);
end
fprintf('received: %d of %d values wrong\n', sum(sum((received > 0) ~= [sys, par1, par2])), numel(received));

[decided, ratios] = morvik_decode(received(:, 1), received(:, 2), received(:, 3), 'num_pu', 4, 'iterations', 8);
fprintf('decided:  %d of %d bits wrong\n', sum(decided ~= bits), K);
fprintf('the first ratios: %s\n', mat2str(double(ratios(1:4)') / 128));

try
    morvik_decode(received(1:K, 1), received(1:K, 2), received(1:K, 3));
catch refusal
    disp(refusal.message);
end
