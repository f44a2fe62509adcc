# SPDX-License-Identifier: Apache-2.0
#: build [preset ...] | build a preset: release (the default), debug, asan, tsan, coverage
# shellcheck shell=bash

PRESETS=(release debug asan tsan coverage)

usage_build() {
    cat <<'TEXT'
usage: ./dev build [preset …]

Builds into build/<preset>. Presets: release (the default), debug, asan, tsan, coverage.
TEXT
}

command_build() {
    local preset
    local -a needs=(all)
    (($# > 0)) || set -- release
    for preset in "$@"; do
        [[ " ${PRESETS[*]} " == *" $preset "* ]] ||
            die_usage "unknown preset '$preset': there are ${PRESETS[*]}"
    done
    if [[ " $* " == *" tsan "* ]]; then
        needs+=(thread)
    fi
    begin "${needs[@]}" -- "${@/#/build_}"
    for preset in "$@"; do
        build_preset "$preset"
    done
}
