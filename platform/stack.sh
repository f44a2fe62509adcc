# SPDX-License-Identifier: Apache-2.0
# Starts a touch stack where there is a Binder driver: servicemanager, then zelk-touchstack. To be sourced by a
# script that has ROOT and ends what PROCESSES holds.
# shellcheck shell=bash

STACK_BUILD=${STACK_BUILD:-$ROOT/build/release}
STACK_PLATFORM=${ZELK_PLATFORM_DIR:-$ROOT/build/platform}
PROCESSES=()
exec {PAUSE}<> <(:)

# start_servicemanager <folder for its log>
start_servicemanager() {
    start_program "$STACK_PLATFORM/bin/servicemanager" "$1/servicemanager.log"
    await_program "$STACK_PLATFORM/bin/service" list
}

# start_zelk-touchstack <folder for its log> [option …]
start_zelk-touchstack() {
    start_program "$STACK_BUILD/bin/zelk-touchstack" "$1/zelk-touchstack.log" "${@:2}"
    await_program touchstack_serves "$1/zelk-touchstack.log"
}

# Its last line says so.
touchstack_serves() {
    local text=''
    [[ -e $1 ]] || return 1
    IFS= read -r -d '' text <"$1" || [[ $text == *$'\nprocess '* ]]
}

start_program() {
    "$1" "${@:3}" </dev/null >"$2" 2>&1 &
    PROCESSES+=("$!")
}

# A tenth of a second, without a process of its own: to start one takes long in the virtual machine.
pause() {
    read -r -t 0.1 -u "$PAUSE" || true
}

# await_program <command …>: repeats the command until it succeeds, while the program started last runs, and
# for as long as a very busy machine may take.
await_program() {
    local attempt
    for ((attempt = 0; attempt < 1800; attempt++)); do
        if "$@" >/dev/null 2>&1; then
            return
        fi
        kill -0 "${PROCESSES[-1]}" 2>/dev/null || return 1
        pause
    done
    return 1
}
