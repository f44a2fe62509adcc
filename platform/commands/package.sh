# SPDX-License-Identifier: Apache-2.0
#: package [folder] | make Debian packages of the release build, in build/packages
# shellcheck shell=bash

usage_package() {
    cat <<'TEXT'
usage: ./dev package [folder]

Builds the preset release and makes Debian packages of it, by default in build/packages: libzelkclient,
libzelkclient-dev, libzelkclient-doc, zelkclient-tools and zelkclient-platform, their symbols in packages of
their own. lintian looks at them. docs/packaging.md tells what is in each.
TEXT
}

command_package() {
    local folder=${1:-$ROOT/build/packages}
    (($# <= 1)) || die_usage "package takes one folder"
    check_host
    need_packages "${PACKAGES_PACKAGING[@]}"
    build_preset release
    say "making packages in $folder"
    "$ROOT/packaging/make-packages" "$ROOT/build/release" "$folder" || die "there are no packages"
    lintian --allow-root --fail-on error "$folder"/*.changes || die "lintian found errors (above)"
    printf '%s\n' "$folder"/*.deb
}
