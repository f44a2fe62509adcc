# SPDX-License-Identifier: Apache-2.0
#: setup | install what is needed, build the Android platform, prepare the virtual machine
# shellcheck shell=bash

usage_setup() {
    cat <<'TEXT'
usage: ./dev setup

Installs the Debian packages that are missing (as an ordinary user: asks, then uses sudo), fetches the
Android sources and builds the platform of them, and prepares the virtual machine. The other commands do
the part of it that they need.
TEXT
}

command_setup() {
    (($# == 0)) || die_usage "setup takes no argument"
    begin all thread vm packaging android shell lint --
    ensure_platform ''
    ensure_platform thread
    setup_vm
    say "everything is set up"
}
