% Real, finite numbers as a matrix of class single.
function ratios = morvik_lte_ratios(caller, name, ratios)
    if ~isnumeric(ratios) || ~isreal(ratios) || issparse(ratios) || ndims(ratios) > 2
        error('morvik:badClass', '%s: %s have to be a full matrix of real numbers', caller, name);
    end
    ratios = single(ratios);  % which may be infinite where a double is not
    [row, column] = find(~isfinite(ratios), 1);
    if ~isempty(row)
        error('morvik:badValue', '%s: %s have to be finite, but that in row %d, column %d is not', caller, name, row, column);
    end
end
