# SPDX-License-Identifier: Apache-2.0
#: bench [options] | measure speed, beside the libraries and the floors that it is compared with
# shellcheck shell=bash

usage_bench() {
    cat <<'TEXT'
usage: ./dev bench [--quick] [--docs] [values|growth|calls|ring|start|driver …]

Runs the benchmarks of the release build, all of them unless some are named, prints their tables and keeps
their figures as JSON in build/bench-results:
  values      reading, writing, copying, look-ups, beside RapidJSON, nlohmann and the floor
  growth      reading texts of n, 2n, 4n … entries, hostile ones among them
  calls       calls through proxy and stub, beside bare transactions
  ring        the path of a frame, beside a bare pair of indices and a copy
  start       from dlopen to a facade; size and relocations of the stripped library
  driver      age and loss of frames over the real Binder driver (see ./dev vm)

  --quick     each for a moment only
  --docs      write tables and plots into docs/performance.md as well

Figures compare within one run only: what belongs together runs interleaved, and medians are shown.
TEXT
}

# measure_library <library> <json>
measure_library() {
    local stripped sizes relocations
    stripped=$(mktemp)
    strip -o "$stripped" -- "$1"
    sizes=$(stat -c %s -- "$stripped")
    relocations=$(readelf -rW "$stripped" | grep -c ' R_X86_64_') || true
    printf '{"bytes, stripped": %d, "relocations": %d, "of them relative": %d, "symbols to look up": %d}\n' \
        "$sizes" "$relocations" "$(readelf -rW "$stripped" | grep -c ' R_X86_64_RELATIVE')" \
        "$(readelf -rW "$stripped" | grep -Ec ' R_X86_64_(GLOB_DAT|JUMP_SLO|64)')" >"$2"
    rm -f -- "$stripped"
}

command_bench() {
    local name seconds=4 docs='' results=$ROOT/build/bench-results bin=$ROOT/build/release/bin
    local -a names=() programs=() repeat=(--benchmark_repetitions=15 --benchmark_min_time=0.05)
    while (($# > 0)); do
        case $1 in
        --quick) seconds=0.2 repeat=(--benchmark_repetitions=3 --benchmark_min_time=0.001) ;;
        --docs) docs=--docs ;;
        values | growth | calls | ring | start | driver) names+=("$1") ;;
        *) die_usage "bench: unknown argument '$1'" ;;
        esac
        shift
    done
    ((${#names[@]} > 0)) || names=(values growth calls ring start driver)
    programs=("${names[@]/%/_bench}")
    if [[ " ${names[*]} " == *' driver '* ]]; then
        begin all bench vm -- build_release bench
    else
        begin all bench -- build_release bench
    fi
    # With the tests, whose setting some of them run in.
    build_configured release "$ROOT/build/release" ON "${programs[@]}"
    mkdir -p -- "$results"
    for name in "${names[@]}"; do
        say_step bench "measuring $name"
        case $name in
        driver)
            setup_vm
            vm_run 900 env ZELK_BENCH_SECONDS="$seconds" \
                ZELK_BENCH_JSON="$results/driver.json" "$bin/driver_bench" | grep -v '^\['
            ;;
        *)
            # A long line a second is no progress to look at: the names that are done are.
            "$bin/${name}_bench" "${repeat[@]}" --benchmark_enable_random_interleaving=true \
                --benchmark_report_aggregates_only=true --benchmark_out="$results/$name.json" |
                grep -E '_median|_mean.*start' || die "${name}_bench failed"
            ;;
        esac
        if [[ $name == start ]]; then
            measure_library "$ROOT/build/release/lib/libzelkclient.so" "$results/library.json"
        fi
    done
    "$ROOT/bench/report" "$results"
    if [[ $docs ]]; then
        "$ROOT/bench/report" "$results" --docs
        say "docs/performance.md holds these figures now"
    fi
}
