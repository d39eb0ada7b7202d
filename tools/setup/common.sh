# shellcheck shell=bash
# Shared by the set-up scripts; sourced, not run. Defines CACHE and:
#   note TEXT...                a line of progress, on standard error
#   fail TEXT...                says what is wrong and ends the script
#   watched LABEL LOG COMMAND...   runs a command with its output in LOG, and tells how far it is
#   need_commands "PACKAGE..." COMMAND...   installs the packages where a command is missing
#   debian_source PACKAGE       prints the folder of the unpacked Debian source package

CACHE=${QX_CACHE:-${XDG_CACHE_HOME:-${HOME:-/root}/.cache}/qxanalysis}
mkdir -p "$CACHE"

note() { echo "[$(basename "$0")] $*" >&2; }
fail() {
    note "$*"
    exit 1
}

# On a terminal a line that goes on changing, else a line now and then. How far a build is stands at
# the end of its log as [12/345].
watched() {
    local label=$1 log=$2 start=$SECONDS told=$SECONDS status=0 far pid
    shift 2
    "$@" >"$log" 2>&1 &
    pid=$!
    while kill -0 "$pid" 2>/dev/null; do
        sleep 0.5
        far=$(tail -c 4096 "$log" | grep -aoE '^\[([0-9]+/[0-9]+\]|(libm|lapack|openblas)\].{1,50})' |
            tail -n 1)
        if [ -t 2 ]; then
            printf '\r%s: %d s %-60s' "$label" $((SECONDS - start)) "$far" >&2
        elif [ $((SECONDS - told)) -ge 30 ]; then
            note "$label: $((SECONDS - start)) s $far"
            told=$SECONDS
        fi
    done
    wait "$pid" || status=$?
    if [ -t 2 ] && [ $((SECONDS - start)) -gt 0 ]; then
        printf '\r%s: done in %d s%60s\n' "$label" $((SECONDS - start)) '' >&2
    fi
    return "$status"
}

# Without a prompt, and with fresh lists.
apt_install() {
    DEBIAN_FRONTEND=noninteractive apt-get update -qq &&
        DEBIAN_FRONTEND=noninteractive apt-get install -y --no-install-recommends "$@"
}

# One set-up script at a time works in the cache: two builds may be configured at once.
lock_cache() {
    exec 9>"$CACHE/$1.lock"
    flock 9
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
    watched "installing $packages" "$CACHE/apt-install.log" apt_install $packages || fail "apt-get install $packages failed: $CACHE/apt-install.log"
}

# The machine's own Debian sources as source-package lines, Signed-By included, in a folder of
# their own: neither the machine's lists nor its sources are touched, and no root is needed.
debian_source_lists() {
    local folder=$1 list
    mkdir -p "$folder/parts" "$folder/lists/partial" "$folder/cache"
    for list in /etc/apt/sources.list /etc/apt/sources.list.d/*.list; do
        [ -f "$list" ] && sed -En '/debian/s/^deb(-src)? /deb-src /p' "$list"
    done | sort -u >"$folder/parts/debian.list"
    : >"$folder/parts/debian.sources"
    for list in /etc/apt/sources.list.d/*.sources; do
        [ -f "$list" ] || continue
        grep -v '^#' "$list" | awk 'BEGIN { RS = ""; ORS = "\n\n" } /URIs:[^\n]*debian/' |
            sed 's/^Types:.*/Types: deb-src/' >>"$folder/parts/debian.sources"
    done
    [ -s "$folder/parts/debian.list" ] || [ -s "$folder/parts/debian.sources" ] ||
        fail "no Debian source among /etc/apt/sources.list*, so no source package can be fetched"
}

debian_source() {
    local package=$1 source="$CACHE/src/$1" apt work unpacked
    if [ ! -f "$source/.complete" ]; then
        need_commands "dpkg-dev" dpkg-source
        note "fetching the source package $package"
        apt="$CACHE/apt-source"
        debian_source_lists "$apt"
        local options=(-o Dir::Etc::sourcelist=/dev/null -o "Dir::Etc::sourceparts=$apt/parts"
            -o "Dir::State::lists=$apt/lists" -o "Dir::Cache=$apt/cache"
            -o APT::Sandbox::User= -o APT::Get::List-Cleanup=false -o Acquire::Languages=none
            -o Acquire::Retries=3 -o DPkg::Lock::Timeout=60)
        work=$(mktemp -d "$CACHE/src-XXXXXX")
        (cd "$work" && apt-get "${options[@]}" update && apt-get "${options[@]}" source "$package") \
            >"$CACHE/source-$package.log" 2>&1 ||
            { rm -rf "$work"; fail "Debian's source package $package is needed and cannot be fetched (no" \
                "network?): see $CACHE/source-$package.log, or copy $CACHE/src from another machine"; }
        unpacked=$(find "$work" -mindepth 1 -maxdepth 1 -type d | head -n 1)
        [ -n "$unpacked" ] || fail "the source package $package holds no folder"
        dpkg-parsechangelog -l "$unpacked/debian/changelog" -S Version >"$unpacked/.version"
        mkdir -p "$CACHE/src"
        rm -rf "$source"
        mv "$unpacked" "$source"
        rm -rf "$work"
        touch "$source/.complete"
    fi
    echo "$source"
}

# The mirror that the machine itself installs from.
debian_mirror() {
    local mirror
    mirror=$(apt-get indextargets --format '$(SITE) $(RELEASE)' 'Created-By: Packages' 2>/dev/null |
        awk '$2 == "bookworm" || $2 == "stable" { print $1; exit }')
    [ -n "$mirror" ] || fail "no Debian mirror among /etc/apt/sources.list*"
    echo "$mirror"
}
