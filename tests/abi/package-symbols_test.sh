#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# package-symbols notices a symbol that the table has not, one that the library has not, and a line that is none.
#
#   package-symbols_test.sh LIBRARY
set -euo pipefail

here=$(dirname -- "$(realpath -- "${BASH_SOURCE[0]}")")
table=$here/../../packaging/debian/libzelkclient.symbols
work=$(mktemp -d)
trap 'rm -rf -- "$work"' EXIT
failures=0

# notices WHAT SED-COMMAND: in a table changed like this.
notices() {
    sed "$2" "$table" >"$work/table"
    if "$here/package-symbols" "$library" "$work/table" 2>"$work/log" || ! grep -q -F -- "$1" "$work/log"; then
        echo "not noticed by '$1': $2: $(<"$work/log")" >&2
        failures=$((failures + 1))
    fi
}

library=$1
# shellcheck disable=SC2016 # sed's last line is meant
{
    notices 'not in the table: DURAPemaroCreateInstance' '/ DURAPemaroCreateInstance@/d'
    notices 'the library has it no more: DURAPemaroWithdrawn' '$a \ DURAPemaroWithdrawn@Base 1.0.0'
    notices 'no symbol with its version: ' '$a \ (regex)".*@Base$" 1.0.0'
    notices 'more than once: DURAPemaroCreateInstance' '/ DURAPemaroCreateInstance@/p'
}

# What is new is told with the version of today, what was there keeps its own.
sed -e '/ DURAPemaroCreateInstance@/d' -e 's/\(VEXPemaroCreateInstance@Base\) .*/\1 0.9.0/' "$table" >"$work/table"
"$here/package-symbols" --update "$library" "$work/table"
"$here/package-symbols" "$library" "$work/table"
version=$(sed -n 's/^#define ZELK_VERSION "\(.*\)"$/\1/p' "$here/../../include/pemaro/Version.h")
grep -q -x " DURAPemaroCreateInstance@Base $version" "$work/table" || failures=$((failures + 1))
grep -q -x ' VEXPemaroCreateInstance@Base 0.9.0' "$work/table" || failures=$((failures + 1))
((failures == 0))
