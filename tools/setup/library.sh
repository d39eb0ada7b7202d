# shellcheck shell=bash
# Shared by the scripts that build a library for the module to carry; sourced, not run. Defines:
#   start_library NAME PACKAGE ARCHIVE COMPILER FILE...   sets the folder of the library and unpacks its
#                             source; ends the script if the library is already there, and with
#                             status 1 if it is missing and `find` was given
#   finish_library LICENCE...  moves the built files to their place and prints the path of the archive
#   need_tools "PACKAGE..." COMMAND...   need_commands; does nothing if `find` was given
#   unpack_source PACKAGE FOLDER   unpacks the pinned source and applies our patches
#
# A library is in a folder of the cache with its licences. The folder's name includes a hash of everything
# that affects the bits: the pinned files, our patches, the script with its flags, the compiler. The scripts
# set `target` from their arguments, and `find` if they must not build anything.
. "$(dirname "${BASH_SOURCE[0]}")/common.sh"
. "$(dirname "${BASH_SOURCE[0]}")/targets.sh"

setup=$(cd "$(dirname "${BASH_SOURCE[0]}")" && pwd)
lock="$setup/sources.lock"
target=${1:-linux}
find=${2:-}

# The lines of the lock file for a package.
pinned() {
    grep "^$1 " "$lock" || fail "$1 is not pinned in $lock, so nothing is built from it"
}

recipe() {
    local package=$1 compiler=$2
    shift 2
    { pinned "$package" && echo "$compiler" && cat "$0" "$setup/targets.sh" "$@" && patches "$package" | xargs -r cat; } |
        sha256sum | cut -c 1-12
}

patches() {
    [ ! -d "$setup/patches/$1" ] || find "$setup/patches/$1" -name '*.patch' | LC_ALL=C sort
}

need_tools() {
    [ "$find" = find ] || need_commands "$@"
}

start_library() {
    local name=$1 package=$2 file=$3 compiler=$4 version key
    shift 4
    command -v "$compiler" >/dev/null || exit 1
    version=$(pinned "$package" | head -n 1 | cut -d ' ' -f 2)
    key=$(recipe "$package" "$compiler $("$compiler" -dumpfullversion)" "$@")
    folder="$CACHE/$name/$version-$target-$key"
    archive="$folder/$file"
    if [ ! -f "$archive" ]; then
        [ "$find" != find ] || exit 1
        lock_cache "$name-$target"
    fi
    if [ -f "$archive" ]; then
        echo "$archive"
        exit 0
    fi
    log="$CACHE/$name-$target.log"
    work="$CACHE/$name-$target.work"
    source="$work/source"
    result="$work/result"
    rm -rf "$work"
    mkdir -p "$result/licences" "$CACHE/$name"
    unpack_source "$package" "$source"
}

finish_library() {
    cp "$@" "$result/licences/"
    rm -rf "$folder"
    mv -T "$result" "$folder"
    rm -rf "$work"
    echo "$archive"
}

# Whether fetched or from the folder QX_SOURCES, the files must be the pinned ones.
unpack_source() {
    local package=$1 folder=$2 place=${QX_SOURCES:-$CACHE/sources} files patch
    need_commands "dpkg-dev patch" dpkg-source patch
    files=$(pinned "$package" | cut -d ' ' -f 4)
    if [ -z "${QX_SOURCES:-}" ]; then
        lock_cache sources 8
        # shellcheck disable=SC2086
        (cd "$place" 2>/dev/null && ls $files >/dev/null 2>&1) || fetch "$package"
        exec 8>&-
    fi
    check_source "$package" "$place" || fail "the source of $package is refused: $lock pins other files"
    # shellcheck disable=SC2086
    dpkg-source --no-check -x "$place/$(sed -n '/\.dsc$/p' <<<"$files")" "$folder" >"$work/unpack.log" 2>&1 || {
        show_failure "$work/unpack.log"
        fail "the source of $package cannot be unpacked"
    }
    for patch in $(patches "$package"); do
        patch -d "$folder" -p1 --fuzz=0 --batch --forward <"$patch" >"$work/patch.log" 2>&1 || {
            show_failure "$work/patch.log"
            fail "$patch does not apply to $package"
        }
    done
}

# Reports a file that is missing or is not the pinned one.
check_source() {
    local package=$1 place=$2 lines hash file bad=0
    lines=$(pinned "$package") || return
    while read -r _ _ hash file; do
        if [ ! -f "$place/$file" ]; then
            note "missing: $place/$file"
            bad=1
        elif [ "$(sha256sum <"$place/$file")" != "$hash  -" ]; then
            note "not the pinned file: $place/$file"
            bad=1
        fi
    done <<<"$lines"
    return $bad
}

fetch() {
    local package=$1 log="$CACHE/source-$1.log"
    note "fetching the source package $package"
    watched "fetching $package" "$log" fetch_source "$package" && return
    show_failure "$log"
    fail "Debian's source package $package $(pinned "$package" | head -n 1 | cut -d ' ' -f 2) is needed and" \
        "cannot be fetched (no network?): see $log, or name a folder with its files in QX_SOURCES"
}

# Writes the machine's own Debian sources as source-package lines, Signed-By included, to a separate
# folder: neither the machine's lists nor its sources are touched, and root is not needed.
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

# Files get their names only when all are there, so that those of an interrupted run are fetched again.
fetch_source() {
    local package=$1 apt="$CACHE/apt-source" work="$CACHE/sources.work" version
    version=$(pinned "$package" | head -n 1 | cut -d ' ' -f 2)
    debian_source_lists "$apt" || return
    local options=(-o Dir::Etc::sourcelist=/dev/null -o "Dir::Etc::sourceparts=$apt/parts"
        -o "Dir::State::lists=$apt/lists" -o "Dir::Cache=$apt/cache"
        -o APT::Sandbox::User= -o APT::Get::List-Cleanup=false -o Acquire::Languages=none
        -o Acquire::Retries=3 -o DPkg::Lock::Timeout=60)
    rm -rf "$work"
    mkdir -p "$work" "$CACHE/sources"
    (cd "$work" && apt-get "${options[@]}" update &&
        apt-get "${options[@]}" source --download-only "$package=$version") || return
    check_source "$package" "$work" || return
    mv "$work"/* "$CACHE/sources/" && rm -rf "$work"
}
