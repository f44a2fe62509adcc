# SPDX-License-Identifier: Apache-2.0
# Fetching from Debian's archive without touching the machine's apt: its own source lists, package lists
# and caches, kept in $ZELK_CACHE/apt. Checksums are apt's business. Sourced by ./dev.
# shellcheck shell=bash

# private_apt <apt-get|apt-cache> <arguments …>
private_apt() {
    local program=$1 apt=$ZELK_CACHE/apt
    shift
    "$program" -q -o Dir::Etc::sourcelist=/dev/null -o Dir::Etc::sourceparts="$apt/sources" \
        -o Dir::State::lists="$apt/lists" -o Dir::Cache="$apt/cache" -o Acquire::Languages=none \
        -o APT::Sandbox::User=root -o APT::Update::Error-Mode=any "$@"
}

# Brings the private lists up to date: once for all that a run fetches.
update_private_lists() (
    local apt=$ZELK_CACHE/apt
    lock_cache lists
    if [[ -n $(find "$apt/updated" -newermt '-10 minutes' 2>/dev/null) ]]; then
        exit 0
    fi
    mkdir -p -- "$apt/lists/partial" "$apt/cache/archives/partial"
    rm -rf -- "$apt/sources"
    mkdir -- "$apt/sources"
    copy_sources /etc/apt "$apt/sources"
    compgen -G "$apt/sources/*" >/dev/null ||
        die "no source of Debian's main archive is set up in /etc/apt"
    run_logged "Debian's archive cannot be read (no network?)" private_apt apt-get update
    touch -- "$apt/updated"
)

# copy_sources <etc/apt> <folder>: the entries for this release's main archive, with source packages added.
copy_sources() {
    local from=$1 to=$2 file
    for file in "$from"/sources.list "$from"/sources.list.d/*.list; do
        [[ -f $file ]] && copy_one_line_sources "$file" >"$to/$(basename "$file" .list).list"
    done
    for file in "$from"/sources.list.d/*.sources; do
        [[ -f $file ]] && copy_deb822_sources "$file" >"$to/$(basename "$file")"
    done
    find "$to" -type f -empty -delete
}

SUITES='bookworm|bookworm-updates|bookworm-security|stable|stable-updates|stable-security|oldstable|oldstable-updates|oldstable-security'

# Lines "deb [options] uri suite component …".
copy_one_line_sources() {
    sed -nE "s@^deb[[:space:]]+((\[[^]]*\][[:space:]]+)?[^[:space:]]+[[:space:]]+($SUITES))[[:space:]].*\bmain\b.*@deb \1 main\ndeb-src \1 main@p" "$1"
}

# Paragraphs of "Field: value", a value possibly going on in indented lines. Fields that say where the
# archive is and how it is trusted are kept as they are.
copy_deb822_sources() {
    awk -v suites="^($SUITES)$" '
        function has(field, word) { return (" " value[field] " ") ~ ("[[:space:]]" word "[[:space:]]") }
        function copy_paragraph(   i, n, word, ours) {
            n = split(value["suites"], word)
            for (i = 1; i <= n; i++)
                if (word[i] ~ suites)
                    ours = ours " " word[i]
            if (ours != "" && has("types", "deb") && has("components", "main") && !has("enabled", "(no|false|0|off)")) {
                value["types"] = " deb deb-src"; value["suites"] = ours; value["components"] = " main"
                for (i = 1; i <= fields; i++)
                    print name[i] ":" value[name[i]]
                print ""
            }
            fields = 0
            delete value
        }
        /^#/ { next }
        /^[[:space:]]*$/ { copy_paragraph(); next }
        /^[[:space:]]/ { value[field] = value[field] "\n" $0; next }
        { field = tolower($0); sub(/:.*/, "", field); sub(/^[^:]*:/, ""); value[field] = $0; name[++fields] = field }
        END { copy_paragraph() }' "$1"
}
