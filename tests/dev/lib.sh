# SPDX-License-Identifier: Apache-2.0
# A test script sources this, defines functions test_…, and ends with run_tests. Each test runs in a
# subshell of its own that stops at the first command to fail, in an empty folder $SCRATCH.
# shellcheck shell=bash disable=SC2034

ROOT=$(dirname -- "$(realpath -- "${BASH_SOURCE[0]}")")/../..
ROOT=$(realpath -- "$ROOT")

fail() {
    printf '    %s\n' "$*" >&2
    exit 1
}

expect_equal() {
    [[ $1 == "$2" ]] || fail "expected '$1', got '$2'"
}

expect_contains() {
    [[ $2 == *"$1"* ]] || fail "expected '$1' in '$2'"
}

# expect_status <status> <command …>: leaves the command's output in OUTPUT and its errors in ERRORS.
expect_status() {
    local expected=$1 status=0
    shift
    "$@" >"$SCRATCH/.output" 2>"$SCRATCH/.errors" || status=$?
    OUTPUT=$(tr -d '\0' <"$SCRATCH/.output")
    ERRORS=$(<"$SCRATCH/.errors")
    ((status == expected)) || fail "expected status $expected, got $status from '$*': $OUTPUT $ERRORS"
}

# The errors of the last command are one line, which holds this text.
expect_one_error() {
    expect_contains "$1" "$ERRORS"
    expect_equal 1 "$(wc -l <"$SCRATCH/.errors")"
}

# For as long as a very busy machine may take.
wait_until() {
    local attempt
    for ((attempt = 0; attempt < 3000; attempt++)); do
        if "$@"; then
            return
        fi
        sleep 0.1
    done
    fail "waited in vain for: $*"
}

run_tests() {
    local name status start failures=0
    for name in $(declare -F | sed -n 's/^declare -f \(test_\)/\1/p'); do
        SCRATCH=$(mktemp -d)
        start=$SECONDS
        set +e
        (
            set -euo pipefail
            cd "$SCRATCH" && "$name"
        )
        status=$?
        rm -rf "$SCRATCH"
        if ((status == 0)); then
            printf 'ok      %s (%d s)\n' "$name" $((SECONDS - start))
        else
            printf 'FAILED  %s\n' "$name"
            failures=$((failures + 1))
        fi
    done
    exit $((failures > 0))
}
