#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# The private copy of the machine's apt sources, and fetching with it.
# shellcheck disable=SC2317,SC2016,SC2153 # functions are called by name, text is expanded by others
. "$(dirname -- "$0")/lib.sh"
. "$ROOT/platform/lib.sh"
. "$ROOT/platform/archive.sh"

copy() {
    mkdir -p to
    copy_sources "$SCRATCH/apt" to
}

test_one_line_sources() {
    mkdir -p apt/sources.list.d
    cat >apt/sources.list <<'LIST'
# deb http://archive.example/debian bookworm main
deb http://archive.example/debian bookworm main contrib non-free-firmware
deb [arch=amd64 signed-by=/usr/share/keyrings/debian.gpg] http://mirror.example/debian bookworm-updates main
deb-src http://archive.example/debian bookworm main
LIST
    echo 'deb https://packages.example/apt tool-bookworm main' >apt/sources.list.d/tool.list
    echo 'deb https://packages.example/debian bookworm stable' >apt/sources.list.d/other.list
    copy
    expect_equal "sources.list" "$(ls to)"
    expect_equal 'deb http://archive.example/debian bookworm main
deb-src http://archive.example/debian bookworm main
deb [arch=amd64 signed-by=/usr/share/keyrings/debian.gpg] http://mirror.example/debian bookworm-updates main
deb-src [arch=amd64 signed-by=/usr/share/keyrings/debian.gpg] http://mirror.example/debian bookworm-updates main' \
        "$(cat to/sources.list)"
}

test_deb822_sources() {
    mkdir -p apt/sources.list.d
    cat >apt/sources.list.d/debian.sources <<'SOURCES'
Types: deb
# the mirror
URIs: http://archive.example/debian
Suites: bookworm bookworm-updates bookworm-backports
Components: main contrib
Signed-By:
 -----BEGIN PGP PUBLIC KEY BLOCK-----
 .
 abc

Types: deb
URIs: http://off.example/debian
Suites: bookworm
Components: main
Enabled: no

Types: deb
URIs: https://deb.tool.example/node
Suites: nodistro
Components: main
SOURCES
    copy
    expect_equal 'types: deb deb-src
uris: http://archive.example/debian
suites: bookworm bookworm-updates
components: main
signed-by:
 -----BEGIN PGP PUBLIC KEY BLOCK-----
 .
 abc' "$(cat to/debian.sources)"
}

test_machine_without_debian_sources() {
    mkdir -p apt to
    copy
    expect_equal "" "$(ls to)"
}

test_without_network_one_sentence_and_nothing_left() {
    . "$ROOT/platform/sources.sh"
    ZELK_CACHE=$SCRATCH/cache
    mkdir "$ZELK_CACHE"
    ANDROID_SOURCES=$ZELK_CACHE/sources/x
    export http_proxy=http://127.0.0.1:9 https_proxy=http://127.0.0.1:9
    expect_status 1 make_cached thing "$ANDROID_SOURCES" 1 "fetching" unpack_sources 29.0.6-28
    expect_contains "dev: Debian's archive cannot be read (no network?)" "$ERRORS"
    expect_equal "" "$(ls "$ZELK_CACHE/sources")"
}

run_tests
