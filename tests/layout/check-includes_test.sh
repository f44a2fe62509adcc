#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# What check-includes makes of a small tree.
# shellcheck disable=SC2317 # functions are called by name
. "$(dirname -- "$0")/../dev/lib.sh"

check=$ROOT/tests/layout/check-includes

# make_tree: tools/ above values/ above include/made/, every include in order.
make_tree() {
    mkdir -p docs include/made values tools/deep build/old
    cat >docs/architecture.md <<'TABLE'
# A made-up tree

| folder | knows nothing |
|---|---|
| `nowhere/` | this table is another one |

## Folders, from the bottom up

| folder | holds | knows |
|---|---|---|
| `include/made/` | headers | |
| `values/` | values, `Value.h` among them | `include/made/` |
| `tools/`, `bench/` | programs that talk to `values/` | `include/made/`, `values/`, the platform |

## Another section
TABLE
    printf '#include <vector>\n' >include/made/Base.h
    printf '#include "made/Base.h"\n#include <binder/IBinder.h>\n' >values/Value.h
    printf '#include "values/Value.h"\n' >values/Value.cpp
    printf '#include "values/Value.h"\n  #  include <made/Base.h>\n#include "Tool.h"\n' >tools/deep/Tool.cpp
    printf '#include "../deep/Tool.h"\n' >tools/deep/Tool.h
    printf '#include "tools/deep/Tool.h"\n' >build/old/Value.h
}

# expect_refused <message> <file> <include line>: with this line added, it tells this alone.
expect_refused() {
    make_tree
    printf '%s\n' "$3" >>"$2"
    expect_status 1 "$check" . include values tools
    expect_one_error "$1"
}

test_a_tree_in_order_passes() {
    make_tree
    expect_status 0 "$check" . include values tools
    expect_equal '' "$OUTPUT$ERRORS"
}

test_an_include_from_a_folder_above_is_refused() {
    expect_refused 'values/Value.cpp:2: values/ does not know tools/, and includes tools/deep/Tool.h' \
        values/Value.cpp '#include "tools/deep/Tool.h"'
}

test_however_it_is_written() {
    expect_refused 'values/Value.h:3: values/ does not know tools/, and includes tools/deep/Tool.h' \
        values/Value.h '  #  include  <tools/deep/Tool.h>  // why not'
    expect_refused 'values/Value.cpp:2: values/ does not know tools/, and includes ../tools/deep/Tool.h' \
        values/Value.cpp '#include "../tools/deep/Tool.h"'
    expect_refused 'include/made/Base.h:2: include/made/ does not know values/, and includes values/Value.h' \
        include/made/Base.h '#include "values/Value.h"'
}

test_an_include_of_nothing_is_refused() {
    expect_refused 'tools/deep/Tool.h:2: the tree has no values/Gone.h' \
        tools/deep/Tool.h '#include "values/Gone.h"'
}

test_a_folder_without_a_row_is_refused() {
    make_tree
    mkdir frames
    printf '#include <vector>\n' >frames/Frame.h
    expect_status 1 "$check" . include values tools frames
    expect_one_error 'frames/Frame.h:1: the file lies in no folder of the table'
    printf '#include "frames/Frame.h"\n' >>tools/deep/Tool.h
    expect_status 1 "$check" . include values tools
    expect_one_error 'tools/deep/Tool.h:2: frames/Frame.h lies in no folder of the table'
}

test_a_folder_that_knows_one_above_it_is_refused() {
    make_tree
    # shellcheck disable=SC2016 # the table's own backticks
    sed -i 's#| `include/made/` |$#| `include/made/`, `tools/` |#' docs/architecture.md
    expect_status 1 "$check" . include values tools
    expect_one_error 'docs/architecture.md: values/ knows tools/, which has no row above it'
}

test_a_folder_without_sources_is_refused() {
    make_tree
    mkdir empty
    expect_status 1 "$check" . include values empty
    expect_one_error 'no source in empty/ includes anything'
}

test_wrong_usage_is_told() {
    expect_status 2 "$check" .
    expect_one_error 'usage: check-includes ROOT FOLDER…'
}

run_tests
