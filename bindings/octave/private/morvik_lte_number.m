% A whole number within bounds, as a double.
function number = morvik_lte_number(caller, name, number, low, high)
    is_number = isnumeric(number) && isscalar(number) && isreal(number);
    if ~is_number || ~(number >= low && number <= high) || fix(number) ~= number
        error('morvik:badValue', '%s: %s has to be a whole number from %d to %d', caller, name, low, high);
    end
    number = double(number);
end
