# SPDX-License-Identifier: Apache-2.0
#: format [--check] | format the C++ sources, or list those that are not
# shellcheck shell=bash

usage_format() {
    cat <<'TEXT'
usage: ./dev format [--check]

Formats all C++ sources as .clang-format says; with --check changes nothing, but shows what would be, and fails
if there is any.
TEXT
}

command_format() {
    local -a options=(-i)
    case $* in
    '') ;;
    --check) options=(--dry-run --Werror) ;;
    *) die_usage "format takes no argument but --check" ;;
    esac
    check_host
    need_packages "${PACKAGES_LINT[@]}"
    cd -- "$ROOT" || exit
    cpp_sources | xargs -d '\n' clang-format "${options[@]}" -- || die "not all sources are formatted: ./dev format"
}
