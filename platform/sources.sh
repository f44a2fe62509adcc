# SPDX-License-Identifier: Apache-2.0
# The Android sources, from Debian's source package, and the platform built of them. Sourced by ./dev.
# shellcheck shell=bash

# What is unpacked, out of 370 MB.
ANDROID_PARTS=(
    frameworks/native/cmds/service
    frameworks/native/cmds/servicemanager
    frameworks/native/include
    frameworks/native/libs/arect
    frameworks/native/libs/binder
    frameworks/native/libs/math
    frameworks/native/libs/nativebase
    frameworks/native/libs/ui
    system/core/base
    system/core/libcutils
    system/core/liblog/include
    system/core/libprocessgroup/include
    system/core/libutils
)

# The version of the source package that the installed headers were built from.
android_version() {
    local version
    version=$(dpkg-query -W -f '${source:Version}' android-platform-frameworks-native-headers)
    [[ $version == 29.0.6-* ]] ||
        die "the installed Android headers are of version $version; platform/CMakeLists.txt builds 29.0.6"
    printf '%s\n' "$version"
}

needs_sources() {
    needs_packages || ! [[ -d $(sources_folder) ]]
}

ensure_sources() {
    local version
    version=$(android_version)
    ANDROID_SOURCES=$(sources_folder)
    make_cached sources "$ANDROID_SOURCES" 300 "fetching the sources of android-platform-tools $version (76 MB)" \
        unpack_sources "$version"
}

unpack_sources() {
    local version=$1 scratch=$2
    update_private_lists || exit
    cd -- "$scratch" || exit
    run_logged "the source package cannot be fetched" \
        private_apt apt-get source --download-only "android-platform-tools=$version"
    mkdir result
    run_logged "the source package cannot be unpacked" \
        tar -C result --strip-components=1 -xf "android-platform-tools_${version%-*}.orig.tar.gz" \
        "${ANDROID_PARTS[@]/#/android-platform-tools-${version%-*}/}"
}

needs_platform() {
    needs_sources || ! [[ -d $(platform_folder '') ]]
}

needs_platform_thread() {
    needs_sources || ! [[ -d $(platform_folder thread) ]]
}

# ensure_platform ["" | thread]: builds the platform, with that sanitizer, where build/platform… points.
ensure_platform() {
    local sanitize=$1 folder link=$ROOT/build/platform
    ensure_sources
    folder=$(platform_folder "$sanitize")
    make_cached "platform${sanitize:+_$sanitize}" "$folder" 500 \
        "building the Android platform${sanitize:+ with -fsanitize=$sanitize} (about half a minute)" \
        build_platform "$sanitize" "$folder"
    if [[ $sanitize == thread ]]; then
        link=$link-tsan
    fi
    if [[ $(readlink -- "$link") != "$folder" ]]; then
        mkdir -p -- "$ROOT/build"
        ln -sfnT -- "$folder" "$link"
    fi
}

sources_folder() {
    local version
    version=$(android_version) || exit
    printf '%s\n' "$ZELK_CACHE/sources/android-platform-tools-$version"
}

platform_folder() {
    printf '%s\n' "$ZELK_CACHE/platform/$(platform_key "$1")"
}

platform_key() {
    local compiler
    read -r _ compiler < <(platform_compilers "$1")
    {
        sources_folder
        printf '%s\n' "$1"
        "$compiler" --version
        dpkg-query -W android-libutils-dev android-libcutils-dev android-liblog-dev android-libbase-dev aidl
        (cd "$ROOT/platform" && find CMakeLists.txt ./*.in ./*.h servicemanager -type f -print0 |
            sort -z | xargs -0 sha256sum)
    } | short_hash
}

# platform_compilers <sanitize>: C's and C++'s. Those with a sanitizer are clang's, whose thread sanitizer costs less.
platform_compilers() {
    if [[ -n $1 ]]; then
        echo clang clang++
    else
        echo gcc g++
    fi
}

build_platform() {
    local sanitize=$1 folder=$2 scratch=$3 c cxx
    read -r c cxx < <(platform_compilers "$sanitize")
    run_logged "the platform cannot be configured" \
        cmake -S "$ROOT/platform" -B "$scratch/build" -G Ninja -DCMAKE_C_COMPILER="$c" \
        -DCMAKE_CXX_COMPILER="$cxx" -DANDROID_SOURCE_DIR="$ANDROID_SOURCES" -DPLATFORM_SANITIZE="$sanitize" \
        -DCMAKE_INSTALL_PREFIX="$folder"
    run_logged "the platform does not build" cmake --build "$scratch/build"
    DESTDIR=$scratch/stage run_logged "the platform cannot be installed" cmake --install "$scratch/build"
    mv -- "$scratch/stage$folder" "$scratch/result"
}
