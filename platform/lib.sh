# SPDX-License-Identifier: Apache-2.0
# What the other scripts lean on: messages, the cache folder, logged commands. Sourced by ./dev.
# shellcheck shell=bash

# What these scripts compare, sort and read of others' messages is the same in every locale. LC_ALL, which comes before
# the other variables, is given back to what is run for the caller.
if [[ -v LC_ALL ]]; then
    CALLER_LC_ALL=$LC_ALL
fi
export LC_ALL=C.UTF-8

ZELK_CACHE=$(realpath -m -- "${ZELK_CACHE:-${XDG_CACHE_HOME:-$HOME/.cache}/zelk}")

# The file that says that these scripts made the cache folder; regular expressions for what else is in one, at its top
# and one folder below: what nobody else makes, and what others might.
CACHE_MARK=.zelk-cache
CACHE_MADE='sources/android-platform-tools-[^/]+|(platform|initramfs|kernel)/(bookworm-)?[0-9a-f]{16}(-uncompressed)?(\.partial)?'
CACHE_BESIDE='(apt|initramfs|kernel|locks|logs|platform|sources)|apt/(cache|lists|sources|updated)|kernel/bookworm|lock|locks/[a-z_]+|logs/([a-z_]+-)?(cmake|private_apt|tar)\.log'

# The steps of this run that take long, in order, and when it began; see plan_steps.
STEPS=()
STEPS_START=$SECONDS

say() {
    printf '==> %s\n' "$*" >&2
}

# write_locale: the line of a shell script from which on the locale is the caller's.
write_locale() {
    if [[ -v CALLER_LC_ALL ]]; then
        printf 'export LC_ALL=%q\n' "$CALLER_LC_ALL"
    else
        echo 'unset LC_ALL'
    fi
}

# in_locale <command …>: in the caller's.
in_locale() {
    (
        eval "$(write_locale)"
        exec "$@"
    )
}

# plan_steps <step …>: of these steps those are counted for which needs_<step> holds.
plan_steps() {
    local step
    for step in "$@"; do
        if [[ " ${STEPS[*]} " != *" $step "* ]] && "needs_$step"; then
            STEPS+=("$step")
        fi
    done
}

# say_step <step> <message>: the message, with the step's number and the time since the start.
say_step() {
    local index elapsed=$((SECONDS - STEPS_START))
    for index in "${!STEPS[@]}"; do
        if [[ ${STEPS[index]} == "$1" ]]; then
            say "$(printf '[%d/%d %d:%02d] %s' $((index + 1)) ${#STEPS[@]} $((elapsed / 60)) \
                $((elapsed % 60)) "$2")"
            return
        fi
    done
    say "$2"
}

# in_background <command …>: beside what follows, until await_background, which ends the script if it failed.
in_background() {
    set -m
    "$@" </dev/null &
    set +m
    BACKGROUND=$!
    trap 'kill -- "-$BACKGROUND" 2>/dev/null' EXIT
    trap 'exit 130' INT
    trap 'exit 143' TERM
}

await_background() {
    local process=${BACKGROUND:-}
    BACKGROUND=
    trap - EXIT INT TERM
    [[ -z $process ]] || wait "$process"
}

die() {
    printf 'dev: %s\n' "$*" >&2
    exit 1
}

# Wrong usage: the same, with the status that callers can tell apart.
die_usage() {
    printf 'dev: %s\n' "$*" >&2
    exit 2
}

# The first line of a log that tells what went wrong, else its last line.
first_error() {
    grep -a -m 1 -E '^E:|[Ee]rror' "$1" || tail -n 1 "$1"
}

# run_logged <sentence for a failure> <command …>: runs it with its output in a log, which is named when
# it fails. MAKING is what is made, in make_cached.
run_logged() {
    local failure=$1 log=$ZELK_CACHE/logs/${MAKING:+$MAKING-}$2.log
    shift
    mkdir -p -- "$ZELK_CACHE/logs"
    "$@" >"$log" 2>&1 </dev/null || die "$failure: $(first_error "$log") (log: $log)"
}

free_megabytes() {
    df -Pm -- "$1" | awk 'NR == 2 { print $4 }'
}

need_space() {
    local megabytes=$1 folder=$2 free
    free=$(free_megabytes "$folder")
    ((free >= megabytes)) ||
        die "not enough disk space: $megabytes MB are needed in $folder and $free MB are free"
}

make_cache_folder() {
    if ! mkdir -p -- "$ZELK_CACHE" 2>/dev/null || [[ ! -w $ZELK_CACHE ]]; then
        die "the cache folder $ZELK_CACHE cannot be written: set ZELK_CACHE to one that can"
    fi
    if cache_is_ours; then
        touch -- "$ZELK_CACHE/$CACHE_MARK"
    fi
}

# Whether these scripts made the folder: it has their mark. A cache made before there was one is known by what it holds,
# which is nothing but what they make.
cache_is_ours() {
    local content
    [[ ! -e $ZELK_CACHE/$CACHE_MARK ]] || return 0
    content=$(find "$ZELK_CACHE" -mindepth 1 -maxdepth 2 -printf '%P\n' 2>/dev/null) || return
    [[ -z $content ]] || { grep -qE "^($CACHE_MADE)$" <<<"$content" &&
        ! grep -qvE "^($CACHE_MADE|$CACHE_BESIDE)$" <<<"$content"; }
}

# Only what these scripts made, should the folder hold anything else.
remove_cache() {
    (cd -- "$ZELK_CACHE" && rm -rf -- apt initramfs kernel lock locks logs platform sources "$CACHE_MARK")
    rmdir -- "$ZELK_CACHE" 2>/dev/null || true
}

# Holds the lock until the (sub)shell that called it ends.
lock_file() {
    local file=$1 what=$2 descriptor
    exec {descriptor}>"$file"
    if ! flock --nonblock "$descriptor"; then
        say "waiting for another run that is using $what"
        flock "$descriptor"
    fi
}

# Holds one of the cache's locks, which is known by a name.
lock_cache() {
    mkdir -p -- "$ZELK_CACHE/locks"
    lock_file "$ZELK_CACHE/locks/$1" "$ZELK_CACHE"
}

# make_cached <step> <folder> <megabytes needed> <message> <function …>: makes a folder of the cache unless it
# is there, as that step of the run. The function is given a scratch folder and leaves the content in its subfolder "result", which
# gets its name in one step: what is in the cache is complete, whenever a run was cut short.
make_cached() {
    local step=$1 folder=$2 megabytes=$3 message=$4
    shift 4
    if [[ -d $folder ]]; then
        return
    fi
    make_cache_folder
    (
        MAKING=$step
        lock_cache "$step"
        if [[ -d $folder ]]; then
            exit 0
        fi
        need_space "$megabytes" "$ZELK_CACHE"
        say_step "$step" "$message"
        scratch=$folder.partial
        rm -rf -- "$scratch"
        trap 'rm -rf -- "$scratch"' EXIT
        mkdir -p -- "$scratch"
        "$@" "$scratch"
        mv -T -- "$scratch/result" "$folder"
    )
}

# A short name for whatever is fed to it.
short_hash() {
    sha256sum | cut -c 1-16
}
