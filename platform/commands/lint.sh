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
  - clang-tidy: the same, as .clang-tidy says; a folder's sources at once, and of what is not the library the
    analyzer follows fewer paths. It is not repeated for sources that it found clean.
What is overlooked is named with its reason: in cmake/cppcheck-suppressions, in .clang-tidy, or as NOLINT.
TEXT
}

LINT_STEPS=(format shellcheck cppcheck clang_tidy)
LINT_LIBRARY=(values binder companion managers)
LINT_ROOMS=(frames simulator testkit tools)
# Three sources of one shape, with the same names for other interfaces: they cannot be looked at as one.
LINT_ALONE=managers
# How many states of a function the analyzer comes to; its own bound is 225,000. With fewer, tools/ takes a third.
LINT_STATES=10000

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
        "${LINT_LIBRARY[@]}" "${LINT_ROOMS[@]}"
}

lint_clang_tidy() {
    local clean
    build_configured debug "$ROOT/build/debug" ON build.ninja >/dev/null || return
    clean=$ROOT/build/lint/$(
        {
            cat .clang-tidy platform/commands/lint.sh platform/tidy-batches build/debug/compile_commands.json
            git ls-files --cached --others --exclude-standard -- include "${LINT_LIBRARY[@]}" "${LINT_ROOMS[@]}" |
                xargs -d '\n' cat --
        } | sha256sum | cut -c 1-16
    )
    if [[ ! -e $clean ]]; then
        tidy library "${LINT_LIBRARY[@]}" || return
        tidy rooms "${LINT_ROOMS[@]}" -- -analyzer-config max-nodes="$LINT_STATES" || return
        mkdir -p -- "${clean%/*}"
        : >"$clean"
    fi
}

# tidy <name> <room …> [-- <option of the analyzer …>]
tidy() {
    local name=$1 option
    local -a rooms=() options=()
    shift
    while (($# > 0)) && [[ $1 != -- ]]; do
        rooms+=("$1")
        shift
    done
    for option in "${@:2}"; do
        options+=(--extra-arg=-Xclang --extra-arg="$option")
    done
    find "${rooms[@]}" -name '*.cpp' -print0 | sort -z |
        xargs -0 platform/tidy-batches build/debug/compile_commands.json "build/lint/$name" "$LINT_ALONE" |
        xargs -d '\n' -n 1 -P "$(nproc)" \
            clang-tidy -p "build/lint/$name" --quiet --warnings-as-errors='*' "${options[@]}" 2>/dev/null |
        tidy_places
}

# Where in a source a finding is that was made in a batch; these name before each source's text which it is.
tidy_places() {
    awk -F : -v lint="$ROOT/build/lint/" '
        index($1, lint) == 1 && $2 ~ /^[0-9]+$/ {
            start = 0
            for (number = 1; (getline text < $1) > 0; ++number) {
                if (number < $2 && sub(/^#line 1 "/, "", text)) {
                    start = number
                    source = substr(text, 1, length(text) - 1)
                }
            }
            close($1)
            $0 = source ":" $2 - start substr($0, length($1) + length($2) + 2)
        }
        { print }'
}
