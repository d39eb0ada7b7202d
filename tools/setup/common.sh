# shellcheck shell=bash
# Shared by the set-up scripts; sourced, not run. Defines CACHE and:
#   note TEXT...                a line of progress, on standard error
#   fail TEXT...                reports an error and ends the script
#   watched LABEL LOG COMMAND...   runs a command with its output in LOG and reports its progress
#   must LABEL LOG COMMAND...      the same; a failure is shown and ends the script
#   show_failure LOG            the lines of a log that explain why a build failed
#   lock_cache NAME             waits until no other script holds this lock
#   lock_file PATH              the same for a lock elsewhere
#   check_clock ROOT            ends the script if files of a tree are from the future
#   need_commands "PACKAGE..." COMMAND...   installs the packages if a command is missing

CACHE=${QX_CACHE:-${XDG_CACHE_HOME:-${HOME:-/root}/.cache}/qxanalysis}

told=$SECONDS # the time of the last line written
note() {
    echo "[$(basename "$0")] $*" >&2
    told=$SECONDS
}
fail() {
    note "$*"
    exit 1
}

made=$(mkdir -p "$CACHE" 2>&1) || fail "there is no cache (${made#mkdir: }): set QX_CACHE to another folder"

# The progress of a command, from the end of its log: [12/345] of a build, 12/34 of the tests, the current
# package of apt, or the last note of a set-up script.
progress() {
    tail -c 4096 "$1" | grep -aoE \
        -e '^\[([0-9]+/[0-9]+\]|(libm|lapack|native|setup|run)\].{1,60})' \
        -e '^ *[0-9]+/[0-9]+ Test +#[0-9]+: [^ ]+' \
        -e '^(Get:[0-9]+|(Unpacking|Setting up|I: [A-Z][a-z]+ing) [^ ]+)' | tail -n 1 || true
}

# On a terminal, progress is one line that is updated, otherwise a line at least every ten seconds.
#
# The command runs in its own process group, so that Ctrl-C, or a signal that ends this script,
# ends everything that the command has started; inside another watched command it stays in the group of that command.
watched() {
    local label=$1 log=$2 start=$SECONDS shown=-1 status=0 group=
    shift 2
    if [ -z "${QX_WATCHED:-}" ]; then
        group=own
        local signal
        for signal in INT TERM HUP; do
            # shellcheck disable=SC2064
            trap "end_watched $signal \$! $start $(printf %q "$label")" "$signal"
        done
        set -m
    fi
    QX_WATCHED=yes "$@" >"$log" 2>&1 </dev/null &
    local pid=$!
    set +m
    while kill -0 "$pid" 2>/dev/null; do
        sleep 0.2
        if [ -t 2 ] && [ $((SECONDS - start)) -gt "$shown" ]; then
            shown=$((SECONDS - start))
            printf '\r%s: %d s %-40.40s' "$label" "$shown" "$(progress "$log")" >&2
        elif [ ! -t 2 ] && [ $((SECONDS - told)) -ge 9 ]; then
            note "$label: $((SECONDS - start)) s $(progress "$log")"
        fi
    done
    wait "$pid" || status=$?
    [ -z "$group" ] || trap - INT TERM HUP
    if [ -t 2 ] && [ $((SECONDS - start)) -gt 0 ]; then
        local end="done"
        [ "$status" = 0 ] || end=failed
        printf '\r%s: %s in %d s%40s\n' "$label" "$end" $((SECONDS - start)) '' >&2
    fi
    return "$status"
}

# Ends the group, with half a second to finish, and then this script by the same signal.
end_watched() {
    local signal=$1 pid=$2 start=$3 label=$4
    trap '' INT TERM HUP
    kill -TERM -- "-$pid" 2>/dev/null || true
    for _ in 1 2 3 4 5; do
        sleep 0.1
        kill -0 -- "-$pid" 2>/dev/null || break
    done
    { kill -KILL -- "-$pid" && wait "$pid" || true; } 2>/dev/null
    [ ! -t 2 ] || printf '\r%78s\r' '' >&2
    note "stopped after $((SECONDS - start)) s of $label"
    trap - "$signal"
    kill "-$signal" "$BASHPID"
}

