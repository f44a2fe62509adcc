#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# ./dev vm: arguments, output, exit status, time-out and signals; on this kernel and in QEMU.
# shellcheck disable=SC2317,SC2016,SC2153 # functions are called by name, text is expanded by others
. "$(dirname -- "$0")/lib.sh"

vm() {
    "$ROOT/dev" vm "$@"
}

show_arguments='printf "<%s>" "$@"'
awkward_arguments=('a b' "it's" '"quoted"' '$HOME `x` \x' $'two\nlines' '' 'ü*?' --timeout)
awkward_output=$(printf '<%s>' "${awkward_arguments[@]}")

# The processes of this test's virtual machines are known by the temporary folder that they use.
no_processes() {
    ! pgrep -f "$SCRATCH/zelk-vm" >/dev/null
}

no_leftovers() {
    no_processes && ! compgen -G "$SCRATCH/zelk-vm*" >/dev/null
}

# start_vm <command …>: in the background, where a Ctrl-C reaches it, its output in the file "output".
start_vm() {
    : >output
    set -m
    TMPDIR=$SCRATCH "$ROOT/dev" vm "$@" >output 2>errors &
    VM=$!
    set +m
    wait_until grep -q ready output
}

expect_vm_status() {
    local status=0
    wait "$VM" || status=$?
    expect_equal "$1" "$status"
    wait_until no_leftovers
}

handles_int='trap "echo stopped properly; exit 5" INT; echo ready; sleep 1000 & wait'
ignores_all='trap "" INT TERM; echo ready; while :; do sleep 1; done'

# ---- on this kernel ------------------------------------------------------------------------------------

test_direct_passes_arguments_and_status() {
    export ZELK_VM=direct
    expect_status 7 vm bash -c "$show_arguments; exit 7" bash "${awkward_arguments[@]}"
    expect_equal "$awkward_output" "$OUTPUT"
    expect_status 127 vm no-such-command
    expect_status 137 vm bash -c 'kill -KILL $$'
}

test_direct_times_out_and_leaves_nothing_running() {
    export ZELK_VM=direct
    expect_status 124 vm --timeout 1 bash -c 'sleep 1234 & sleep 1234'
    expect_one_error "the command had not ended after 1 seconds"
    expect_equal "" "$(pgrep -f '^sleep 1234$' || true)"
}

test_direct_hands_ctrl_c_to_the_command() {
    export ZELK_VM=direct
    start_vm bash -c "$handles_int"
    kill -INT -- "-$VM"
    expect_vm_status 5
    expect_contains "stopped properly" "$(cat output)"
}

# ---- in QEMU -------------------------------------------------------------------------------------------

test_qemu_runs_as_if_here() {
    export ZELK_VM=qemu ZELK_TEST_WORD='two words' TMPDIR=$SCRATCH
    local folder=$ROOT/build/vm-test
    rm -rf "$folder"
    mkdir -p "$folder"
    head -c 1000000 /dev/urandom >"$folder/in"
    cat >"$folder/script" <<'SCRIPT'
set -eu
[[ -c /dev/binder && -r /dev/binder && -w /dev/binder ]]
[[ $ZELK_TEST_WORD == 'two words' ]]
! touch "$1/cannot" 2>/dev/null
touch /tmp/can /run/can /dev/shm/can
cat build/vm-test/in
printf '<%s>' "${@:2}" >build/vm-test/arguments
echo to stderr >/dev/stderr
sleep 1000 &
exit 42
SCRIPT
    cd "$ROOT"
    expect_status 42 vm -- bash build/vm-test/script "$ROOT" "${awkward_arguments[@]}"
    cmp "$folder/in" "$SCRATCH/.output"
    expect_equal "to stderr" "$ERRORS"
    expect_equal "$awkward_output" "$(<"$folder/arguments")"
    wait_until no_leftovers
    rm -rf "$folder"
}

