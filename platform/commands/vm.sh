# SPDX-License-Identifier: Apache-2.0
#: vm <command ...> | run a command on a kernel with the Binder driver
# shellcheck shell=bash

usage_vm() {
    cat <<'TEXT'
usage: ./dev vm [--timeout SECONDS] [--in-memory PROGRAM]… [--] <command …>

Runs the command on a kernel with the Binder driver: directly where /dev/binder is usable, else in QEMU.
In QEMU it sees this machine's files read-only, with an empty /tmp and /run, and can write to build/; it
runs in the current folder as root, without input. Its output is passed on, and its exit status is
returned; after SECONDS, the boot included, it is stopped and the status is 124.

A program that is started again and again starts faster from the memory of the machine in QEMU, where
--in-memory puts it with its libraries; build/release/lib shows nothing but these then.

  ZELK_VM=direct|qemu   where to run it
  ZELK_VM_ACCEL=kvm     let QEMU use KVM
TEXT
}

command_vm() {
    local timeout=
    while (($# > 0)); do
        case $1 in
        --timeout)
            (($# > 1)) || die_usage "vm: --timeout needs a number of seconds"
            timeout=$2
            shift
            ;;
        --in-memory)
            (($# > 1)) || die_usage "vm: --in-memory needs a program"
            [[ -f $2 && -x $2 ]] || die_usage "vm: '$2' is not a program"
            VM_MEMORY+=("$2")
            shift
            ;;
        --timeout=*) timeout=${1#*=} ;;
        --)
            shift
            break
            ;;
        -*) die_usage "vm: unknown option '$1'" ;;
        *) break ;;
        esac
        shift
    done
    [[ $timeout =~ ^([1-9][0-9]{0,6})?$ ]] || die_usage "vm: '$timeout' is not a number of seconds"
    (($# > 0)) || die_usage "vm: no command is given"
    setup_vm
    vm_run "$timeout" "$@"
}
