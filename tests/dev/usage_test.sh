#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# The command line of ./dev: help, and one clear line about whatever is wrong with it.
# shellcheck disable=SC2317,SC2016,SC2153 # functions are called by name, text is expanded by others
. "$(dirname -- "$0")/lib.sh"

dev=$ROOT/dev
mapfile -t commands < <(basename -s .sh -- "$ROOT"/platform/commands/*.sh)

test_alone_prints_every_command() {
    expect_status 0 "$dev"
    expect_equal "setup build test demo vm clean" \
        "$(sed -nE 's/^  ([a-z]+) .*/\1/p' <<<"$OUTPUT" | head -n 6 | xargs)"
    for command in "${commands[@]}"; do
        expect_equal 1 "$(grep -cE "^  $command .* [a-z]+" <<<"$OUTPUT")"
    done
}

test_every_command_has_help() {
    for command in "${commands[@]}"; do
        expect_status 0 "$dev" "$command" --help
        expect_contains "usage: ./dev $command" "$OUTPUT"
        expect_status 0 "$dev" "$command" -h
    done
}

test_wrong_usage_is_one_line_and_status_2() {
    while IFS='|' read -r arguments message; do
        # shellcheck disable=SC2086 # several arguments
        expect_status 2 "$dev" $arguments
        expect_one_error "$message"
    done <<'ROWS'
frobnicate|unknown command 'frobnicate'
setup now|setup takes no argument
build relaese|unknown preset 'relaese'
build release nope|unknown preset 'nope'
test --fast|unknown option '--fast'
test -R|-R needs a regular expression
demo 3|demo takes no argument
shell now|unknown option 'now'; a command comes after --
shell --stack|--stack needs zelk-touchstack's options
shell --stack="|a quote in '"' has no end
shell --|no command is given after --
vm|no command is given
vm --|no command is given
vm --timeout|--timeout needs a number
vm --timeout 0 true|'0' is not a number of seconds
vm --timeout=1h true|'1h' is not a number of seconds
vm --in-memory|--in-memory needs a program
vm --in-memory nothing true|'nothing' is not a program
vm --verbose true|unknown option '--verbose'
fuzz nothing|unknown target 'nothing'
fuzz --seconds|--seconds needs a number
fuzz --seconds 1h|'1h' is not a number of seconds
fuzz --quick|unknown option '--quick'
coverage values|coverage takes no argument
mutate --count|--count needs a number
mutate --count all|--count needs a number
mutate --at values|--at needs FILE:LINE
mutate values|unknown option 'values'
soak --minutes|--minutes needs a number
soak --minutes 0|--minutes needs a number
soak --for 3|unknown option '--for'
clean everything|clean takes no argument but --all
ROWS
}

test_unknown_machine_for_the_command_is_wrong_usage() {
    ZELK_VM=cloud expect_status 2 "$dev" vm true
    expect_one_error "ZELK_VM is 'cloud'"
}

test_works_from_another_folder_and_through_a_link() {
    ln -s "$dev" "$SCRATCH/link"
    expect_status 0 "$SCRATCH/link"
    expect_contains "usage: ./dev" "$OUTPUT"
}

# In Turkish, i is no letter from a to z, and I not its capital: the names of commands and lists have to be found.
test_works_in_every_locale() {
    localedef -i tr_TR -f UTF-8 "$SCRATCH/tr_TR.UTF-8" 2>/dev/null || {
        echo "    without Turkish, which is not installed"
        return
    }
    local -a turkish=(env "LOCPATH=$SCRATCH" LC_ALL=tr_TR.UTF-8)
    local capitals='word=lint && echo "${word^^}"'
    expect_status 0 "${turkish[@]}" bash -c "$capitals"
    expect_equal LİNT "$OUTPUT"
    expect_status 0 "${turkish[@]}" bash -c ". '$ROOT/platform/lib.sh' && $capitals"
    expect_equal LINT "$OUTPUT"
    expect_status 0 "${turkish[@]}" "$dev" lint --help
}

test_own_locale_is_not_that_of_a_command_that_is_run() {
    local setting expected show='echo "<${LC_ALL-none}>"'
    for setting in --unset=LC_ALL LC_ALL= LC_ALL=POSIX; do
        expect_status 0 env "$setting" bash -c "$show"
        expected=$OUTPUT
        expect_status 0 env "$setting" ZELK_VM=direct "$dev" vm bash -c "$show"
        expect_equal "$expected" "$OUTPUT"
        expect_status 0 env "$setting" bash -c ". '$ROOT/platform/lib.sh' && $show && in_locale bash -c '$show'"
        expect_equal "<C.UTF-8>"$'\n'"$expected" "$OUTPUT"
    done
}

run_tests
