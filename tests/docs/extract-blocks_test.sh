#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# What extract-blocks takes for a block, and what it refuses.
set -euo pipefail

here=$(dirname -- "$(realpath -- "${BASH_SOURCE[0]}")")
folder=$(mktemp -d)
trap 'rm -rf -- "$folder"' EXIT
failures=0

# expect NAME EXPECTED ACTUAL
expect() {
    if [[ $2 != "$3" ]]; then
        printf '%s: expected\n%s\nand got\n%s\n' "$1" "$2" "$3" >&2
        failures=$((failures + 1))
    fi
}

# blocks [--programs] DOCUMENT: the names of what is taken out of it.
blocks() {
    rm -rf -- "$folder/out"
    "$here/extract-blocks" "$@" 2>&1 || true
    [[ ! -d $folder/out ]] || ls "$folder/out"
}

page=$folder/page.md
out=$folder/out

cat >"$page" <<'PAGE'
Text.

    ./dev build
    echo two

    echo three

- an item

      of a list, indented
    and its paragraph

```c++
// one.cpp
int main() {}
```

```text
    no command
```
PAGE
expect "kinds of blocks" $'page.md:14.c++\npage.md:19.text\npage.md:3.sh' "$(blocks "$out" "$page")"
expect "commands" $'./dev build\necho two\n\necho three' "$(cat "$out/page.md:3.sh")"
expect "program" $'one.cpp' "$(blocks --programs "$out" "$page")"
expect "its text" $'// one.cpp\nint main() {}' "$(cat "$out/one.cpp")"

# shellcheck disable=SC2016 # the backquotes are meant
printf '```\nx\n```\n' >"$page"
expect "no language" \
    "$page:1: a block between \`\`\` names its language: c++, cmake, sh, python, xml, bp or text" \
    "$(blocks "$out" "$page" | head -n 1)"

printf '```text\nx\n' >"$page"
expect "no end" "$page:2: the block that begins at line 1 has no end" "$(blocks "$out" "$page" | head -n 1)"

((failures == 0))
