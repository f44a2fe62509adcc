# SPDX-License-Identifier: Apache-2.0
# Runs a command on a kernel with the Binder driver: this one, or Debian's in QEMU. Sourced by ./dev.
# shellcheck shell=bash

# How long a command may take to end after it was told to, before it is killed.
VM_GRACE_SECONDS=5

# The processors of the guest.
VM_PROCESSORS=2

# How long the guest may take to boot, on a very busy machine.
VM_BOOT_SECONDS=180

# Programs that the command starts often: see vm_pack_memory.
VM_MEMORY=()

# What of the caller's environment a guest's command sees.
VM_ENVIRONMENT='^(PATH|HOME|USER|LOGNAME|SHELL|TERM|LANG|LC_.*|TZ|COLUMNS|LD_LIBRARY_PATH|ZELK_.*|CTEST_.*|GTEST_.*|BENCHMARK_.*|ANDROID_.*|[A-Z]*SAN_OPTIONS|GCOV_.*)$'

# vm_mode: direct or qemu
vm_mode() {
    case ${ZELK_VM:-} in
    direct | qemu) printf '%s\n' "$ZELK_VM" ;;
    '') if driver_is_usable; then echo direct; else echo qemu; fi ;;
    *) die_usage "ZELK_VM is '$ZELK_VM': it may be direct or qemu" ;;
    esac
}

driver_is_usable() {
    [[ -c /dev/binder ]] && (: <>/dev/binder) 2>/dev/null
}

# vm_run <timeout in seconds or ""> <command …>: ends the script with the command's exit status, or 124
# after the timeout. Call ensure_vm_image first where VM_MODE is qemu.
vm_run() {
    VM_TIMEOUT=$1
    shift
    VM_SCRATCH=$(mktemp -d "${TMPDIR:-/tmp}/zelk-vm.XXXXXX") || die "no temporary folder can be made"
    VM_CHILD='' VM_TIMER='' VM_WATCHDOG='' VM_READERS=() VM_STOPPED='' VM_STATUS=''
    trap vm_clean_up EXIT
    trap 'vm_interrupt INT' INT
    trap 'vm_interrupt TERM' TERM
    trap 'vm_interrupt HUP' HUP
    "vm_start_$VM_MODE" "$@"
    vm_set_timer "$VM_TIMEOUT"
    vm_wait
    "vm_finish_$VM_MODE"
}

# The command as a bash script, so that every argument arrives as it was given.
vm_write_command() {
    local name
    printf 'cd -- %q || exit 126\n' "$PWD"
    if [[ $VM_MODE == qemu ]]; then
        while read -r name; do
            printf 'export %s=%q\n' "$name" "${!name}"
        done < <(compgen -e | grep -E "$VM_ENVIRONMENT")
    fi
    write_locale
    printf 'exec --'
    printf ' %q' "$@"
    printf '\n'
}

vm_clean_up() {
    vm_set_timer ''
    vm_kill "$VM_CHILD" "$VM_WATCHDOG"
    rm -rf -- "$VM_SCRATCH"
}

# vm_kill <process or "" …>: with the processes that each leads.
vm_kill() {
    local process
    for process in "$@"; do
        if [[ -n $process ]]; then
            kill -KILL -- "-$process" 2>/dev/null || kill -KILL "$process" 2>/dev/null || true
        fi
    done
}

# To be run in the background: a process that a terminal's Ctrl-C does not reach, and that does not outlive
# this script even when that is killed.
vm_helper() {
    exec setpriv --pdeathsig KILL setsid "$@"
}

# ---- waiting, and being told to stop -------------------------------------------------------------------

vm_set_timer() {
    if [[ -n $VM_TIMER ]]; then
        kill -KILL "$VM_TIMER" 2>/dev/null || true
        wait "$VM_TIMER" 2>/dev/null || true
        VM_TIMER=
    fi
    if [[ -n $1 ]]; then
        vm_helper sleep "$1" &
        VM_TIMER=$!
    fi
}

# The first reason to stop is told to the command, which gets time to end by itself; the next kills it.
vm_stop() {
    local reason=$1 signal=$2
    if [[ -n $VM_STOPPED ]]; then
        vm_kill "$VM_CHILD"
        return
    fi
    VM_STOPPED=$reason
    "vm_signal_$VM_MODE" "$signal"
    vm_set_timer "$VM_GRACE_SECONDS"
}

vm_interrupt() {
    vm_stop "$1" "$1"
}

