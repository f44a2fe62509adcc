# SPDX-License-Identifier: Apache-2.0
# A desk: a running touch stack, and terminals that are let in to it. Sourced by ./dev.
# shellcheck shell=bash

# shellcheck source=platform/desk-session
. "$ROOT/platform/desk-session"

# What the caller's environment has for a terminal of its own.
DESK_ENVIRONMENT='^(TERM|COLORTERM|LANG|LC_.*|TZ|EDITOR|PAGER|LESS|PATH|ZELK_.*|ANDROID_.*|[A-Z]*SAN_OPTIONS)$'

# How long a machine may take to end by itself when its last terminal was closed, on a busy host.
DESK_SECONDS=20

# desk_run <options of the stack, one per line, or "--no-stack", or ""> [command …]: runs the command or a
# shell at the desk, which is started if none runs. Ends the script with its exit status.
desk_run() {
    local stack=$1
    shift
    desk_folders
    DESK_STATUS=0
    # Whoever works at the desk holds a shared lock on "users". Who ends the desk waits for that lock alone: it gets it
    # when the last has gone, however that came.
    exec {DESK_USERS}>>"$DESK/users"
    if ! flock --nonblock --shared "$DESK_USERS"; then
        desk_say_waiting
        flock --shared "$DESK_USERS"
    fi
    "desk_join_$VM_MODE" "$stack"
    "desk_session_$VM_MODE" "$@" || DESK_STATUS=$?
    exit "$DESK_STATUS"
}

desk_say_waiting() {
    say "waiting for an earlier desk to end"
}

# The desk's state is nobody else's business: it lets whoever can read it in.
desk_folders() {
    DESK=${XDG_RUNTIME_DIR:-${TMPDIR:-/tmp}}/zelk-desk.$EUID.$(printf '%s\n' "$ROOT $VM_MODE" | short_hash)
    if ! mkdir -m 700 -- "$DESK" 2>/dev/null; then
        [[ -e $DESK || -L $DESK ]] ||
            die "the desk's folder $DESK cannot be made: set XDG_RUNTIME_DIR to a folder that can be written"
        [[ -d $DESK && -O $DESK && ! -L $DESK ]] || die "$DESK belongs to somebody else"
    fi
    chmod 700 -- "$DESK"
    DESK_HOME=$(realpath -m -- "${ZELK_HOME:-${XDG_DATA_HOME:-$HOME/.local/share}/zelk/home}")
    if ! mkdir -p -- "$DESK_HOME" 2>/dev/null || [[ ! -w $DESK_HOME ]]; then
        die "the home folder $DESK_HOME cannot be written: set ZELK_HOME to one that can"
    fi
}

# Manual pages and completions in the folders in which the programs that use them look.
desk_install() {
    cmake --install "$ROOT/build/release" --component Tools --prefix "$ROOT/build/desk" \
        >"$ROOT/build/desk-install.log" || die "zelkctl's manual pages and completions cannot be installed"
}

