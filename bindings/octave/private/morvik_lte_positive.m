% A positive number that class single holds, as a double.
function number = morvik_lte_positive(caller, name, number)
    is_number = isnumeric(number) && isscalar(number) && isreal(number);
    if ~is_number || ~(single(number) > 0 && isfinite(single(number)))
        error('morvik:badValue', '%s: %s has to be a positive number', caller, name);
    end
    number = double(number);
end
