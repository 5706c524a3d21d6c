# The program `promised_bits` and its test: what `morvik selftest` checks, without the rest of the command.
set(selftest ${PROJECT_SOURCE_DIR}/app/selftest)
add_executable(promised_bits
    ${tests}/builds/promised_bits.cpp
    ${selftest}/CheckBlocks.cpp
    ${selftest}/SelfCheck.cpp)
target_link_libraries(promised_bits PRIVATE morvik_testbench morvik_link morvik_classes morvik_options)
add_test(NAME promised_bits COMMAND promised_bits)
set_tests_properties(promised_bits PROPERTIES
    PASS_REGULAR_EXPRESSION "digest ${selftest_digest} .*Passed: this machine gives the promised bits")
