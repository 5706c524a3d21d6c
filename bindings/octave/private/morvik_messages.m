% Raises the library's messages about a call as errors and warnings.
%
%   morvik_messages(caller, status, messages, rows, column)
%
% status and messages are those of the library: lines such as "WARNING:decoder:text". rows is the size of a column, and
% `column` says what it should have been.
function morvik_messages(caller, status, messages, rows, column)
    lines = regexp(messages, '([^:\n]*):[^:\n]*:([^\n]*)', 'tokens');
    for i = 1:numel(lines)
        text = lines{i}{2};
        if strcmp(lines{i}{1}, 'WARNING')
            identifiers = {'morvik:tagTruncated', 'morvik:saturated'};
            warning(identifiers{1 + ~isempty(strfind(text, 'saturated'))}, '%s: %s', caller, text);
        elseif status == 1
            error('morvik:badOption', '%s: %s', caller, text);
        elseif status == 2
            error('morvik:badSize', ['%s: %s: there are %d rows, but every column is a block of %s ' ...
                'a block size K of 3GPP TS 36.212'], caller, text, rows, column);
        else
            error('morvik:outOfMemory', '%s: %s', caller, text);
        end
    end
end
