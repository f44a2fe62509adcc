#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# package-symbols notices a symbol that the table has not, one that the library has not, and a line that is none; it
# adds none to a version that is released.
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

# A tree with tags of its own.
version=$(sed -n 's/^#define ZELK_VERSION "\(.*\)"$/\1/p' "$here/../../include/pemaro/Version.h")
tree=$work/tree
git=(git -C "$tree" -c user.name=nobody -c user.email=nobody@localhost -c commit.gpgSign=false -c tag.gpgSign=false)
mkdir -p "$tree"/{tests/abi,include/pemaro}
cp -t "$tree/tests/abi" -- "$here/package-symbols"
cp -t "$tree/include/pemaro" -- "$here/../../include/pemaro/Version.h"
"${git[@]}" init -q
"${git[@]}" commit -q --allow-empty -m "A release"
"${git[@]}" tag "v$version.1"

# update: the table of a library that had one symbol less, and another one since an earlier version.
update() {
    sed -e '/ DURAPemaroCreateInstance@/d' -e 's/\(VEXPemaroCreateInstance@Base\) .*/\1 0.9.0/' "$table" >"$work/table"
    "$tree/tests/abi/package-symbols" --update "$library" "$work/table" 2>"$work/log"
}

# told SYMBOL VERSION: what the table has to tell now.
told() {
    grep -q -x " $1@Base $2" "$work/table" || {
        echo "$1 is not told to be of $2: $(<"$work/log")" >&2
        failures=$((failures + 1))
    }
}

# What is new is told with the version of today, what was there keeps its own.
update
"$here/package-symbols" "$library" "$work/table"
told DURAPemaroCreateInstance "$version"
told VEXPemaroCreateInstance 0.9.0

# A released version keeps the symbols that it has; the next one takes more.
"${git[@]}" tag "v$version"
if update || ! grep -q -F "$version is released" "$work/log" || grep -q DURAPemaroCreateInstance "$work/table"; then
    echo "a released version is given more symbols: $(<"$work/log")" >&2
    failures=$((failures + 1))
fi
sed -i 's/\(ZELK_VERSION "\)/\19/' "$tree/include/pemaro/Version.h"
update
told DURAPemaroCreateInstance "9$version"
((failures == 0))
