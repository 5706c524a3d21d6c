% MORVIK_LTE_MEX  Placeholder for the compiled function of this name.
function varargout = morvik_lte_mex(varargin)
    error('morvik:notBuilt', ['these functions are not built: bindings/octave/build builds them into a folder ' ...
        'for addpath; docs/octave.md tells how, also for MATLAB']);
end