# Until the child has ended. A reader that ends before it has lost whoever read the output, or cannot write it.
vm_wait() {
    local ended
    while kill -0 "$VM_CHILD" 2>/dev/null; do
        ended=''
        wait -n -p ended "$VM_CHILD" ${VM_TIMER:+"$VM_TIMER"} "${VM_READERS[@]}" 2>/dev/null || true
        case ${ended:-interrupted} in
        "$VM_CHILD" | interrupted) ;;
        "$VM_TIMER")
            VM_TIMER=
            vm_stop timeout TERM
            ;;
        *)
            vm_forget_reader "$ended"
            if [[ -n $VM_STOPPED ]]; then
                continue
            elif [[ $(vm_output_problem) ]]; then
                vm_stop output PIPE
            else
                vm_stop PIPE PIPE
            fi
            ;;
        esac
    done
    VM_STATUS=0
    wait "$VM_CHILD" 2>/dev/null || VM_STATUS=$?
}

vm_forget_reader() {
    local reader
    local -a others=()
    for reader in "${VM_READERS[@]}"; do
        [[ $reader == "$1" ]] || others+=("$reader")
    done
    VM_READERS=("${others[@]}")
}

# Ends the script as the command ended; where it was stopped without leaving a status, by the reason.
vm_exit() {
    local status=$1
    case $VM_STOPPED in
    timeout)
        printf 'dev: vm: stopped, as the command had not ended after %s seconds\n' "$VM_TIMEOUT" >&2
        exit 124
        ;;
    output) die "vm: the command's output cannot be written: $(vm_output_problem)" ;;
    ?*) exit "${status:-$((128 + $(kill -l "$VM_STOPPED")))}" ;;
    *) exit "$status" ;;
    esac
}

# ---- this kernel ---------------------------------------------------------------------------------------

vm_start_direct() {
    vm_write_command "$@" >"$VM_SCRATCH/command"
    setsid env --default-signal bash "$VM_SCRATCH/command" </dev/null &
    VM_CHILD=$!
}

vm_signal_direct() {
    kill -s "$1" -- "-$VM_CHILD" 2>/dev/null || true
}

vm_finish_direct() {
    vm_kill "$VM_CHILD"
    vm_exit "$VM_STATUS"
}

# ---- QEMU ----------------------------------------------------------------------------------------------

# The guest's serial port carries its boot messages out and signals in; the command's own output comes
# through files of the exchange folder, which vm-init describes.
vm_start_qemu() {
    VM_EXCHANGE=$VM_SCRATCH/exchange
    mkdir -p -- "$VM_EXCHANGE" "$ROOT/build"
    vm_write_command "$@" >"$VM_EXCHANGE/command"
    vm_write_folders "$PWD"
    vm_pack_memory
    : >"$VM_EXCHANGE/stdout"
    if ! [[ /dev/fd/1 -ef /dev/fd/2 ]]; then
        : >"$VM_EXCHANGE/stderr"
    fi
    mkfifo "$VM_SCRATCH/serial"
    exec {VM_SERIAL}<>"$VM_SCRATCH/serial"
    vm_qemu_arguments -chardev stdio,id=console,signal=off -serial chardev:console
    vm_helper qemu-system-x86_64 "${VM_QEMU[@]}" \
        <"$VM_SCRATCH/serial" >"$VM_SCRATCH/console" 2>&1 &
    VM_CHILD=$!
    vm_watch_boot
    vm_follow "$VM_EXCHANGE/stdout" &
    VM_READERS=("$!")
    if [[ -e $VM_EXCHANGE/stderr ]]; then
        vm_follow "$VM_EXCHANGE/stderr" >&2 &
        VM_READERS+=("$!")
    fi
}

# vm_write_folders <folder> …: for the guest, what it is to show besides the tree and the cache. Parents come before what is in them.
vm_write_folders() {
    realpath -- "$ROOT/build" >"$VM_EXCHANGE/build"
    realpath -- "$ROOT" "$ZELK_CACHE" "$@" | sort -u >"$VM_EXCHANGE/folders"
}

