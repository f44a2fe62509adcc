# SPDX-License-Identifier: Apache-2.0
# The host: what it must be, and Debian's packages that have to be on it. Sourced by ./dev.
# shellcheck shell=bash disable=SC2034 # the lists are used by ./dev

# The Android platform's headers and libraries, and the compiler of its interface files.
PACKAGES_PLATFORM=(android-libutils-dev android-libcutils-dev android-liblog-dev android-libbase-dev
    android-platform-system-core-headers android-platform-frameworks-native-headers aidl xz-utils)
PACKAGES_BUILD=(g++ cmake ninja-build)
# The address sanitizer is clang's, with its runtime and symbolizer. The exported interface is compared by
# libabigail, and compiled with the device's C++ library as well; zsh runs its completion; spin verifies the
# model of the shared ring, tmux is a terminal to draw on, and gcovr tells what the tests reach. The benchmarks
# compare with nlohmann's reader; valgrind counts instructions. A program of the documents is in Python, and so is
# the mutation check. What is released is told by git's tags.
PACKAGES_TESTS=(libgtest-dev libgmock-dev libbenchmark-dev nlohmann-json3-dev valgrind clang
    libclang-rt-14-dev llvm abigail-tools libc++-14-dev libc++abi-14-dev spin gcovr tmux zsh python3 git)
# The browser that shows what zelkctl makes for browsers; large, and for the tests without the driver alone.
PACKAGES_BROWSER=(chromium-headless-shell)
# Libraries of zelkctl and the simulator, some of which are found by pkg-config; mandoc checks the manual pages.
PACKAGES_TOOLS=(libcli11-dev libfmt-dev rapidjson-dev zlib1g-dev libpng-dev libevdev-dev libtracefs-dev
    libtraceevent-dev pkg-config mandoc)
# What makes Debian packages, looks at them and finds them used; the tests do so as well.
PACKAGES_PACKAGING=(dpkg-dev debhelper lintian pkg-config)
# What the Android tree is given is formatted and compiled by these: bpfmt, the policy's compilers, and the
# compiler for 64-bit Arm.
PACKAGES_ANDROID=(blueprint-tools checkpolicy secilc g++-aarch64-linux-gnu)
# What ./dev bench reads its figures with.
PACKAGES_BENCH=(python3 binutils)
# What makes the reference of the headers.
PACKAGES_DOCS=(doxygen)
# Terminals of a desk, and what makes them good to work at.
PACKAGES_SHELL=(bash-completion dropbear-bin man-db openssh-client)
# What formats the sources and looks for mistakes in them.
PACKAGES_LINT=(clang-format clang-tidy cppcheck shellcheck)
# The machine that runs a kernel with the Binder driver.
PACKAGES_VM=(qemu-system-x86 busybox-static cpio xz-utils)

# check_host [os-release file] [machine]
check_host() {
    local os_release=${1:-/etc/os-release} machine=${2:-$(uname -m)} tool
    [[ $machine == x86_64 ]] ||
        die "unsupported architecture $machine: the shared control block fits glibc's mutex on x86-64" \
            "only (on other machines, 64-bit Arm among them, it has another size)"
    check_distribution "$os_release"
    for tool in apt-get apt-cache dpkg-query dpkg-deb flock setpriv sha256sum; do
        command -v "$tool" >/dev/null || die "$tool is missing: it belongs to every Debian system"
    done
}

# Other releases carry another Android, whose libbinder has other sources than platform/ builds.
check_distribution() {
    local ID='' VERSION_ID='' PRETTY_NAME='this system'
    if [[ -r $1 ]]; then
        # shellcheck source=/dev/null
        . "$1"
    fi
    [[ $ID == debian && $VERSION_ID == 12 ]] ||
        die "unsupported distribution ($PRETTY_NAME): the platform is built from the packages of Debian 12;" \
            "elsewhere bring the android:: targets along (docs/platform.md)"
}

# Where a command says beforehand what it needs, in PACKAGES_NEEDED.
needs_packages() {
    [[ -n $(missing_packages "${PACKAGES_NEEDED[@]}") ]]
}

missing_packages() {
    local installed
    # It fails where it does not know one of them, and tells of the others all the same.
    installed=$({ dpkg-query -W -f '${db:Status-Abbrev}${Package}\n' "$@" 2>/dev/null || true; } |
        sed -n 's/^ii //p')
    comm -23 <(printf '%s\n' "$@" | sort -u) <(sort -u <<<"$installed")
}

# need_packages <package …>: installs those that are missing, after asking where a person can answer.
need_packages() {
    local -a missing sudo=()
    mapfile -t missing < <(missing_packages "$@")
    if ((${#missing[@]} == 0)); then
        return
    fi
    local command="apt-get install --no-install-recommends ${missing[*]}"
    if ((EUID != 0)); then
        can_ask_for_sudo || die "packages are missing; as root run: $command"
        ask "Install these packages with sudo: ${missing[*]}?" ||
            die "packages are missing; as root run: $command"
        sudo=(sudo)
        sudo -v || die "sudo refused; as root run: $command"
    fi
    install_packages
}

can_ask_for_sudo() {
    [[ -t 0 && -t 2 ]] && command -v sudo >/dev/null
}

ask() {
    local answer
    read -r -p "$1 [y/N] " answer
    [[ $answer == [yY]* ]]
}

# Takes missing and sudo from need_packages. The package lists are fetched only where they turn out to be
# absent or too old.
install_packages() {
    local -a install=("${sudo[@]}" env DEBIAN_FRONTEND=noninteractive
        apt-get -q -y install --no-install-recommends "${missing[@]}")
    say_step packages "installing ${missing[*]}"
    if all_have_candidates "${missing[@]}" && "${install[@]}" </dev/null >&2; then
        return
    fi
    say "fetching the package lists"
    "${sudo[@]}" apt-get -q update </dev/null >&2 || die "apt-get update failed: is the network up?"
    all_have_candidates "${missing[@]}" ||
        die "apt knows no candidate for some of these packages: ${missing[*]}"
    "${install[@]}" </dev/null >&2 || die "apt-get could not install ${missing[*]} (its messages are above)"
}

all_have_candidates() {
    local with_candidate
    with_candidate=$(apt-cache policy "$@" | grep -c '^  Candidate: [^(]')
    ((with_candidate == $#))
}
