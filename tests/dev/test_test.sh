#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# What ./dev test does with its stages.
# shellcheck disable=SC2317,SC2016,SC2153 # functions are called by name, text is expanded by others
. "$(dirname -- "$0")/lib.sh"

# A tree of which nothing can be built, as it has nothing for CMake.
tree_without_sources() {
    mkdir tree
    (cd -- "$ROOT" && cp -r --parents -- dev platform CMakePresets.json "$SCRATCH/tree")
}

test_a_build_that_fails_is_told_once() {
    tree_without_sources
    expect_status 1 tree/dev test --native --dev --asan
    expect_equal "dev: build/release was not built (the messages are above)" "$(grep '^dev:' <<<"$ERRORS")"
    expect_equal 0 "$(grep -c 'tests: ' <<<"$ERRORS")"
}

# The first stage needs no build; those behind it are tried all the same.
test_each_stage_is_tried_and_summed_up() {
    tree_without_sources
    expect_status 1 tree/dev test --lint --native
    expect_equal $'lint    FAILED\nnative  FAILED' "$(sed -n -E 's/^(.* FAILED) in [0-9]+ s$/\1/p' <<<"$OUTPUT")"
}

run_tests
