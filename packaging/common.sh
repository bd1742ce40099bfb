# What the packing scripts share: names, the one time that all packed files bear, and how files are put in place.
# Sourced, never run.

source "$(dirname "${BASH_SOURCE[0]}")/../scripts/common.sh"

packaging=$velmoraRoot/packaging
version=$(sed -n 's/^project(.* VERSION \([0-9.]*\).*/\1/p' "$velmoraRoot/CMakeLists.txt")
product=velmora-reel-effects-$version

# Packages depend on what is packed only, not on when, where or by whom: the time is that of the version's entry in the
# Debian changelog, and nothing of the caller's language, time zone or file modes gets in.
export LC_ALL=C TZ=UTC
SOURCE_DATE_EPOCH=${SOURCE_DATE_EPOCH:-$(dpkg-parsechangelog -l "$packaging/debian/changelog" -S Timestamp)}
export SOURCE_DATE_EPOCH
umask 022

# put FILE PLACE [MODE]: a copy of a file
put() { install -D -m "${3:-644}" "$1" "$2"; }

# put_tree FOLDER PLACE: copies of all files below a folder; links and empty folders are not packed
put_tree() {
    local file
    [ -d "$1" ] || die "$1 is missing: build first, or run scripts/package"
    while IFS= read -r file; do put "$1/$file" "$2/$file"; done < <(cd "$1" && find . -type f -printf '%P\n')
}

# Gives everything below a folder the one time.
set_times() { find "$1" -exec touch -h -d "@$SOURCE_DATE_EPOCH" {} +; }

# The files below the current folder, sorted, one a line.
sorted_files() { find . -type f -printf '%P\n' | sort; }

# put_stripped FILE PLACE MODE: a copy of a program or plug-in without what only debuggers read
put_stripped() {
    put "$1" "$2" "$3"
    strip --strip-unneeded --remove-section=.comment --remove-section=.note "$2"
}
