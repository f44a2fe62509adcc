# SPDX-License-Identifier: Apache-2.0
#: docs [folder] | make the reference of the library's headers, in build/docs
# shellcheck shell=bash

usage_docs() {
    cat <<'TEXT'
usage: ./dev docs [folder]

Makes the reference of what include/pemaro/ declares, by default in build/docs: html/index.html is its first
page. A name without documentation is an error.
TEXT
}

command_docs() {
    local folder=${1:-$ROOT/build/docs}
    (($# <= 1)) || die_usage "docs takes one folder"
    need_packages "${PACKAGES_DOCS[@]}"
    say "making the reference in $folder"
    "$ROOT/docs/doxygen/make-reference" "$folder" || die "there is no reference"
    printf '%s\n' "$folder/html/index.html"
}
