# SPDX-License-Identifier: Apache-2.0
# What the commands build and set up before they start. Sourced by ./dev.
# shellcheck shell=bash

setup_platform() {
    check_host
    need_packages "${PACKAGES_PLATFORM[@]}" "${PACKAGES_BUILD[@]}" "${PACKAGES_TESTS[@]}" \
        "${PACKAGES_TOOLS[@]}"
    make_cache_folder
    ensure_platform "$1"
}

setup_vm() {
    check_host
    VM_MODE=$(vm_mode)
    make_cache_folder
    if [[ $VM_MODE == qemu ]]; then
        need_packages "${PACKAGES_VM[@]}"
        ensure_vm_image
    fi
}

build_preset() {
    local preset=$1 folder=$ROOT/build/$1 sanitize=
    if [[ $preset == tsan ]]; then
        sanitize=thread
    fi
    setup_platform "$sanitize"
    (
        lock_file "$ROOT/build/.$preset.lock" "build/$preset"
        cd -- "$ROOT"
        if [[ ! -e $folder/build.ninja || CMakePresets.json -nt $folder/CMakeCache.txt ]]; then
            say "configuring build/$preset"
            cmake --preset "$preset"
        fi
        say "building build/$preset"
        cmake --build "$folder"
    ) || die "build/$preset was not built (the messages are above)"
}
