# SPDX-License-Identifier: Apache-2.0
#: coverage | show which lines and branches of the library its tests reach
# shellcheck shell=bash

usage_coverage() {
    cat <<'TEXT'
usage: ./dev coverage

Builds the library with counters and runs its native tests. Prints how many lines and branches of the library
they reach, and each line where something remains; build/coverage/report/index.html shows all of it. What
remains is explained in tests/coverage/explained; a remainder that is not is an error.

Branches that only an exception could take are left out: the library is built without them.
TEXT
}

command_coverage() {
    (($# == 0)) || die_usage "coverage takes no argument"
    local folder=$ROOT/build/coverage
    need_packages "${PACKAGES_ALL[@]}"
    build_configured coverage "$folder" ON library_tests
    find "$folder" -name '*.gcda' -delete
    say "running the library's tests"
    ctest --test-dir "$folder" --label-regex '^library$' --output-on-failure --parallel "$(nproc)"
    say "collecting what they reached"
    mkdir -p -- "$folder/report"
    local -a options=(--root "$ROOT" --exclude-throw-branches --exclude-unreachable-branches)
    local room
    for room in include/pemaro/[^/]*.h values/ binder/ companion/ managers/; do
        options+=(--filter "$ROOT/$room")
    done
    # It leaves files of its own in the folder where it runs.
    cd -- "$folder/report" || die "there is no $folder/report"
    gcovr "${options[@]}" --html-details "$folder/report/index.html" --html-title "zelkclient" \
        --json "$folder/report/coverage.json" --print-summary "$folder/CMakeFiles/zelkclient_objects.dir"
    "$ROOT/tests/coverage/remaining" "$ROOT" "$folder/report/coverage.json"
}
