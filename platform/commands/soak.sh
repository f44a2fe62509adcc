# SPDX-License-Identifier: Apache-2.0
#: soak [options] | let clients and services work, stop and die at random over the real driver
# shellcheck shell=bash

usage_soak() {
    cat <<'TEXT'
usage: ./dev soak [--minutes N] [--seed SEED]

Lets some hundred clients record, command and watch for N minutes, 5 if not told, over the real Binder driver (see
./dev vm), in rounds, while they and the service are stopped, continued and killed at random. Checks that each
frame is accounted for, that every client ends when it is told to, and that neither the clients nor the service use
more than before.
The same seed, 1 if not told, makes the same choices.
TEXT
}

command_soak() {
    local minutes=5 seed=1 seconds
    while (($# > 0)); do
        case $1 in
        --minutes | --seed) [[ ${2:-} =~ ^[1-9][0-9]{0,3}$ ]] || die_usage "soak: $1 needs a number" ;;
        *) die_usage "soak: unknown option '$1'" ;;
        esac
        printf -v "${1#--}" %s "$2"
        shift 2
    done
    seconds=$((minutes * 60))
    need_packages "${PACKAGES_ALL[@]}"
    build_configured release "$ROOT/build/release" ON driver_soak soak-client zelk-touchstack
    setup_vm
    say "soaking for $minutes minutes, seed $seed"
    # The last round, a busy desk and the boot come on top.
    vm_run $((seconds + seconds / 2 + 300)) env ZELK_SOAK_SECONDS="$seconds" ZELK_SOAK_SEED="$seed" \
        "$ROOT/build/release/bin/driver_soak"
}
