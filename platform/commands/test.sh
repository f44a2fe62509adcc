# SPDX-License-Identifier: Apache-2.0
#: test [options] | build and run all tests, with sanitizers and over the real Binder driver
# shellcheck shell=bash

# In the order in which they run: the option's name, what it needs besides (one word; see begin), and
# what it runs. stage_<name> does it, and is given the regular expression that the tests' names have to match,
# or "".
TEST_STAGES=(
    'native||in one process, without the driver (release build)'
    'driver|vm|over the real Binder driver (release build; see ./dev vm)'
    'dev|vm|of ./dev itself'
    'asan||the native tests with AddressSanitizer and UndefinedBehaviorSanitizer'
    'tsan|thread|the native tests with ThreadSanitizer'
    'lint|lint|what ./dev lint looks at'
)

# The slowest that the tests over the driver may be, in seconds, on a busy machine.
DRIVER_TESTS_TIMEOUT=1800

# What these start again and again.
DRIVER_TESTS_PROGRAMS=("$ROOT"/build/platform/bin/servicemanager
    "$ROOT"/build/release/bin/{zelkctl,zelk-touchstack,broken-service,faulty-services,garbage-service} /bin/bash)

usage_test() {
    local stage names=("${TEST_STAGES[@]%%|*}")
    printf 'usage: ./dev test%s [-R REGEX]\n\n' "$(printf ' [--%s]' "${names[@]}")"
    echo "Builds and runs the tests; without a selection all of them:"
    for stage in "${TEST_STAGES[@]}"; do
        printf '  --%-9s %s\n' "${stage%%|*}" "${stage##*|}"
    done
    echo "  -R REGEX    only tests whose name matches"
}

command_test() {
    local stage regex=''
    local -a names=("${TEST_STAGES[@]%%|*}") stages=() summary=() needs=(all)
    while (($# > 0)); do
        case $1 in
        -R)
            (($# > 1)) || die_usage "test: -R needs a regular expression"
            regex=$2
            shift
            ;;
        *)
            [[ $1 == --?* && " ${names[*]} " == *" ${1#--} "* ]] ||
                die_usage "test: unknown option '$1'; ./dev test --help lists them"
            stages+=("${1#--}")
            ;;
        esac
        shift
    done
    ((${#stages[@]} > 0)) || stages=("${names[@]}")
    trap 'exit 130' INT
    for stage in "${stages[@]}"; do
        needs+=("$(stage_needs "$stage")")
    done
    begin "${needs[@]}" -- "${stages[@]}"
    build_first "${stages[0]}"
    start_ahead "${stages[@]}"
    for stage in "${stages[@]}"; do
        [[ $(stage_needs "$stage") != vm ]] || await_background || true
        run_stage "$stage" "$regex"
    done
    report_stages
}

# Ends the script where even the first stage's build fails: it is told once, and not by each stage again.
build_first() {
    case $1 in
    native | driver | dev) build_preset release ;;
    asan | tsan) build_preset "$1" ;;
    esac
}

# Tests wait for each other and for time to pass. What that leaves of the processors goes into the later stages'
# builds; such a stage then waits for the rest of its own.
start_ahead() {
    if [[ " $* " == *" native "* ]] && (($# > 1)); then
        mkdir -p -- "$ROOT/build"
        setpriv --pdeathsig TERM setsid "$ROOT/platform/ahead" "$@" </dev/null >"$ROOT/build/ahead.log" 2>&1 &
        disown
    fi
}

stage_needs() {
    local stage
    for stage in "${TEST_STAGES[@]}"; do
        if [[ $stage == "$1|"* ]]; then
            cut -d '|' -f 2 <<<"$stage"
        fi
    done
}

# Adds a line to summary. A stage that fails does not keep the others from running.
run_stage() {
    local stage=$1 regex=$2 start=$SECONDS status result=passed
    say_step "$stage" "tests: $stage"
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
    need_packages "${PACKAGES_PACKAGING[@]}" "${PACKAGES_ANDROID[@]}" "${PACKAGES_BROWSER[@]}" \
        "${PACKAGES_DOCS[@]}"
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
    local program
    local -a options=(--timeout "$DRIVER_TESTS_TIMEOUT")
    build_preset release
    ctest_arguments release driver "$1"
    CTEST_ARGUMENTS+=(--parallel "$VM_PROCESSORS")
    for program in "${DRIVER_TESTS_PROGRAMS[@]}"; do
        options+=(--in-memory "$program")
    done
    in_locale "$ROOT/dev" vm "${options[@]}" ctest "${CTEST_ARGUMENTS[@]}"
}

stage_lint() {
    "$ROOT/dev" lint
}

run_ctest() {
    build_preset "$1"
    ctest_arguments "$@"
    in_locale ctest "${CTEST_ARGUMENTS[@]}" --parallel "$(nproc)"
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
