% Runs the tests of a file, shows those that fail, and fails when one does.
%   octave-cli --path FUNCTIONS run_tests.m FILE
[passed, all] = test(argv(){1}, 'quiet', stdout);
printf('%d of %d tests have passed\n', passed, all);
exit(double(passed == 0 || passed ~= all));