# The error messages of compilers, linkers, apt and cmake with the lines around them; if there are none, the
# end of the log.
show_failure() {
    local lines
    lines=$(grep -aE -B 5 -A 3 -e '[Ee]rror: |[Ee]rror [0-9]+$|CMake Error|undefined reference' \
        -e 'cannot find -l|^(E|Err): |^FAILED: |: not found$|[Nn]o space left|Killed' "$1" | head -n 60) || true
    [ -n "$lines" ] || lines=$(tail -n 20 "$1")
    printf '%s\n' "$lines" >&2
}

must() {
    watched "$@" && return
    show_failure "$2"
    fail "$1 failed: the whole output is in $2"
}

# Installs without prompts and with fresh package lists, after repairing packages that an interrupted run has left
# half-installed.
apt_install() {
    export DEBIAN_FRONTEND=noninteractive
    dpkg --configure -a
    apt-get update -qq -o DPkg::Lock::Timeout=60 &&
        apt-get install -y --fix-broken --no-install-recommends -o DPkg::Lock::Timeout=60 "$@"
}
install_packages() {
    must "installing $*" "$CACHE/apt-install.log" apt_install "$@"
}

# Only one script at a time works on an entry of the cache, because two builds may be configured at once. The lock
# is held until the script ends, or, for a file descriptor other than 9, until that is closed.
lock_cache() {
    [ -w "$CACHE" ] || fail "the cache $CACHE cannot be written to: set QX_CACHE to another folder"
    lock_file "$CACHE/$1.lock" "${2:-9}"
}

lock_file() {
    local file=$1 descriptor=${2:-9}
    eval "exec $descriptor>\"\$file\""
    flock -n "$descriptor" && return
    note "waiting for another script, which holds $file"
    until flock -w 9 "$descriptor"; do
        note "still waiting"
    done
}

# A build depends on the times of files. If the clock was ahead, the build would run cmake again and again, or mistake
# old files for new ones.
check_clock() {
    local late
    late=$(cd "$1" && find CMakeLists.txt cmake include src host build/release -newermt '1 minute' -print -quit 2>/dev/null) || true
    [ -z "$late" ] || fail "$1/$late is from the future: if the clock is right now, touch the file, or remove build/release"
}

need_commands() {
    local packages=$1 command missing=
    shift
    for command in "$@"; do
        command -v "$command" >/dev/null || missing="$missing $command"
    done
    [ -n "$missing" ] || return 0
    [ "$(id -u)" = 0 ] || fail "missing:$missing. As root: apt-get update && apt-get install $packages"
    # shellcheck disable=SC2086
    install_packages $packages
}

# The mirror from which the machine itself installs.
debian_mirror() {
    local mirror
    mirror=$(apt-get indextargets --format '$(SITE) $(RELEASE)' 'Created-By: Packages' 2>/dev/null |
        awk '$2 == "bookworm" || $2 == "stable" { print $1; exit }')
    [ -n "$mirror" ] || fail "no Debian mirror among /etc/apt/sources.list*"
    echo "$mirror"
}

# For a separate Debian root: sets `root` to its folder in the cache, under a lock. Ends the script if it is
# already known that the root cannot be made here.
start_root() {
    root="$CACHE/$1"
    root_failed="$CACHE/$1.failed"
    lock_cache "$1"
    [ ! -f "$root/.complete" ] || return 0
    # Many tests ask for the root: do not try again each time.
    if [ -n "$(find "$root_failed" -mmin -30 2>/dev/null)" ]; then
        note "no root: $(cat "$root_failed"). To try again: rm $root_failed"
        exit 77
    fi
    [ "$(id -u)" = 0 ] || give_up "only root can make a Debian root (debootstrap and chroot)"
    (need_commands debootstrap debootstrap) || give_up "debootstrap is missing"
}

# Exit code 77 means that the root cannot be made here.
give_up() {
    note "$1"
    echo "$1" >"$root_failed"
    exit 77
}
