#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# What ./dev asks of the host, and which packages it misses.
# shellcheck disable=SC2317,SC2016,SC2153,SC2123 # functions are called by name, text is expanded by others
. "$(dirname -- "$0")/lib.sh"
. "$ROOT/platform/lib.sh"
. "$ROOT/platform/packages.sh"

# distribution <lines of an os-release file …>
distribution() {
    printf '%s\n' "$@" >"$SCRATCH/os-release"
    check_host "$SCRATCH/os-release" x86_64
}

# Functions that end the shell are tried in one of their own.
in_subshell() {
    ("$@")
}

test_accepts_debian_12() {
    expect_status 0 in_subshell distribution ID=debian 'VERSION_ID="12"'
}

test_refuses_other_distributions_by_name() {
    expect_status 1 in_subshell distribution ID=ubuntu ID_LIKE=debian 'VERSION_ID="24.04"' \
        'PRETTY_NAME="Ubuntu 24.04 LTS"'
    expect_one_error "unsupported distribution (Ubuntu 24.04 LTS)"
    expect_status 1 in_subshell distribution ID=debian 'VERSION_ID="13"' 'PRETTY_NAME="Debian 13"'
    expect_one_error "unsupported distribution (Debian 13)"
    expect_status 1 in_subshell check_host "$SCRATCH/absent" x86_64
    expect_one_error "unsupported distribution"
}

test_refuses_other_architectures() {
    printf 'ID=debian\nVERSION_ID="12"\n' >"$SCRATCH/os-release"
    expect_status 1 in_subshell check_host "$SCRATCH/os-release" aarch64
    expect_one_error "unsupported architecture aarch64: the shared control block fits glibc's mutex"
}

test_names_a_missing_tool() {
    printf 'ID=debian\nVERSION_ID="12"\n' >"$SCRATCH/os-release"
    check_without_tools() { (PATH=/nowhere && check_host "$SCRATCH/os-release" x86_64); }
    expect_status 1 check_without_tools
    expect_one_error "apt-get is missing"
}

test_missing_packages_are_those_not_installed() {
    expect_equal "no-such-package-1
no-such-package-2" "$(missing_packages no-such-package-2 bash no-such-package-1 coreutils)"
    expect_equal "" "$(missing_packages bash)"
}

# ./dev ends at the first command that fails, and dpkg-query fails for a package that it does not know.
test_missing_packages_are_told_to_a_script_that_ends_at_errors() {
    expect_equal "no-such-package" "$(bash -euo pipefail -c '. "$1/lib.sh"; . "$1/packages.sh"
        mapfile -t missing < <(missing_packages bash no-such-package); echo "${missing[*]}"' \
        bash "$ROOT/platform")"
}

test_installed_packages_cost_no_apt() {
    apt-get() { fail "apt-get was run"; }
    expect_status 0 need_packages bash coreutils
}

test_ordinary_user_without_terminal_is_told_the_command() {
    local -a as_user=()
    if ((EUID == 0)); then
        as_user=(setpriv --reuid 65534 --clear-groups)
    fi
    # Handed over as text: the checkout may be in a folder that only its owner can read.
    expect_status 1 "${as_user[@]}" \
        bash -c "$(cat "$ROOT"/platform/{lib,packages}.sh)"$'\nneed_packages no-such-package </dev/null'
    expect_one_error "as root run: apt-get install --no-install-recommends no-such-package"
}

test_package_without_candidate() {
    (apt-cache policy bash >/dev/null) || fail "apt-cache does not run"
    all_have_candidates bash coreutils || fail "bash has no candidate"
    ! all_have_candidates bash no-such-package || fail "no-such-package has a candidate"
}

# Stand-ins for apt: install fails until the lists are fetched.
test_root_fetches_the_lists_only_when_needed() {
    local -a missing=(wanted) sudo=()
    env() { echo install >>calls; [[ -e fetched ]]; }
    apt-get() { echo update >>calls; touch fetched; }
    apt-cache() { printf '  Candidate: 1.0\n'; }
    expect_status 0 install_packages
    expect_equal "install update install" "$(xargs <calls)"
    : >calls
    expect_status 0 install_packages
    expect_equal "install" "$(xargs <calls)"
}

test_without_network_the_update_is_what_fails() {
    local -a missing=(wanted) sudo=()
    apt-get() { return 100; }
    apt-cache() { printf '  Candidate: (none)\n'; }
    expect_status 1 in_subshell install_packages
    expect_contains "apt-get update failed: is the network up?" "$ERRORS"
}

run_tests
