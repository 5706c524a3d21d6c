% Simulates the bit error rates of the three algorithms for blocks of 512 bits, and plots them.
%
%   waterfall()         shows the plot
%   waterfall(file)     writes it to a file, such as waterfall.svg
function waterfall(file)
    rng(1);
    K = 512;
    blocks = 2000;
    ebn0 = 0:0.25:1.5;  % dB
    algorithms = {'max-log', 'scaled', 'table'};
    rates = zeros(numel(ebn0), numel(algorithms));
    for point = 1:numel(ebn0)
        variance = (3 * K + 12) / (2 * K) / 10 ^ (ebn0(point) / 10);  % of the noise, bits sent as -1 and 1
        bits = rand(K, blocks) < 0.5;
        [sys, par1, par2] = morvik_encode(bits);
        received = @(stream) 2 * stream - 1 + sqrt(variance) * randn(size(stream));
        sys = received(sys);
        par1 = received(par1);
        par2 = received(par2);
        for a = 1:numel(algorithms)
            scale = 8;
            if strcmp(algorithms{a}, 'table')
                scale = 8 / variance;  % docs/scale.md tells why
            end
            decided = morvik_decode(round(scale * sys), round(scale * par1), round(scale * par2), ...
                'algorithm', algorithms{a});
            rates(point, a) = mean(decided(:) ~= bits(:));
        end
        fprintf('%5.2f dB  %8.2e  %8.2e  %8.2e\n', ebn0(point), rates(point, :));
    end

    rates(rates == 0) = NaN;  % cannot be drawn on a logarithmic axis
    if nargin > 0
        figure('visible', 'off');
    end
    semilogy(ebn0, rates, 'o-', 'linewidth', 1.5, 'markersize', 4);
    grid on;
    xlim(ebn0([1 end]));
    xlabel('Eb/N0 (dB)');
    ylabel('bit error rate');
    title(sprintf('%d bits, 2 units, 8 iterations', K));
    legend(algorithms, 'location', 'southwest');
    if nargin > 0
        print(file);
    end
end
