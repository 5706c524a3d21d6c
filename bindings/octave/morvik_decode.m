% MORVIK_DECODE  Decodes blocks of the LTE turbo code bit-accurately as the hardware does.
%
%   bits = morvik_decode(sys, par1, par2)
%   bits = morvik_decode(sys, par1, par2, option, value, ...)
%   [bits, ratios, tags] = morvik_decode(...)
%
% sys, par1, par2   soft values of the systematic and of the two parity streams (d(0), d(1), d(2) of 3GPP TS 36.212):
%                   matrices of K + 4 rows, one block per column, its tail in the last four rows. A single block may
%                   also be three rows; then bits and ratios are rows, too. A positive value favours bit 1. Values
%                   are in eighths, clipped to -128 ... 127. int8, int16 and int32 are decoded directly; values of
%                   other classes must be integers. Unsigned classes are refused.
% bits              K decisions in each column, logical
% ratios            log-likelihood ratios of the decisions, int16, in units of 1/128
% tags              block tags, truncated to tag_width bits, a row of uint32
%
% Options and their defaults:
%
%   num_pu      2          processing units: 2, 4 or 8
%   algorithm   'scaled'   'max-log', 'scaled' (max-log, extrinsic values times 0.75) or 'table' (max-log with a
%                          correction table)
%   iterations  8          1 to 15
%   tag_width   8          bits of the block tags, 0 to 32; as in the hardware, 32 keeps none
%   tags        zeros      a block tag for each column, 0 to 2^32 - 1
%   class       'logical'  class of bits: 'logical' or 'int8'
%
% Errors:    morvik:badCall, morvik:badOption, morvik:badClass, morvik:badSize, morvik:badValue, morvik:outOfMemory
% Warnings:  morvik:saturated, morvik:tagTruncated, for the first such value of a call. Switch them off by
%            warning('off', 'morvik:saturated').
%
% Example: a block of 40 bits over a noisy channel
%
%   sent = rand(40, 1) < 0.5;
%   [sys, par1, par2] = morvik_encode(sent);
%   receive = @(bits) round(8 * (2 * bits - 1 + 0.7 * randn(size(bits))));
%   wrong = sum(morvik_decode(receive(sys), receive(par1), receive(par2)) ~= sent)
%
% See also morvik_encode.
function [bits, ratios, tags] = morvik_decode(sys, par1, par2, varargin)
    if nargin < 3
        error('morvik:badCall', 'morvik_decode: needs sys, par1 and par2, the three streams of soft values');
    end
    [sys, par1, par2, is_row] = streams(sys, par1, par2);
    options = read_options(varargin, size(sys, 2));
    configuration = [options.num_pu, options.algorithm, options.tag_width, options.iterations];
    [status, messages, bits, ratios, tags] = morvik_mex('decode', sys, par1, par2, configuration, options.tags);
    morvik_messages('morvik_decode', status, messages, size(sys, 1), 'K + 4 values, the tail included, with');
    if is_row
        bits = bits.';
        ratios = ratios.';
    end
    if strcmp(options.class, 'int8')
        bits = int8(bits);
    end
end

% The streams as columns of a class that the library takes.
function [sys, par1, par2, is_row] = streams(sys, par1, par2)
    same_size(sys, par1, par2);
    is_row = size(sys, 1) == 1;
    taken = {'int8', 'int16', 'int32'};
    if ~(any(strcmp(class(sys), taken)) && isa(par1, class(sys)) && isa(par2, class(sys)))
        sys = whole('sys', sys);
        par1 = whole('par1', par1);
        par2 = whole('par2', par2);
    end
    if is_row
        sys = sys.';
        par1 = par1.';
        par2 = par2.';
    end
end

function same_size(sys, par1, par2)
    if ndims(sys) > 2 || ~isequal(size(sys), size(par1), size(par2))
        error('morvik:badSize', ...
            'morvik_decode: sys, par1 and par2 have to be matrices of one size, but they are %s, %s and %s', ...
            size_text(sys), size_text(par1), size_text(par2));
    end
    if size(sys, 1) == 0
        error('morvik:badSize', ['morvik_decode: sys, par1 and par2 are empty (%s), but every column is a block of ' ...
            'K + 4 values'], size_text(sys));
    end
end

function text = size_text(array)
    text = sprintf('%dx', size(array));
    text(end) = [];
end

function values = whole(name, values)
    if ~isnumeric(values) || ~isreal(values) || issparse(values)
        error('morvik:badClass', 'morvik_decode: %s has to be a full matrix of real numbers, not %s', ...
            name, class_text(values));
    end
    if strncmp(class(values), 'uint', 4)
        error('morvik:badClass', ['morvik_decode: %s is of class %s, which has no negative values; soft values are ' ...
            'negative for bit 0'], name, class(values));
    end
    % Within 24 bits, the range that the hardware reads.
    if any(values(:) ~= fix(values(:))) || any(values(:) < -2^23) || any(values(:) >= 2^23)
        error('morvik:badValue', ['morvik_decode: %s has to hold whole numbers from -2^23 to 2^23 - 1, ' ...
            'as round(8 * received) gives for bits sent as -1 and 1'], name);
    end
    values = int32(values);
end

function text = class_text(value)
    text = class(value);
    if issparse(value)
        text = ['sparse ' text];
    elseif isnumeric(value) && ~isreal(value)
        text = ['complex ' text];
    end
end

function options = read_options(arguments, blocks)
    options = struct('num_pu', 2, 'algorithm', 1, 'iterations', 8, 'tag_width', 8, ...
        'tags', zeros(1, 0, 'uint32'), 'class', 'logical');
    names = fieldnames(options);
    if mod(numel(arguments), 2) ~= 0
        error('morvik:badCall', 'morvik_decode: options come as pairs of a name and a value');
    end
    for i = 1:2:numel(arguments)
        name = names{one_of('option', arguments{i}, names.')};
        options.(name) = read_option(name, arguments{i + 1}, blocks);
    end
end

function value = read_option(name, value, blocks)
    switch name
        case 'algorithm'
            value = one_of(name, value, {'max-log', 'scaled', 'table'}) - 1;
        case 'class'
            classes = {'logical', 'int8'};
            value = classes{one_of(name, value, classes)};
        case 'tags'
            if numel(value) ~= blocks
                error('morvik:badSize', 'morvik_decode: %d tags were given for %d blocks', numel(value), blocks);
            end
            if ~isnumeric(value) || ~isreal(value) || ~all(value(:) == fix(value(:)) & value(:) >= 0 & value(:) < 2^32)
                error('morvik:badOption', 'morvik_decode: tags have to be whole numbers from 0 to 2^32 - 1');
            end
            value = uint32(full(value));
        otherwise
            if ~isnumeric(value) || ~isreal(value) || ~isscalar(value) || value ~= fix(value) || abs(value) >= 2^31
                error('morvik:badOption', 'morvik_decode: %s has to be a whole number', name);
            end
            value = double(value);
    end
end

function index = one_of(name, value, values)
    if isa(value, 'string')  % MATLAB has two string classes
        value = char(value);
    end
    if ~ischar(value)
        error('morvik:badOption', 'morvik_decode: %s has to be a text, not of class %s', name, class(value));
    end
    index = find(strcmp(value, values));
    if isempty(index)
        error('morvik:badOption', 'morvik_decode: there is no %s ''%s''; there are %s', name, value, ...
            strjoin(values, ', '));
    end
end
