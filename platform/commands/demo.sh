# SPDX-License-Identifier: Apache-2.0
#: demo | send a command and record touch frames through the real Binder driver
# shellcheck shell=bash

usage_demo() {
    cat <<'TEXT'
usage: ./dev demo

Sends a command, reads the configuration and records touch frames through the real Binder driver: service
manager, simulated touch stack and client are processes of their own. Then it checks that no frame was lost
and none is corrupt.
TEXT
}

command_demo() {
    (($# == 0)) || die_usage "demo takes no argument"
    begin programs vm -- build_release demo
    build_preset release "${PROGRAMS[@]}"
    setup_vm
    say_step demo "starting the demo (in QEMU, unless /dev/binder is usable)"
    vm_run 170 "$ROOT/tools/demo"
}
