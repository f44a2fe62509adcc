#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# The cache holds whole things only, whatever happens while they are made.
# shellcheck disable=SC2317,SC2016,SC2153 # functions are called by name, text is expanded by others
. "$(dirname -- "$0")/lib.sh"
. "$ROOT/platform/lib.sh"

# A maker of a folder that holds one file, slowly when told so.
make_thing() {
    local seconds=$1 scratch=$2
    echo made >>"$SCRATCH/calls"
    mkdir "$scratch/result"
    echo half >"$scratch/result/thing"
    sleep "$seconds"
    echo whole >"$scratch/result/thing"
}

use_cache() {
    ZELK_CACHE=$SCRATCH/cache
    make_cache_folder
    thing=$ZELK_CACHE/things/one
}

test_makes_once() {
    use_cache
    expect_status 0 make_cached thing "$thing" 1 "making" make_thing 0
    expect_equal "==> making" "$ERRORS"
    expect_status 0 make_cached thing "$thing" 1 "making" make_thing 0
    expect_equal "" "$ERRORS"
    expect_equal "whole" "$(cat "$thing/thing")"
    expect_equal "made" "$(cat calls)"
}

test_failure_leaves_nothing() {
    use_cache
    fail_half_way() {
        mkdir "$1/result"
        run_logged "the thing cannot be made" ls /no/such/folder
    }
    expect_status 1 make_cached thing "$thing" 1 "making" fail_half_way
    expect_contains "dev: the thing cannot be made: ls: cannot access '/no/such/folder'" "$ERRORS"
    expect_contains "(log: $ZELK_CACHE/logs/thing-ls.log)" "$ERRORS"
    expect_equal "" "$(ls "$ZELK_CACHE/things")"
}

test_killed_run_leaves_nothing_that_counts() {
    use_cache
    set -m
    make_cached thing "$thing" 1 "making" make_thing 100 2>/dev/null &
    set +m
    wait_until test -e "$thing.partial/result/thing"
    kill -KILL -- "-$!"
    [[ ! -e $thing ]] || fail "a half-made thing is in the cache"
    expect_status 0 make_cached thing "$thing" 1 "making" make_thing 0
    expect_equal "whole" "$(cat "$thing/thing")"
    expect_equal "one" "$(ls "$ZELK_CACHE/things")"
}

test_two_runs_at_once_make_it_once() {
    use_cache
    make_cached thing "$thing" 1 "making" make_thing 1 2>first &
    make_cached thing "$thing" 1 "making" make_thing 1 2>second &
    wait
    expect_equal "made" "$(cat calls)"
    expect_equal "whole" "$(cat "$thing/thing")"
    expect_contains "waiting for another run" "$(cat first second)"
}

test_full_disk_is_told_before_anything_is_made() {
    use_cache
    expect_status 1 make_cached thing "$thing" 999999999999 "making" make_thing 0
    expect_one_error "not enough disk space: 999999999999 MB are needed in $ZELK_CACHE"
    [[ ! -e calls ]] || fail "it was made"
}

test_cache_that_cannot_be_written() {
    echo "a file" >"$SCRATCH/file"
    ZELK_CACHE=$SCRATCH/file/cache
    in_subshell() { (make_cache_folder); }
    expect_status 1 in_subshell
    expect_one_error "the cache folder $ZELK_CACHE cannot be written: set ZELK_CACHE"
}

test_cleaning_leaves_what_others_put_there() {
    use_cache
    mkdir -p "$ZELK_CACHE/sources/x" "$ZELK_CACHE/apt"
    echo mine >"$ZELK_CACHE/letter"
    remove_cache
    expect_equal "letter" "$(ls "$ZELK_CACHE")"
    rm "$ZELK_CACHE/letter"
    remove_cache
    [[ ! -e $ZELK_CACHE ]] || fail "an empty cache folder is left"
}

# clean_all <what its folder holds: files, and folders with / at the end …>: of a tree that nothing is lost in.
clean_all() {
    local entry
    rm -rf tree cache
    mkdir -p tree/build cache
    cp -R "$ROOT/dev" "$ROOT/platform" tree
    for entry in "$@"; do
        entry=cache/$entry
        mkdir -p -- "${entry%/*}"
        [[ $entry == */ ]] || echo content >"$entry"
    done
    ZELK_CACHE=$SCRATCH/cache tree/dev clean --all
}

test_what_is_no_cache_is_not_removed() {
    local content
    while read -r -a content; do
        expect_status 1 clean_all "${content[@]}"
        expect_one_error "dev: $SCRATCH/cache holds what ./dev did not make"
        [[ -e cache/${content[0]} && -e tree/build ]] || fail "something was removed of: ${content[*]}"
    done <<'ROWS'
sources/main.c
logs/program.log
apt/sources/list
logs/cmake.log
platform/notes kernel/bookworm-0123456789abcdef/vmlinuz
sources/main.c sources/android-platform-tools-29.0.6-28/
letter platform/0123456789abcdef/ locks/platform
ROWS
}

# Whether it has the mark, or is from the time before that.
test_a_cache_is_removed() {
    local content
    while read -r -a content; do
        expect_status 0 clean_all "${content[@]}"
        [[ ! -e cache && ! -e tree/build ]] || fail "something is left of: ${content[*]}"
    done <<'ROWS'
.zelk-cache sources/x logs/program.log
platform/0123456789abcdef/lib/ sources/android-platform-tools-29.0.6-28/ logs/platform-cmake.log locks/platform
kernel/bookworm-0123456789abcdef-uncompressed/ initramfs/0123456789abcdef.partial/ apt/lists/ apt/updated lock

ROWS
}

test_making_marks_what_is_a_cache_from_then_on() {
    use_cache
    [[ -e $ZELK_CACHE/.zelk-cache ]] || fail "a new cache has no mark"
    rm "$ZELK_CACHE/.zelk-cache"
    mkdir "$ZELK_CACHE/things"
    make_cache_folder
    [[ ! -e $ZELK_CACHE/.zelk-cache ]] || fail "another's folder has the mark"
}

run_tests