# The text of a bash script: the command, or a shell, as it is run at the desk.
desk_write_session() {
    local name logs=$1
    shift
    printf 'cd -- %q 2>/dev/null || cd -- %q\n' "$PWD" "$ROOT"
    while read -r name; do
        printf 'export %s=%q\n' "$name" "${!name}"
    done < <(compgen -e | grep -E "$DESK_ENVIRONMENT")
    write_locale
    printf 'export HOME=%q ZELK_ROOT=%q ZELK_LOGS=%q\n' "$DESK_HOME" "$ROOT" "$logs"
    printf '. %q\n' "$ROOT/platform/desk-session"
    printf 'start_session'
    (($# == 0)) || printf ' %q' "$@"
    printf '\n'
}

# desk_check_stack <what is asked for>: a desk that runs has its stack already.
desk_check_stack() {
    [[ -z $1 || $1 == "$(<"$DESK/stack")" ]] ||
        die "a desk runs already, and its stack has other options: leave its terminals first," \
            "or leave --stack and --no-stack out"
}

# ---- this kernel ---------------------------------------------------------------------------------------

# The stack itself ends as soon as it gets the lock on "users".
desk_join_direct() {
    local -a options
    exec {DESK_LOCK}>"$DESK/lock"
    flock "$DESK_LOCK"
    if flock --nonblock "$DESK/running" true; then
        say "starting a touch stack on this machine's Binder driver"
        rm -rf -- "$DESK/logs"
        mkdir -- "$DESK/logs"
        printf '%s' "$1" >"$DESK/stack"
        mapfile -t options <"$DESK/stack"
        ZELK_USERS=$DESK/users setsid env --default-signal flock --nonblock --no-fork "$DESK/running" \
            "$ROOT/platform/stack" "$DESK/logs" "${options[@]}" </dev/null >/dev/null 2>&1 \
            {DESK_USERS}>&- {DESK_LOCK}>&- &
        wait_for_stack "$DESK/logs"
        [[ ! -e $DESK/logs/failed ]] || die "$(<"$DESK/logs/failed")"
    else
        desk_check_stack "$1"
        say "joining the desk that runs already"
    fi
    exec {DESK_LOCK}>&-
}

desk_session_direct() {
    local script
    script=$(desk_write_session "$DESK/logs" "$@")
    env --default-signal bash -c "$script" {DESK_USERS}>&-
}

# ---- QEMU ----------------------------------------------------------------------------------------------

# Terminals come in by ssh over one connection, which is QEMU itself: ssh speaks to its standard streams, and
# they are the guest's virtio port. A process beside QEMU ends the connection when nobody is there any more, and with it
# the machine.
desk_ssh() {
    ssh -F none -S "$DESK/ssh" -o LogLevel=ERROR -o StrictHostKeyChecking=no -o UserKnownHostsFile=/dev/null \
        -o PreferredAuthentications=none -o EscapeChar=none "$@"
}

desk_join_qemu() {
    exec {DESK_LOCK}>"$DESK/lock"
    if ! flock --nonblock "$DESK_LOCK"; then
        say "waiting for another ./dev shell that starts the desk"
        flock "$DESK_LOCK"
    fi
    if desk_ssh -O check desk 2>/dev/null; then
        desk_check_stack "$1"
        say "joining the desk that runs already"
    else
        desk_start_qemu "$1"
    fi
    exec {DESK_LOCK}>&-
}

desk_start_qemu() {
    local -a options
    if ! flock --nonblock "$DESK/running" true; then
        desk_say_waiting
        desk_end_machine
    fi
    say "starting a machine with a touch stack (about ten seconds)"
    rm -rf -- "$DESK/exchange" "$DESK/ssh"
    mkdir -- "$DESK/exchange"
    printf '%s' "$1" >"$DESK/stack"
    mapfile -t options <"$DESK/stack"
    VM_EXCHANGE=$DESK/exchange
    mkdir -p -- "$ROOT/build"
    vm_write_folders "$PWD" "$DESK_HOME"
    printf '%s\n' "$DESK_HOME" >"$VM_EXCHANGE/home"
    printf '%s\n' "exec -- ${ROOT@Q}/platform/stack /run/zelk-desk ${options[*]@Q}" \
        >"$VM_EXCHANGE/stack"
    vm_qemu_arguments -serial "file:$DESK/console" \
        -fsdev "local,id=home,path=${DESK_HOME//,/,,},security_model=none,multidevs=remap" \
        -device virtio-9p-pci,fsdev=home,mount_tag=home \
        -device virtio-serial-pci -chardev stdio,id=desk,signal=off -device virtserialport,chardev=desk
    desk_write_machine >"$DESK/machine"
    desk_write_end >"$DESK/end"
    desk_ssh -f -N -o ControlMaster=yes \
        -o ProxyCommand="bash ${DESK@Q}/machine 2>>${DESK@Q}/console" root@desk || {
        cp -- "$DESK/console" "$ROOT/build/vm-console.log"
        die "the virtual machine did not boot (console log: $ROOT/build/vm-console.log)"
    }
}

# The text of a bash script: becomes QEMU, and leaves somebody behind to end it. Both are out of a terminal's reach.
desk_write_machine() {
    printf '%s\n' "echo \$\$ >${DESK@Q}/pid" \
        "exec {running}>>${DESK@Q}/running" \
        "flock --nonblock \$running || exit" \
        "setsid flock ${DESK@Q}/users bash ${DESK@Q}/end </dev/null >/dev/null 2>&1 {running}>&- &" \
        "exec setsid qemu-system-x86_64 ${VM_QEMU[*]@Q}"
}

# The text of a bash script: what is run when the last has gone.
desk_write_end() {
    declare -p DESK DESK_SECONDS
    declare -f desk_ssh desk_end_machine vm_kill
    echo desk_end_machine
}

# A machine that nobody is connected to ends by itself, once it has started; it is killed where it does not.
desk_end_machine() {
    desk_ssh -O exit desk 2>/dev/null || true
    if [[ ! -e $DESK/exchange/started ]] || ! flock --timeout "$DESK_SECONDS" "$DESK/running" true; then
        flock --nonblock "$DESK/running" true || vm_kill "$(<"$DESK/pid")"
        flock "$DESK/running" true
    fi
}

desk_session_qemu() {
    local script=session.$$ status=0
    local -a terminal=(-T)
    if [[ -t 0 && -t 1 ]]; then
        terminal=(-tt)
    fi
    desk_write_session /run/zelk-desk "$@" >"$DESK/exchange/$script"
    desk_ssh "${terminal[@]}" root@desk "exec bash /run/zelk/$script" || status=$?
    rm -f -- "$DESK/exchange/$script"
    return "$status"
}
