#!/usr/bin/env bash
# Runs the stages of continuous integration locally, all or the named ones.
#   ci.sh [STAGE[+STAGE...]...]     STAGE+STAGE runs them side by side
# Stages: format lint lint-tests docs compilers abi memory threads hostile coverage tests, and only when they are
# named: abi-renew archives browser browser-short build lint-short machines machines-short memory-short mutate packages
# starts windows windows-short
set -euo pipefail
cd "$(dirname "$0")/.."

sources() {
    git ls-files '*.h' '*.cpp' '*.c'
}

stage_format() {
    sources | xargs clang-format --dry-run -Werror
}

stage_lint() {
    tidy {base,src,lanes,link,simulation,report,hardware,validation,app,bindings}/'*.cpp'
    cppcheck -j "$(nproc)" --quiet --error-exitcode=1 --std=c++17 --enable=warning,performance,portability --inline-suppr \
        --suppress=internalAstError -I include -I src -I . base src link simulation report hardware validation app
}

# The analyzer leaves a function after 20,000 of its states instead of 225,000, which saves a third of the time; a fifth of
# the rest goes with the slowest checks of what is rare or compilers warn of, too.
stage_lint-short() {
    local shorter=(--extra-arg={-Xclang,-analyzer-config,-Xclang,max-nodes=20000})
    local slow=(bugprone-{assert-side-effect,infinite-loop,multiple-statement-macro,reserved-identifier,sizeof-expression}
        bugprone-{stringview-nullptr,suspicious-semicolon,suspicious-string-compare,unused-raii}
        misc-misleading-identifier readability-redundant-{control-flow,declaration})
    local left_out
    left_out=$(printf ',-%s' "${slow[@]}")
    stage_lint
}

# Takes as long as all other stages together.
stage_lint-tests() {
    tidy {tests,bench}/'*.cpp'
}

shorter=()
left_out=
tidy() {
    scripts/build x86_64
    # Standard error has the number of suppressed warnings, and the reason if it could not run.
    local log=build/x86_64/lint.log
    # A unit of bench/ needs a package that is not installed here, compilers of their own build the functions of Octave and
    # the module of WebAssembly, and Windows' units need its headers.
    git ls-files "$@" |
        grep -vxE 'bench/ItppDecoding\.cpp|bindings/(octave|javascript)/.*|base/SystemWindows.*' |
        xargs scripts/lint-units build/x86_64 build/lint |
        xargs -P "$(nproc)" -n 1 clang-tidy -p build/lint --quiet --checks="-bugprone-suspicious-include$left_out" "${shorter[@]}" \
            2>"$log" || { cat "$log" >&2; return 1; }
}

# The documents' site, warnings as errors. A separate test runs their code blocks.
stage_docs() {
    scripts/docs
}

# Both compilers, all warnings as errors; the tests stage covers g++.
stage_compilers() {
    local preset
    for preset in clang clang-32; do
        scripts/build "$preset"
        scripts/run-tests "$preset"
    done
}

# The libraries, and the files of tests/data/ with their binary interfaces, by the bits of a word.
declare -A interfaces=([morvik_v1_0_bitacc_cmodel]=abi [morvik_link]=abi.link [morvik_checker]=abi.checker)
declare -A bits=([x86_64]=64 [i386]=32)

# Compares the binary interfaces with the committed ones, which are stored compressed.
stage_abi() {
    local preset library
    build_abi x86_64
    build_abi i386
    export -f compare_abi
    for preset in x86_64 i386; do
        for library in "${!interfaces[@]}"; do
            echo $preset "$library" "tests/data/${interfaces[$library]}.${bits[$preset]}.xml.xz"
        done
    done | xargs -P "$(nproc)" -n 3 bash -euo pipefail -c 'compare_abi "$@"' compare_abi
}