# It lies below the temporary folder, which is empty otherwise, and the tree lies in it.
test_qemu_shows_a_current_folder_that_holds_the_tree() {
    export ZELK_VM=qemu
    mkdir -p folder/tree/build
    cp -R "$ROOT/dev" "$ROOT/platform" folder/tree
    echo seen >folder/file
    cd folder
    expect_status 0 tree/dev vm -- bash -c 'ls; cat file; touch tree/build/can; [[ ! -e ../.errors ]]'
    expect_equal $'file\ntree\nseen' "$OUTPUT"
    [[ -e tree/build/can ]] || fail "build/ is not the host's"
}

test_qemu_starts_programs_from_memory() {
    export ZELK_VM=qemu TMPDIR=$SCRATCH
    local program=$ROOT/build/release/bin/zelkctl
    # Where each file that it runs from lies, and that it runs.
    # shellcheck disable=SC2016 # expanded in the guest
    expect_status 0 vm --in-memory "$program" bash -c '
        ldd "$1" | grep -o "/[^ ]*" | xargs stat -L -f -c %T "$1" | sort -u
        "$1" --version' bash "$program"
    expect_equal "$(printf 'tmpfs\n%s' "$("$program" --version)")" "$OUTPUT"
    wait_until no_leftovers
}

test_qemu_hands_ctrl_c_to_the_command() {
    export ZELK_VM=qemu
    start_vm bash -c "$handles_int"
    kill -INT -- "-$VM"
    expect_vm_status 5
    expect_contains "stopped properly" "$(cat output)"
}

test_qemu_is_killed_at_the_second_signal() {
    export ZELK_VM=qemu
    start_vm bash -c "$ignores_all"
    kill -TERM "$VM"
    sleep 0.5
    kill -TERM "$VM"
    expect_vm_status 143
}

test_qemu_does_not_outlive_a_killed_run() {
    export ZELK_VM=qemu
    start_vm bash -c "$ignores_all"
    kill -KILL "$VM"
    wait_until no_processes
}

test_qemu_stops_when_nobody_reads() {
    export ZELK_VM=qemu TMPDIR=$SCRATCH
    local -a statuses
    set +o pipefail
    set +e
    vm yes | head -n 1 >output
    statuses=("${PIPESTATUS[@]}")
    set -e
    expect_equal "y" "$(cat output)"
    expect_equal 141 "${statuses[0]}"
    wait_until no_leftovers
}

test_qemu_times_out() {
    export ZELK_VM=qemu TMPDIR=$SCRATCH
    expect_status 124 vm --timeout 1 true
    expect_one_error "the command had not ended after 1 seconds"
    wait_until no_leftovers
}

# The machine is a stand-in: what it writes is lost at once, or as it ends.
test_qemu_tells_of_output_that_cannot_be_written() {
    export ZELK_VM=qemu TMPDIR=$SCRATCH
    local later
    mkdir bin
    cat >bin/qemu-system-x86_64 <<'SCRIPT'
#!/bin/sh
exchange=$(printf '%s\n' "$@" | sed -n 's/^local,id=exchange,path=\([^,]*\),.*/\1/p')
touch "$exchange/started"
echo "a line" >"$exchange/stdout"
$MACHINE_WAITS
echo 0 >"$exchange/status"
SCRIPT
    chmod +x bin/qemu-system-x86_64
    full() {
        PATH=$SCRATCH/bin:$PATH vm true >/dev/full
    }
    for later in 'read -r signal' ''; do
        MACHINE_WAITS=$later expect_status 1 full
        expect_one_error "dev: vm: the command's output cannot be written: No space left on device"
        wait_until no_leftovers
    done
}

test_qemu_that_does_not_boot_is_told_with_its_log() {
    export ZELK_VM=qemu TMPDIR=$SCRATCH
    mkdir bin
    printf '#!/bin/sh\necho "no such machine" >&2\nexit 1\n' >bin/qemu-system-x86_64
    chmod +x bin/qemu-system-x86_64
    PATH=$SCRATCH/bin:$PATH expect_status 1 vm true
    expect_one_error "the virtual machine did not boot (console log: $ROOT/build/vm-console.log)"
    expect_equal "no such machine" "$(<"$ROOT/build/vm-console.log")"
    wait_until no_leftovers
}

run_tests
