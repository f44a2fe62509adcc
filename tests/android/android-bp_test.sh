#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# android-bp takes what a build wrote, and refuses a module whose files or libraries it would not have in the Android
# tree.
#
#   android-bp_test.sh BUILD-FOLDER
set -euo pipefail

here=$(dirname -- "$(realpath -- "${BASH_SOURCE[0]}")")
build=$(realpath -- "$1")
folder=$(mktemp -d)
# Stands for what a build writes: there, and ignored.
generated=$(mktemp -p "$build" generated-XXXXXX.cpp)
trap 'rm -rf -- "$folder" "$generated"' EXIT
failures=0
cp -t "$folder" -- "$build/TEST_MAPPING"

# refuses TEXT MODULE-LINE: with the line in one more module.
refuses() {
    printf 'cc_test {\n    name: "zelk_more_test",\n    %s,\n}\n' "$2" |
        cat "$build/Android.bp" - >"$folder/Android.bp"
    if "$here/android-bp" "$folder" >"$folder/log" 2>&1; then
        echo "taken: $2" >&2
        failures=$((failures + 1))
    elif ! grep -q -x -F "$1" "$folder/log"; then
        echo "not refused with '$1': $2: $(<"$folder/log")" >&2
        failures=$((failures + 1))
    fi
}

"$here/android-bp" "$build"
root=$(realpath -- "$here/../..")
refuses "android-bp: values/Nowhere.cpp: not a file of the tree" 'srcs: ["values/Nowhere.cpp"]'
refuses "android-bp: ${generated#"$root/"}: not a file of the tree" "srcs: [\"${generated#"$root/"}\"]"
refuses "android-bp: docs/doxygen/make-reference: no source of a compiler" 'srcs: ["docs/doxygen/make-reference"]'
refuses "android-bp: fuzz/corpus/nowhere/*: no such files" 'corpus: ["fuzz/corpus/nowhere/*"]'
refuses "android-bp: nowhere: not a folder of the tree" 'local_include_dirs: ["nowhere"]'
refuses "android-bp: no module is libnowhere, and docs/android.md does not tell of it" 'shared_libs: ["libnowhere"]'
# What a module has by way of an archive alone it does not have there.
refuses "complete-modules: zelk_more_test: needs libzelk_frames, for libzelk_records" 'static_libs: ["libzelk_records"]'
refuses "complete-modules: zelk_more_test: needs libfmtlib, for <fmt/core.h>" 'srcs: ["tools/touchstack/main.cpp"]'
refuses "complete-modules: zelk_more_test: needs -fexceptions, for <CLI/CLI.hpp>" \
    'srcs: ["tools/common/CommandLine.cpp"]'
((failures == 0))