# Makes the current interfaces the committed ones, after an intended change.
stage_abi-renew() {
    local preset library
    for preset in x86_64 i386; do
        build_abi $preset
        for library in "${!interfaces[@]}"; do
            write_abi $preset "$library" "tests/data/${interfaces[$library]}.${bits[$preset]}.xml.xz"
        done
    done
}

build_abi() {
    scripts/build "$1" morvik_v1_0_bitacc_cmodel morvik_link_c morvik_checker_c
}

# compare_abi PRESET LIBRARY FILE
compare_abi() {
    local kept=build/$1/$2.xml
    xz --decompress --stdout "$3" >"$kept"
    abidiff "$kept" "build/$1/lib/lib$2.so"
}

# write_abi PRESET LIBRARY FILE. What users' headers do not declare may change.
write_abi() {
    local headers=build/$1/abi-headers
    rm -rf "$headers"
    mkdir "$headers"
    cp include/*.h rules/*.h src/DecoderState.h "$headers"
    sed -n '/^set(MORVIK_CLASS_HEADERS/,/)/s/^ *\([A-Za-z0-9]*\.h\).*/src\/\1/p' cmake/Install.cmake | xargs cp -t "$headers"
    abidw --exported-interfaces-only --no-comp-dir-path --no-show-locs --no-corpus-path --drop-private-types \
        --headers-dir "$headers" "build/$1/lib/lib$2.so" | xz -9 >"$3"
}

# The preset with the sanitizers. The stages after memory-short take the same.
export sanitizers=sanitize

# Address and undefined behaviour sanitizers on all tests, then valgrind, which detects reads of uninitialised memory,
# on those that decode.
stage_memory() {
    # Long simulations would take ten minutes here; the other tests of the command run the same code.
    memory_without BerRuns Diagnosis.FindsEachMistakeInEachSize Diagnosis.BlamesNoiseAlone
}

# Leaves out other long tests whose code shorter tests run as well: statistics over many blocks, self-tests, a dump for
# each fault, and scripts that check numbers.
stage_memory-short() {
    local long=(BerRuns Faults/FaultyCore Stages/Mistakes Coverage.IsWholeInASet SelfCheck.FindsTheLibraryRight
        SelfCheck.Notices{TheLast,Another,Other} VcdDump.RefusesTimesAndChangesWithoutAnEnd
        Vectors.{ChecksCasesOfUnits,WritesWhatDecodeReads} Sizes/ModelValues.FollowFromEachOther/{5,6,7}
        Trace.NeedsNoMore DefaultScale.HalfAnd Situations.AreCountedAs FrameSource.DrawsWhat VectorSet.IsAsTheModelDecodesWithAll
        BerLink.GoesOnUntil Compare.{AgreesWithTheTrace,FindsNoDifferenceInTheCore,TellsThatADump,TellsWhichCore}
        CodeBlocksTest.AgreesWithTheClause SoftValueSampler.{CountsClipped,ValuesHave} UnitStimulus.{HasValues,IsTheSame}
        VectorSet.HasTheCodeBlocks)
    long+=(Diagnosis.{BlamesNoiseAlone,TakesNoChance,Finds{EachMistake,PairsOf,NothingIn,TheTails,TheSizeOf,AMissingOr,AScaleBeside}}
        ChainDiagnosis.{BlamesNoiseAlone,DoesNotBlame,TakesNo{Chance,Zeros},NamesNoMistakeThat,TellsWhenBits}
        ChainDiagnosis.Finds{EachMistake,PairsOf,NothingIn,TheSoftBuffer,MistakesBy,Scales})
    local scripts=(example_set example_sweep core_from_document default_core regression report_in_browser same_results same_vectors
        waveforms)
    sanitizers=sanitize-short
    MORVIK_TEST_BLOCKS=30 memory_without "${long[@]}" "${scripts[@]/%/$}"
}

