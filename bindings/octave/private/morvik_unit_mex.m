% MORVIK_UNIT_MEX  Placeholder for the compiled function of this name.
function varargout = morvik_unit_mex(varargin)
    error('morvik:notBuilt', ['these functions are not built: bindings/octave/build builds them into a folder ' ...
        'for addpath; docs/octave.md tells how, also for MATLAB']);
end
