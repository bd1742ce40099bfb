# Shared by the packing scripts: names, the time stamp of all packed files, and functions that put files in place.
# Sourced, never run.

source "$(dirname "${BASH_SOURCE[0]}")/../scripts/common.sh"

packaging=$velmoraRoot/packaging
version=$(sed -n 's/^project(.* VERSION \([0-9.]*\).*/\1/p' "$velmoraRoot/CMakeLists.txt")
product=velmora-reel-effects-$version

# Packages depend only on what is packed, not on when, where or by whom. The time stamp is that of the version's entry
# in the Debian changelog; the caller's language, time zone and file modes have no influence.
export LC_ALL=C TZ=UTC
SOURCE_DATE_EPOCH=${SOURCE_DATE_EPOCH:-$(dpkg-parsechangelog -l "$packaging/debian/changelog" -S Timestamp)}
export SOURCE_DATE_EPOCH
umask 022

# put FILE PLACE [MODE]: a copy of a file
put() { install -D -m "${3:-644}" "$1" "$2"; }

# put_tree FOLDER PLACE: copies of all files below a folder; without links and empty folders
put_tree() {
    local file
    [ -d "$1" ] || die "$1 is missing: build first, or run scripts/package"
    while IFS= read -r file; do put "$1/$file" "$2/$file"; done < <(cd "$1" && find . -type f -printf '%P\n')
}

# put_obs DIST PLACE: the filters for OBS, with the licence of the library that they are a part of when they run
gpl=/usr/share/common-licenses/GPL-2
obsLicence=velmora-reel-effects-obs/data/GPL-2.txt
put_obs() {
    put_tree "$1/obs" "$2"
    put "$gpl" "$2/$obsLicence"
}

# put_help PLACE READER...: the help pages for these readers
put_help() {
    local pages
    pages=$(mktemp -d)
    python3 -B "$velmoraRoot/help/edition.py" "$velmoraRoot/docs/help" "$pages" "${@:2}"
    put_tree "$pages" "$1"
    rm -rf "$pages"
}

# put_page FILE PLACE PACKAGE: a Markdown page without what is for others: lines from "<!-- only A B -->" to "<!-- end -->"
# stay in the packages A and B only.
put_page() {
    awk -v package="$3" '
        /^<!-- only .* -->$/ { dropped = index($0, " " package " ") == 0; next }
        /^<!-- end -->$/ { dropped = 0; next }
        /^<!--/ { next }
        !dropped' "$1" | install -D -m 644 /dev/stdin "$2"
}

# Gives everything below a folder the same time stamp.
set_times() { find "$1" -exec touch -h -d "@$SOURCE_DATE_EPOCH" {} +; }

# The files below the current folder, sorted, one per line.
sorted_files() { find . -type f -printf '%P\n' | sort; }

# put_stripped FILE PLACE MODE: a copy of a program or plug-in without debugging information
put_stripped() {
    put "$1" "$2" "$3"
    strip --strip-unneeded --remove-section=.comment --remove-section=.note "$2"
}