# memory_without NAME...: beginnings of names of tests; a script's name ends with $
memory_without() {
    local skipped
    skipped=$(IFS='|'; echo "${*/#/^}")
    scripts/build $sanitizers
    # A process for many tests: to start one with sanitizers takes longer than most tests do.
    export -f sanitized
    local program shard
    for program in build/$sanitizers/tests/*_test; do
        for ((shard = 0; shard < $(nproc); ++shard)); do
            echo "$program" $shard
        done
    done | xargs -P "$(nproc)" -n 2 bash -euo pipefail -c 'sanitized "$@"' sanitized "-$(IFS=:; echo "${*/%/*}")"
    scripts/run-tests $sanitizers -E "$skipped|[.]"
    scripts/build x86_64 app_test library_test src_test
    MORVIK_TEST_COMMAND=$PWD/build/$sanitizers/bin/morvik \
        scripts/run-tests x86_64 -L '^command$' -R '[.]' -E "$skipped|^BlockLayout|^Programs|^SelfCheck|^SelfTest|^MpiRuns"
    export -f chosen uninitialised
    printf '%s\n' library_test 'ExactBlocks.*:*RandomBlocks.*' \
        src_test 'Generics.*:*State.*:DumpConfig.*:Simulate.*:TDecoder3G.*:*TDecoder3GPU.*' |
        xargs -P "$(nproc)" -n 2 bash -euo pipefail -c 'uninitialised "$@"' uninitialised
}

# chosen PROGRAM FILTER [COMMAND...]: runs the tests that FILTER chooses, under COMMAND if there is one. GoogleTest takes
# none for success; here, each pattern of the filter that names tests to run must choose one.
chosen() {
    local patterns pattern
    IFS=: read -r -a patterns <<<"${2%%-*}"
    for pattern in "${patterns[@]}" "$2"; do
        if [ -z "$("$1" --gtest_list_tests --gtest_filter="$pattern" | sed -n '/^  /p')" ]; then
            echo "$1 has no test $pattern" >&2
            return 1
        fi
    done
    "${@:3}" "$1" --gtest_brief=1 --gtest_filter="$2"
}

# sanitized FILTER PROGRAM SHARD
sanitized() {
    local log
    log=$2.$3.log
    GTEST_TOTAL_SHARDS=$(nproc) GTEST_SHARD_INDEX=$3 "$2" --gtest_brief=1 --gtest_filter="$1" >"$log" 2>&1 ||
        { cat "$log"; return 1; }
    echo "${2##*/} $3: $(tail -n 1 "$log")"
}

# uninitialised PROGRAM FILTER
uninitialised() {
    MORVIK_TEST_BLOCKS=5 chosen "build/x86_64/tests/$1" "$2" valgrind --quiet --error-exitcode=99 --leak-check=full
}

stage_threads() {
    scripts/build threads threads_test frame_simulator_test
    build/threads/tests/threads_test --gtest_brief=1
    chosen build/threads/tests/frame_simulator_test 'ThreadWorkers*'
}

# Every fuzzer on its corpus and a few thousand inputs derived from it, always the same ones. With HOSTILE_SECONDS each
# runs for that time on varying inputs; HOSTILE_CORPUS names a folder that keeps the findings of long runs for the next.
stage_hostile() {
    local fuzzers
    mapfile -t fuzzers < <(sed -n '/^foreach(fuzzer/,/)$/s/^ *\([a-z_]*_fuzz\).*/\1/p' tests/fuzz/CMakeLists.txt)
    if [ "${#fuzzers[@]}" -ne "$(find tests/fuzz -name '*_fuzz.cpp' | wc -l)" ]; then
        echo "tests/fuzz/CMakeLists.txt lists ${#fuzzers[@]} fuzzers, and there are others" >&2
        return 1
    fi
    scripts/build $sanitizers "${fuzzers[@]}"
    local corpus=${HOSTILE_CORPUS:-}
    if [ -z "$corpus" ]; then
        corpus=$(mktemp -d)
        trap 'rm -rf "$corpus"; trap - RETURN' RETURN
    fi
    export -f fuzz
    # The one that decodes takes longest, and goes first.
    printf '%s\n' simulate_fuzz "${fuzzers[@]}" | awk '!seen[$0]++' |
        xargs -P "$(nproc)" -n 1 bash -euo pipefail -c 'fuzz "$@"' fuzz "$corpus"
}

