% The options with what a call gives, a list of names and values.
function options = morvik_options(caller, options, given)
    names = fieldnames(options);
    if mod(numel(given), 2) ~= 0
        error('morvik:badCall', '%s: every option needs a value', caller);
    end
    for i = 1:2:numel(given)
        if ~ischar(given{i})
            error('morvik:badCall', '%s: every option begins with its name', caller);
        elseif ~any(strcmp(given{i}, names))
            error('morvik:badOption', '%s: there is no option %s; there are %s', caller, given{i}, ...
                strjoin(names.', ', '));
        end
        options.(given{i}) = given{i + 1};
    end
end
