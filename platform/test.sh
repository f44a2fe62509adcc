# SPDX-License-Identifier: Apache-2.0
# ./dev test: the stages, each a preset's tests with one label. Sourced by ./dev.
# shellcheck shell=bash

TEST_STAGES=(native asan tsan driver dev)

# The slowest that the tests over the driver may be, in seconds, on a busy machine.
DRIVER_TESTS_TIMEOUT=1800

command_test() {
    local stage regex=''
    local -a stages=() summary=()
    while (($# > 0)); do
        case $1 in
        --native | --asan | --tsan | --driver | --dev) stages+=("${1#--}") ;;
        -R)
            (($# > 1)) || die_usage "test: -R needs a regular expression"
            regex=$2
            shift
            ;;
        *) die_usage "test: unknown option '$1'; ./dev test --help lists them" ;;
        esac
        shift
    done
    ((${#stages[@]} > 0)) || stages=("${TEST_STAGES[@]}")
    trap 'exit 130' INT
    for stage in "${stages[@]}"; do
        run_stage "$stage" "$regex"
    done
    report_stages
}

# Adds a line to summary. A stage that fails does not keep the others from running.
run_stage() {
    local stage=$1 regex=$2 start=$SECONDS status result=passed
    say "tests: $stage"
    set +e
    (
        set -e
        "stage_$stage" "$regex"
    )
    status=$?
    set -e
    ((status == 0)) || result=FAILED
    summary+=("$(printf '%-7s %s in %d s' "$stage" "$result" $((SECONDS - start)))")
}

report_stages() {
    printf '\n'
    printf '%s\n' "${summary[@]}"
    [[ ${summary[*]} != *FAILED* ]]
}

stage_native() {
    run_ctest release native "$1"
}

stage_asan() {
    run_ctest asan native "$1"
}

stage_tsan() {
    run_ctest tsan native "$1"
}

stage_dev() {
    run_ctest release dev "$1"
}

stage_driver() {
    build_preset release
    ctest_arguments release driver "$1"
    "$ROOT/dev" vm --timeout "$DRIVER_TESTS_TIMEOUT" ctest "${CTEST_ARGUMENTS[@]}"
}

run_ctest() {
    build_preset "$1"
    ctest_arguments "$@"
    ctest "${CTEST_ARGUMENTS[@]}" --parallel "$(nproc)"
}

# ctest_arguments <preset> <label> <regular expression or "">
ctest_arguments() {
    CTEST_ARGUMENTS=(--test-dir "$ROOT/build/$1" --label-regex "^$2\$" --output-on-failure)
    if [[ -n $3 ]]; then
        CTEST_ARGUMENTS+=(--tests-regex "$3" --no-tests=ignore)
    else
        CTEST_ARGUMENTS+=(--no-tests=error)
    fi
}