# fuzz CORPUS FUZZER
fuzz() {
    local limit=(-runs=4000 -seed=36212)
    local log=build/$sanitizers/$2.log
    [ -z "${HOSTILE_SECONDS:-}" ] || limit=(-max_total_time="$HOSTILE_SECONDS")
    [ ! -e "tests/fuzz/dictionaries/$2.dict" ] || limit+=(-dict="tests/fuzz/dictionaries/$2.dict")
    mkdir -p "$1/$2"
    "build/$sanitizers/tests/$2" "${limit[@]}" -max_len=4096 -print_final_stats=1 -artifact_prefix="$PWD/build/$sanitizers/" \
        "$1/$2" "tests/fuzz/corpus/$2" >"$log" 2>&1 || { tail -n 60 "$log"; return 1; }
    echo "$2: $(sed -n 's/.*number_of_executed_units: *//p' "$log") executions"
}

stage_coverage() {
    scripts/build coverage
    find build/coverage -name '*.gcda' -delete
    scripts/run-tests coverage -L '^(unit|library)$'
    count_lines src/
    echo "Details: build/coverage/report.html"
}

count_lines() {
    gcovr --root . --filter "$1" --exclude-throw-branches --exclude-unreachable-branches \
        --fail-under-line 97 --fail-under-branch 90 --html-details build/coverage/report.html build/coverage
}

# Runs only when named. What is built for Windows, in Wine, compared with the Linux command.
stage_windows() {
    scripts/setup --windows
    scripts/build x86_64 morvik app_test
    scripts/build windows all lane_decoder_test System_test
    ctest --test-dir build/windows --output-on-failure --no-tests=error
    # All but those of Unix devices and of programs that Wine has not.
    MORVIK_TEST_COMMAND=tests/windows/morvik chosen build/x86_64/tests/app_test \
        'Command.*:EncodeTest.*:TransportBlocksTest.*:Trace.*-*.NeedOptionsThatGoTogether:*.TellsWhatIsWrongWithFiles'
}

# That what is built for Windows gives the promised bits, and that its part of base/ compiles.
stage_windows-short() {
    scripts/setup --windows
    scripts/build windows promised_bits c_program morvik_base
    for test in promised_bits c_program; do
        ctest --test-dir build/windows --output-on-failure --no-tests=error -R "^$test\$"
    done
}

# The page in the browser and the npm package.
stage_browser() {
    scripts/browser
    scripts/build x86_64 morvik
    MORVIK_PACKAGE=build/browser/package MORVIK_COMMAND=build/x86_64/bin/morvik node --test bindings/javascript/tests/module.test.mjs
    bindings/javascript/tests/page_in_browser.py build/x86_64/bin/morvik build/browser/morvik.html
}

# That the module with vectors gives the promised bits.
stage_browser-short() {
    scripts/setup --browser
    scripts/build browser morvik-simd
    node bindings/javascript/tests/self_check.mjs build/browser/bin/morvik-simd.wasm
}

# Runs only when named: takes most of an hour.
stage_mutate() {
    scripts/mutate
}

# Runs only when named: builds a Debian system from downloads.
stage_packages() {
    scripts/packages
    tests/packages/clean_root.sh build/packages
}

