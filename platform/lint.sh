# SPDX-License-Identifier: Apache-2.0
# What ./dev format looks at. Sourced by ./dev; the current folder is the tree.
# shellcheck shell=bash

# The tree's own C++ sources, one per line, whether git knows them already or not.
cpp_sources() {
    git ls-files --cached --others --exclude-standard --deduplicate -- '*.cpp' '*.h' |
        while read -r file; do
            [[ ! -f $file ]] || printf '%s\n' "$file"
        done
}