# Of a start's time most goes into asking the host where the libraries are. So the guest is to start the programs
# of VM_MEMORY from files that are put into its memory along with the initramfs: the programs, and their libraries
# as the folder in which the tree's programs look first, build/release/lib, and where they belong.
vm_pack_memory() {
    local folder
    local -a libraries
    ((${#VM_MEMORY[@]} > 0)) || return 0
    mapfile -t libraries < <(ldd "${VM_MEMORY[@]}" | awk '$2 == "=>" { print $3 }' | sort -u)
    folder=$(realpath -- "$ROOT/build/release/lib")
    mkdir -p -- "$VM_SCRATCH/memory$folder"
    ln -sf -t "$VM_SCRATCH/memory$folder" -- "${libraries[@]}"
    printf '%s\n' "$folder" >"$VM_EXCHANGE/memory"
    realpath -- "${libraries[@]}" | sort -u | vm_pack_libraries
    realpath -- "${VM_MEMORY[@]}" /lib64/ld-linux-x86-64.so.2 /etc/ld.so.cache | sort -u | vm_pack_files
    cp -- "$VM_INITRAMFS" "$VM_SCRATCH/initramfs"
    (cd -- "$VM_SCRATCH" && find memory | cpio --quiet --dereference -o -H newc) >>"$VM_SCRATCH/initramfs"
    VM_INITRAMFS=$VM_SCRATCH/initramfs
}

# Of a folder that holds nothing but libraries of one kind all are wanted, of the system's those of the list.
vm_pack_libraries() {
    local library folder
    while read -r library; do
        folder=${library%/*}
        if [[ $folder == /usr/lib/x86_64-linux-gnu ]]; then
            vm_pack_files <<<"$library"
        elif ! [[ -d $VM_SCRATCH/memory$folder ]]; then
            mkdir -p -- "$VM_SCRATCH/memory$folder"
            ln -s -t "$VM_SCRATCH/memory$folder" -- "$folder"/*.so*
            printf '%s\n' "$folder" >>"$VM_EXCHANGE/memory"
        fi
    done
}

vm_pack_files() {
    local file
    while read -r file; do
        mkdir -p -- "$VM_SCRATCH/memory${file%/*}"
        ln -s -t "$VM_SCRATCH/memory${file%/*}" -- "$file"
        printf '%s\n' "$file" >>"$VM_EXCHANGE/memory"
    done
}

# What it has to say is told in the end, if it is this.
vm_output_problem() {
    sed -n -E "s/^tail: (write error|error writing 'standard output'): //p" "$VM_SCRATCH/readers" | head -n 1
}

vm_follow() {
    vm_helper tail -q -s 0.05 -c +1 --pid="$VM_CHILD" -f -- "$1" 2>>"$VM_SCRATCH/readers"
}

# Ends a guest that hangs before it gets to the command.
vm_watch_boot() {
    mkfifo "$VM_SCRATCH/nothing"
    # shellcheck disable=SC2016 # expanded by the helper
    vm_helper bash -c 'read -r -t "$1" <>"$2/nothing"; [[ -e $2/exchange/started ]] || kill -KILL "$3"' \
        watchdog "$VM_BOOT_SECONDS" "$VM_SCRATCH" "$VM_CHILD" &
    VM_WATCHDOG=$!
    disown "$VM_WATCHDOG"
}

# vm_qemu_arguments <argument …>: VM_QEMU, with those.
# shellcheck disable=SC2054 # commas are QEMU's
vm_qemu_arguments() {
    local build
    local -a kernel
    build=$(<"$VM_EXCHANGE/build")
    # servicemanager asks for its callers' security contexts, which exist only with SELinux on.
    # On a busy machine the guest would find its timer too slow, and give up.
    kernel=(console=ttyS0 quiet panic=-1 no_timer_check lsm=selinux selinux=1)
    if [[ ${ZELK_VM_ACCEL:-tcg} == kvm ]]; then
        set -- -accel kvm -cpu host "$@"
    else
        # What QEMU has translated it finds again by its address: where each process has its libraries at addresses
        # of its own, it translates them anew for each.
        kernel+=(norandmaps)
        set -- -accel "tcg,thread=multi" "$@"
    fi
    VM_QEMU=(-nodefaults -display none -no-reboot -smp "$VM_PROCESSORS" -m 2048
        -kernel "$VM_VMLINUX" -initrd "$VM_INITRAMFS"
        -append "${kernel[*]}"
        -fsdev "local,id=host,path=/,security_model=none,readonly=on,multidevs=remap"
        -device virtio-9p-pci,fsdev=host,mount_tag=host
        -fsdev "local,id=build,path=${build//,/,,},security_model=none,multidevs=remap"
        -device virtio-9p-pci,fsdev=build,mount_tag=build
        -fsdev "local,id=exchange,path=${VM_EXCHANGE//,/,,},security_model=none"
        -device virtio-9p-pci,fsdev=exchange,mount_tag=exchange
        "$@")
}

# Before the command runs there is nobody to tell.
vm_signal_qemu() {
    if [[ -e $VM_EXCHANGE/started ]]; then
        printf '%s\n' "$1" >&"$VM_SERIAL"
    else
        vm_kill "$VM_CHILD"
    fi
}

vm_finish_qemu() {
    local console=$ROOT/build/vm-console.log reader
    for reader in "${VM_READERS[@]}"; do
        wait "$reader" || true
    done
    if [[ $(vm_output_problem) ]]; then
        VM_STOPPED=${VM_STOPPED:-output}
    fi
    if [[ -s $VM_EXCHANGE/status || -n $VM_STOPPED ]]; then
        vm_exit "$(cat "$VM_EXCHANGE/status" 2>/dev/null)"
    fi
    cp -- "$VM_SCRATCH/console" "$console"
    if [[ -e $VM_EXCHANGE/started ]]; then
        die "the virtual machine broke down while the command ran (console log: $console)"
    fi
    die "the virtual machine did not boot (console log: $console)"
}
