% The place of a word among those that are allowed.
function place = morvik_choice(caller, name, word, words)
    place = find(strcmp(word, words));
    if ~ischar(word) || isempty(place)
        error('morvik:badOption', '%s: %s has to be one of %s', caller, name, strjoin(words, ', '));
    end
end
