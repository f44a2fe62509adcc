# SPDX-License-Identifier: Apache-2.0
#: fuzz [options] | attack each boundary, or one, with made-up inputs
# shellcheck shell=bash

usage_fuzz() {
    cat <<TEXT
usage: ./dev fuzz [target] [--seconds N] [--fast]

Builds the fuzzers with the sanitizers and runs each for N seconds (60 if not told), or one of them:
  $(fuzz_targets | xargs)

  --fast    without the sanitizers: some five times the inputs, of which fewer faults are seen

A fuzzer begins with fuzz/corpus/<target>/ and with what earlier runs found interesting, which is kept in
build/asan/fuzz/corpus/<target>/ (build/fuzz/ with --fast). An input that breaks something is kept in
build/asan/fuzz/, and the command that runs it again is printed; it belongs into fuzz/corpus/<target>/ together with
the mend.
TEXT
}

fuzz_targets() {
    basename -a -s _fuzzer.cpp -- "$ROOT"/fuzz/*_fuzzer.cpp
}

command_fuzz() {
    local seconds=60 preset=asan target
    local -a targets=() found=()
    while (($# > 0)); do
        case $1 in
        --seconds)
            (($# > 1)) || die_usage "fuzz: --seconds needs a number"
            seconds=$2
            shift
            ;;
        --seconds=*) seconds=${1#*=} ;;
        --fast) preset=fuzz ;;
        -*) die_usage "fuzz: unknown option '$1'" ;;
        *)
            [[ -e $ROOT/fuzz/${1}_fuzzer.cpp ]] ||
                die_usage "fuzz: unknown target '$1': there are $(fuzz_targets | xargs)"
            targets+=("$1")
            ;;
        esac
        shift
    done
    [[ $seconds =~ ^[1-9][0-9]{0,6}$ ]] || die_usage "fuzz: '$seconds' is not a number of seconds"
    ((${#targets[@]} > 0)) || mapfile -t targets < <(fuzz_targets)

    need_packages "${PACKAGES_ALL[@]}"
    build_configured "$preset" "$ROOT/build/$preset" ON "${targets[@]/%/_fuzzer}"
    for target in "${targets[@]}"; do
        say "fuzzing $target for $seconds s"
        fuzz_one "$preset" "$target" "$seconds" || found+=("$target")
    done
    ((${#found[@]} == 0)) || die "the fuzzers of these found something (see above): ${found[*]}"
}

fuzz_one() {
    local preset=$1 target=$2 seconds=$3
    local program=$ROOT/build/$preset/bin/${target}_fuzzer folder=$ROOT/build/$preset/fuzz
    mkdir -p -- "$folder/corpus/$target"
    "$program" -max_total_time="$seconds" -rss_limit_mb=8192 -print_final_stats=1 \
        -dict="$ROOT/fuzz/$target.dict" -artifact_prefix="$folder/$target-" \
        "$folder/corpus/$target" "$ROOT/fuzz/corpus/$target" || {
        say "to run it again: $program <the input's file>"
        return 1
    }
}
