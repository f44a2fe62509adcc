# SPDX-License-Identifier: Apache-2.0
# What the commands set up and build before they start. Sourced by ./dev.
# shellcheck shell=bash disable=SC2034 # the lists are used by the commands

# What the programs need, and what the tests need besides.
PACKAGES_PROGRAMS=("${PACKAGES_PLATFORM[@]}" "${PACKAGES_BUILD[@]}" "${PACKAGES_TOOLS[@]}")
PACKAGES_ALL=("${PACKAGES_PROGRAMS[@]}" "${PACKAGES_TESTS[@]}")

# The programs of a desk, as CMake's targets.
PROGRAMS=(zelk-touchstack zelkctl)

# begin <what …> -- <step …>: what the command needs (programs; all, which is the tests as well; thread, the
# platform for the thread sanitizer; vm; or the name of another list of packages), and the command's own
# steps. Counts the steps, installs packages, and starts to fetch the kernel, which setup_vm waits for.
# ensure_platform and build_preset do the rest.
begin() {
    local -a steps=(packages sources)
    check_host
    PACKAGES_NEEDED=() VM_MODE=
    while [[ $1 != -- ]]; do
        case $1 in
        programs)
            PACKAGES_NEEDED+=("${PACKAGES_PROGRAMS[@]}")
            steps+=(platform)
            ;;
        all)
            PACKAGES_NEEDED+=("${PACKAGES_ALL[@]}")
            steps+=(platform)
            ;;
        thread) steps+=(platform_thread) ;;
        vm)
            VM_MODE=$(vm_mode)
            steps+=(kernel)
            if [[ $VM_MODE == qemu ]]; then
                PACKAGES_NEEDED+=("${PACKAGES_VM[@]}")
            fi
            ;;
        '') ;;
        *)
            local -n packages=PACKAGES_${1^^}
            PACKAGES_NEEDED+=("${packages[@]}")
            ;;
        esac
        shift
    done
    shift
    plan_steps "${steps[@]}"
    STEPS+=("$@")
    if needs_kernel; then
        in_background ensure_kernel
    fi
    need_packages "${PACKAGES_NEEDED[@]}"
}

setup_vm() {
    check_host
    await_background
    VM_MODE=$(vm_mode)
    if [[ $VM_MODE == qemu ]]; then
        need_packages "${PACKAGES_VM[@]}"
        ensure_vm_image
    fi
}

# build_preset <preset> [target …]: all of it, unless targets are named. For these alone the tests are not
# configured, which need more packages.
build_preset() {
    local preset=$1 folder=$ROOT/build/$1
    shift
    if (($# > 0)) && ! is_configured "$folder" ON; then
        need_packages "${PACKAGES_PROGRAMS[@]}"
        build_configured "$preset" "$folder" OFF "$@"
    else
        need_packages "${PACKAGES_ALL[@]}"
        build_configured "$preset" "$folder" ON "$@"
    fi
}

# is_configured <folder> <whether tests are: ON or OFF>
is_configured() {
    [[ -e $1/build.ninja && ! $ROOT/CMakePresets.json -nt $1/CMakeCache.txt ]] &&
        grep -q "^ZELK_BUILD_TESTS:BOOL=$2\$" "$1/CMakeCache.txt"
}

build_configured() {
    local preset=$1 folder=$2 tests=$3
    local -a less=()
    shift 3
    check_host
    if [[ $preset == tsan ]]; then
        ensure_platform thread
    else
        ensure_platform ''
    fi
    (
        lock_file "$ROOT/build/.$preset.lock" "build/$preset"
        cd -- "$ROOT"
        if ! is_configured "$folder" "$tests"; then
            say "configuring build/$preset"
            [[ $tests == ON ]] || less=(-D ZELK_BUILD_EXAMPLES=OFF)
            # Anew: where a preset has another compiler now, CMake would forget what else it says.
            cmake --fresh --preset "$preset" -D "ZELK_BUILD_TESTS=$tests" "${less[@]}" || exit
        fi
        say_step "build_$preset" "building ${*:-all of it} in build/$preset"
        cmake --build "$folder" ${1:+--target "$@"}
    ) || die "build/$preset was not built (the messages are above)"
}