# Runs only when named: builds every archive twice, the second time in another folder and without a cache of compilations.
# Each does what it should where there is nothing else, and the second is the same file. ARCHIVES names systems, else all.
stage_archives() {
    local other archive systems
    read -ra systems <<<"${ARCHIVES:-}"
    scripts/archives "${systems[@]}"
    for archive in build/archives/morvik-*; do
        tests/archives/use.sh "$archive"
    done
    other=$(mktemp -d)
    trap 'rm -rf "$other"; trap - RETURN' RETURN
    git ls-files -z | tar --create --null --files-from=- | tar --extract --directory="$other"
    SOURCE_DATE_EPOCH=$(git log -1 --format=%ct) CCACHE_DISABLE=1 "$other/scripts/archives" "${systems[@]}"
    for archive in build/archives/*; do
        case $archive in
            *.log) ;;
            *) cmp "$archive" "$other/$archive" ;;
        esac
    done
}

# Runs only when named: all tests on machines of other processors, in an emulator. That keeps no limit on memory, and does not
# tell why a program cannot be started.
stage_machines() {
    local preset
    local emulated='^(Checker.TellsThatThereIsNoMemory|(Compare|Plot|Systems).Say.*(Is|Are)Missing)$'
    scripts/setup --machines
    for preset in aarch64 s390x; do
        scripts/build "$preset"
        scripts/run-tests "$preset" -E "$emulated"
    done
}

# That they give the promised bits, without the command, which takes most of the time of a build.
stage_machines-short() {
    scripts/setup --machines
    export -f promised_bits_of
    printf '%s\n' aarch64 s390x |
        xargs -P "$(nproc)" -n 1 bash -euo pipefail -c 'promised_bits_of "$@"' promised_bits_of
}

# promised_bits_of PRESET
promised_bits_of() {
    scripts/build "$1" promised_bits
    scripts/run-tests "$1" -R '^promised_bits$'
}

# Runs everything that is rarely run in its shortest form, so that it keeps working.
stage_starts() {
    together starts_other_builds starts_of_product
}

starts_other_builds() {
    local preset
    for preset in clang clang-32; do
        scripts/build "$preset" lanes_objects header_test
    done
    scripts/build coverage system_echo
    echo input | build/coverage/tests/system_echo argument
    build/coverage/tests/system_echo argument </dev/null >/dev/full || true
    count_lines tests/base/echo.cpp
}

starts_of_product() {
    tidy tests/builds/digest.cpp bench/Limits.cpp
    local library
    build_abi x86_64
    for library in "${!interfaces[@]}"; do
        write_abi x86_64 "$library" build/x86_64/renewed.xml.xz
        compare_abi x86_64 "$library" build/x86_64/renewed.xml.xz
    done
    scripts/mutate --only src/TNumberFormat.cpp --every 100 --anew
    scripts/packages x86_64
    scripts/validate --tables
    scripts/renew-results
    git diff --exit-code docs/validation.md docs/scale.md tests/data/ber tests/data/same_files.txt
}

# What several stages take.
stage_build() {
    scripts/build x86_64
}

stage_tests() {
    ./test
}

# together FUNCTION...: runs functions side by side, and shows what each printed when all have ended
together() {
    local logs function failed=0
    local -A running=()
    logs=$(mktemp -d)
    for function in "$@"; do
        "$function" >"$logs/$function" 2>&1 &
        running[$function]=$!
    done
    for function in "$@"; do
        wait "${running[$function]}" || failed=1
        cat "$logs/$function"
    done
    rm -rf "$logs"
    return $failed
}

scripts/setup --checks --tests
[ $# -gt 0 ] || set -- format lint lint-tests docs compilers abi memory threads hostile coverage tests
for step in "$@"; do
    IFS=+ read -ra stages <<<"$step"
    for stage in "${stages[@]}"; do
        if ! declare -F "stage_$stage" >/dev/null; then
            known=$(declare -F | sed -n 's/^declare -f stage_//p')
            echo "ci.sh: no stage '$stage'; stages are "$known >&2
            exit 2
        fi
    done
    echo "== $step"
    begun=$SECONDS
    if [ ${#stages[@]} -eq 1 ]; then
        "stage_$step"
    else
        together "${stages[@]/#/stage_}"
    fi
    echo "== $step: $((SECONDS - begun)) s"
done
