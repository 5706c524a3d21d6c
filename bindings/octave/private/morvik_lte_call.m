% Calls the library, and raises its refusals as errors.
function varargout = morvik_lte_call(caller, command, varargin)
    results = cell(1, max(nargout, 1));
    [status, text, results{:}] = morvik_lte_mex(command, varargin{:});
    if status == 99
        error('morvik:outOfMemory', '%s: %s', caller, text);
    elseif status ~= 0
        error('morvik:badSize', '%s: %s', caller, text);
    end
    varargout = results;
end
