# SPDX-License-Identifier: Apache-2.0
#: fuzz [options] | attack each boundary, or one, with made-up inputs
# shellcheck shell=bash

usage_fuzz() {
    cat <<TEXT
usage: ./dev fuzz [target] [--seconds N]

Builds the fuzzers with the sanitizers and runs each for N seconds (60 if not told), or one of them:
  $(fuzz_targets | xargs)

A fuzzer begins with fuzz/corpus/<target>/ and with what earlier runs found interesting, which is kept in
build/asan/fuzz/corpus/<target>/. An input that breaks something is kept in build/asan/fuzz/, and the command
that runs it again is printed; it belongs into fuzz/corpus/<target>/ together with the mend.
TEXT
}

fuzz_targets() {
    basename -a -s _fuzzer.cpp -- "$ROOT"/fuzz/*_fuzzer.cpp
}

command_fuzz() {
    local seconds=60 target
    local -a targets=() found=()
    while (($# > 0)); do
        case $1 in
        --seconds)
            (($# > 1)) || die_usage "fuzz: --seconds needs a number"
            seconds=$2
            shift
            ;;
        --seconds=*) seconds=${1#*=} ;;
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
    build_configured asan "$ROOT/build/asan" ON "${targets[@]/%/_fuzzer}"
    for target in "${targets[@]}"; do
        say "fuzzing $target for $seconds s"
        fuzz_one "$target" "$seconds" || found+=("$target")
    done
    ((${#found[@]} == 0)) || die "the fuzzers of these found something (see above): ${found[*]}"
}

fuzz_one() {
    local target=$1 seconds=$2
    local program=$ROOT/build/asan/bin/${target}_fuzzer folder=$ROOT/build/asan/fuzz
    mkdir -p -- "$folder/corpus/$target"
    "$program" -max_total_time="$seconds" -rss_limit_mb=8192 -print_final_stats=1 \
        -dict="$ROOT/fuzz/$target.dict" -artifact_prefix="$folder/$target-" \
        "$folder/corpus/$target" "$ROOT/fuzz/corpus/$target" || {
        say "to run it again: $program <the input's file>"
        return 1
    }
}
