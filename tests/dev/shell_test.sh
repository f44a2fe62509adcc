#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# ./dev shell over the real Binder driver: a terminal in QEMU, as tmux shows it, and sessions on this kernel.
# shellcheck disable=SC2317,SC2016,SC2153 # functions are called by name, text is expanded by others
. "$(dirname -- "$0")/lib.sh"

# The desk's folders, and the terminal's socket, are this test's own.
use_desk() {
    export ZELK_HOME="$SCRATCH/a home" TMPDIR=$SCRATCH TERM=xterm-256color ZELK_VM=qemu
    unset XDG_RUNTIME_DIR TMUX
}

terminal() {
    tmux -S "$SCRATCH/tmux" "$@"
}

screen() {
    terminal capture-pane -p -S - 2>/dev/null
}

shows() {
    screen | grep -qE -- "$1"
}

# expect_shown <regular expression for a line>: sooner or later.
expect_shown() {
    wait_until shows "$1"
}

# enter <line>: as if typed.
enter() {
    terminal send-keys -l "$1"
    terminal send-keys Enter
}

machine_runs() {
    pgrep -f "qemu-system-x86_64.*$SCRATCH/zelk-desk" >/dev/null
}

# Neither the machine nor what is beside it: each has the desk's folder among its arguments.
no_desk() {
    ! pgrep -f "$SCRATCH/zelk-desk" >/dev/null
}

test_tells_which_folder_it_cannot_have() {
    local where name
    folders() {
        bash -euo pipefail -c 'ROOT=$1 VM_MODE=direct
            . "$1/platform/lib.sh"; . "$1/platform/vm.sh"; . "$1/platform/desk.sh"; desk_folders' bash "$ROOT"
    }
    use_desk
    for where in "$SCRATCH/nowhere" /proc; do
        XDG_RUNTIME_DIR=$where expect_status 1 folders
        expect_one_error "dev: the desk's folder $where/zelk-desk."
        expect_contains " cannot be made: set XDG_RUNTIME_DIR" "$ERRORS"
    done
    mkdir there
    XDG_RUNTIME_DIR=$SCRATCH/there expect_status 0 folders
    XDG_RUNTIME_DIR=$SCRATCH/there expect_status 0 folders
    name=$(ls there)
    mv "there/$name" elsewhere
    ln -s "$SCRATCH/elsewhere" "there/$name"
    XDG_RUNTIME_DIR=$SCRATCH/there expect_status 1 folders
    expect_one_error "dev: $SCRATCH/there/$name belongs to somebody else"
}

test_start_that_is_cut_short_leaves_nothing() {
    use_desk
    local key
    for key in 'send-keys C-c' kill-server; do
        terminal new-session -d "'$ROOT/dev' shell"
        wait_until machine_runs
        # shellcheck disable=SC2086 # several arguments
        terminal $key
        wait_until no_desk
    done
}

test_terminal_in_qemu() {
    use_desk
    cd "$ROOT"
    trap 'screen >&2; terminal kill-server 2>/dev/null' EXIT
    terminal new-session -d -x 100 -y 40 "'$ROOT/dev' shell --stack '--rate 77 --fingers 1'; echo ended \$?; sleep 600"
    expect_shown '^desk:.*#$'

    # The size is the terminal's, and follows it.
    enter 'stty size'
    expect_shown '^40 100$'
    terminal resize-window -x 90 -y 35
    enter 'stty size; pwd; tty'
    expect_shown '^35 90$'
    expect_shown "^$ROOT\$"
    expect_shown '^/dev/pts/'

    # The programs, their pages and their completion are at hand, and the stack has the options.
    enter 'zelkctl ping'
    expect_shown '^the service is alive$'
    enter 'grep ^frames $ZELK_LOGS/zelk-touchstack.log'
    expect_shown '77 frames/s, 1 fingers'
    enter 'man -w zelkctl'
    expect_shown 'build/desk/share/man/man1/zelkctl.1$'
    terminal send-keys -l 'zelkctl recor'
    terminal send-keys Tab
    expect_shown '# zelkctl record'
    terminal send-keys C-u

    # Ctrl-C ends the command in front, Ctrl-Z stops it, and neither reaches the stack.
    enter 'echo in front; sleep 1000'
    expect_shown '^in front$'
    terminal send-keys C-c
    enter 'echo status $?'
    expect_shown '^status 130$'
    enter 'echo again; sleep 2000'
    expect_shown '^again$'
    terminal send-keys C-z
    expect_shown '^\[1\]\+ +Stopped +sleep 2000$'
    enter 'kill %1; zelkctl config get report.rate'
    expect_shown '^report.rate='

    # A second terminal joins, with input, output and status of its own; other options for the stack cannot be.
    expect_status 6 "$ROOT/dev" shell -- bash -c 'cat; zelkctl ping >&2; exit 6' <<<"two  words"
    expect_equal "two  words" "$OUTPUT"
    expect_contains "the service is alive" "$ERRORS"
    expect_contains "joining the desk that runs already" "$ERRORS"
    expect_status 1 "$ROOT/dev" shell --no-stack -- true
    expect_contains "a desk runs already, and its stack has other options" "$ERRORS"

    # The machine stays while somebody is at the desk, and ends even if that one's terminal is closed; the home folder
    # and the history are kept.
    terminal new-window "'$ROOT/dev' shell"
    expect_shown '^desk:.*#$'
    terminal last-window
    enter 'echo kept >~/file; exit 4'
    expect_shown '^ended 4$'
    machine_runs || fail "the machine has ended with a terminal open"
    terminal last-window
    enter 'zelkctl ping'
    expect_shown '^the service is alive$'
    terminal kill-window
    wait_until no_desk
    expect_equal "kept" "$(<"$ZELK_HOME/file")"
    expect_contains $'zelkctl ping\n' "$(<"$ZELK_HOME/.bash_history")"
    terminal kill-server
    trap - EXIT
}

# What ./dev shell does on a kernel with the driver: in the guest, but without building there.
test_sessions_on_this_kernel() {
    use_desk
    mkdir -p "$ROOT/build/desk-test"
    cat >"$ROOT/build/desk-test/script" <<'SCRIPT'
set -euo pipefail
export ROOT=$1 ZELK_HOME=/tmp/home
session() {
    bash -euo pipefail -c '. "$ROOT/platform/lib.sh"; . "$ROOT/platform/vm.sh"; . "$ROOT/platform/desk.sh"
        VM_MODE=direct; desk_run "$@"' bash "$@"
}
session '' bash -c 'touch /tmp/first; until [[ -e /tmp/second ]]; do sleep 0.5; done; zelkctl ping; exit 3' &
until [[ -e /tmp/first ]]; do sleep 0.5; done
status=0
session --no-stack true || status=$?
echo "refused: $status"
session '' bash -c 'zelkctl config get gain; touch /tmp/second; cd; pwd'
status=0
wait "$!" || status=$?
echo "first: $status"
while pgrep -x servicemanager >/dev/null; do sleep 0.5; done
status=0
session --no-such-option true || status=$?
echo "failed: $status"
SCRIPT
    expect_status 0 "$ROOT/dev" vm --timeout 400 -- bash "$ROOT/build/desk-test/script" "$ROOT"
    expect_equal $'refused: 1\ngain=1.500000\n/tmp/home\nthe service is alive\nfirst: 3\nfailed: 1' "$OUTPUT"
    expect_contains "a desk runs already, and its stack has other options" "$ERRORS"
    expect_contains "zelk-touchstack did not start:" "$ERRORS"
    rm -r "$ROOT/build/desk-test"
}

run_tests
