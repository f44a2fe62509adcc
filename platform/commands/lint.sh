# SPDX-License-Identifier: Apache-2.0
#: lint | look for mistakes: format, shellcheck, cppcheck, clang-tidy
# shellcheck shell=bash

usage_lint() {
    cat <<'TEXT'
usage: ./dev lint

Looks at the sources without running them, and fails for every finding:
  - format: C++ sources that ./dev format would change;
  - shellcheck: all shell scripts;
  - cppcheck: the library, frames/, simulator/, tools/ and testkit/;
  - clang-tidy: the library, frames/, simulator/ and testkit/, as .clang-tidy says. And tools/, several sources at
    a time, without the paths that the analyzer follows. It is not repeated for sources that it found clean.
What is overlooked is named with its reason: in cmake/cppcheck-suppressions, in .clang-tidy, or as NOLINT.
TEXT
}

LINT_STEPS=(format shellcheck cppcheck clang_tidy)
# Each source by itself; and rooms that are looked at as build/asan compiles them, in batches, which takes a fifth of
# the time. Of a batch the analyzer would follow the paths of no function, for it leaves out what is included.
LINT_TIDY=(values binder companion managers frames simulator testkit)
LINT_TIDY_BATCHES=(tools)

command_lint() {
    (($# == 0)) || die_usage "lint takes no argument"
    begin all lint -- "${LINT_STEPS[@]}"
    run_lint
}

# All of them, so that one run tells everything.
run_lint() {
    local step failed=''
    cd -- "$ROOT" || exit
    mkdir -p build/lint
    lock_file build/.lint.lock build/lint
    for step in "${LINT_STEPS[@]}"; do
        say_step "$step" "${step/_/-}"
        "lint_$step" || failed+=" ${step/_/-}"
    done
    [[ -z $failed ]] || die "lint: findings (above) of$failed"
}

lint_format() {
    cpp_sources | xargs -d '\n' -n 50 -P "$(nproc)" clang-format --dry-run --Werror --
}

# Templates, *.in, are no scripts yet.
shell_sources() {
    git ls-files --cached --others --exclude-standard --deduplicate |
        while read -r file; do
            if [[ -f $file && $file != *.in ]] && head -n 3 -- "$file" | grep -E '^#!/bin/(ba)?sh|^# shellcheck shell=' >/dev/null; then
                printf '%s\n' "$file"
            fi
        done
}

lint_shellcheck() {
    shell_sources | xargs -d '\n' -n 8 -P "$(nproc)" shellcheck --
}

# The macros that it would have to find in the platform's headers and in ours.
lint_cppcheck() {
    mkdir -p build/lint/cppcheck
    cppcheck --quiet -j "$(nproc)" --cppcheck-build-dir=build/lint/cppcheck --error-exitcode=1 \
        --std=c++17 --enable=warning,performance,portability \
        --suppressions-list=cmake/cppcheck-suppressions -I include -I . \
        -D'DECLARE_META_INTERFACE(name)=' -D'IMPLEMENT_META_INTERFACE(name, text)=' \
        -D'IMPLEMENT_STUB(name, rows)=' -D'IMPLEMENT_SUBSCRIPTION(name, client)=' \
        -D'IMPLEMENT_MANAGER_CALLBACK(name, text, operation, record, texts)=' -DZELK_API= -DZELK_LOCAL= \
        "${LINT_TIDY[@]}" "${LINT_TIDY_BATCHES[@]}"
}

lint_clang_tidy() {
    local clean preset
    for preset in debug asan; do
        build_configured "$preset" "$ROOT/build/$preset" ON build.ninja >/dev/null || return
    done
    clean=$ROOT/build/lint/$(
        {
            cat .clang-tidy build/{debug,asan}/compile_commands.json
            git ls-files --cached --others --exclude-standard -- include "${LINT_TIDY[@]}" "${LINT_TIDY_BATCHES[@]}" |
                xargs -d '\n' cat --
        } | sha256sum | cut -c 1-16
    )
    if [[ ! -e $clean ]]; then
        find "${LINT_TIDY[@]}" -name '*.cpp' | tidy debug || return
        tidy_batches | tidy asan --checks=-bugprone-suspicious-include \
            --header-filter="/($(IFS='|' && printf '%s' "${LINT_TIDY_BATCHES[*]}"))/.*\.(h|cpp)$" || return
        mkdir -p -- "${clean%/*}"
        : >"$clean"
    fi
}

# The batches of those rooms, and sources that are no batch.
tidy_batches() {
    local room
    for room in "${LINT_TIDY_BATCHES[@]}"; do
        grep -oP "\"file\": \"\K$ROOT/(build/asan/$room/[^\"]+/Unity/[^\"]+\.cxx|$room/[^\"]+\.cpp)" \
            build/asan/compile_commands.json
    done
}

# tidy <preset> <option …>: the sources that are named on standard input, as that preset compiles them.
tidy() {
    local preset=$1
    shift
    xargs -d '\n' -n 1 -P "$(nproc)" \
        clang-tidy -p "build/$preset" --quiet --warnings-as-errors='*' "$@" 2>/dev/null
}
