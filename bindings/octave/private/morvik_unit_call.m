% What a unit computes of its inputs, a cell with a name, a number of rows and the values in each row.
%
%   results = morvik_unit_call(caller, inputs)
%   results = morvik_unit_call(caller, inputs, options)
%
% The unit is what the caller's name ends in.
function results = morvik_unit_call(caller, inputs, options)
    algorithm = 'scaled';
    if nargin > 2
        algorithm = options.algorithm;
    end
    number = morvik_choice(caller, 'algorithm', algorithm, {'max-log', 'scaled', 'table'}) - 1;
    unit = caller(numel('morvik_unit_') + 1:end);
    values = columns(caller, inputs);
    [status, text, place, results] = morvik_unit_mex(unit, number, values{:});
    if status == 99
        error('morvik:outOfMemory', '%s: %s', caller, text);
    elseif status ~= 0
        error('morvik:badValue', '%s: in column %d, %s', caller, place, text);
    end
end

% The inputs as words, all with a column for each case.
function values = columns(caller, inputs)
    values = cell(1, size(inputs, 1));
    counts = zeros(size(values));
    for i = 1:numel(values)
        values{i} = words(caller, inputs{i, :});
        counts(i) = size(values{i}, 2);
    end
    cases = unique(counts(counts ~= 1));
    if numel(cases) > 1
        error('morvik:badSize', '%s: %s have to have equal numbers of columns, or one', caller, ...
            strjoin(inputs(:, 1).', ', '));
    end
    for i = find(counts == 1 & ~isempty(cases))
        values{i} = repmat(values{i}, 1, cases);
    end
end

function values = words(caller, name, rows, values)
    if ~isnumeric(values) || ~isreal(values) || issparse(values)
        error('morvik:badClass', '%s: %s has to be a full matrix of real numbers', caller, name);
    end
    if isequal(size(values), [1, rows])
        values = values(:);  % a single case
    end
    if ndims(values) > 2 || size(values, 1) ~= rows
        error('morvik:badSize', '%s: %s has to have %d rows and a column for each case, but it is %s', caller, name, ...
            rows, strjoin(arrayfun(@num2str, size(values), 'UniformOutput', false), 'x'));
    elseif any(values(:) ~= fix(values(:)))
        error('morvik:badValue', '%s: %s has to hold whole numbers', caller, name);
    end
    values = int32(values);  % saturates, and what is beyond 32 bits is refused as well
end
