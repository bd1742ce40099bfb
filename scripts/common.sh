# What the scripts share: where things are kept, and how they speak. Sourced, never run.

velmoraRoot=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)

# Everything that is made once for a machine, not for a build, is kept here and may be deleted at any time.
velmoraCache=${VELMORA_CACHE:-${XDG_CACHE_HOME:-$HOME/.cache}/velmora-reel-effects}
wineTree=$velmoraCache/wine32-tree
tinyxmlSource=$velmoraCache/tinyxml

say() { printf '%s: %s\n' "${0##*/}" "$*" >&2; }
die() { say "$*"; exit 1; }

# The package names of a list: comments and empty lines dropped.
package_list() { sed -e 's/#.*//' -e '/^[[:space:]]*$/d' "$1"; }

as_root() {
    if [ "$(id -u)" = 0 ]; then "$@"; else sudo "$@"; fi
}

# The Debian release that the Windows side is taken from, whatever the machine's own is.
suite=bookworm

# The address of that release's archive, as the machine's own package sources have it.
main_archive() {
    local archive
    archive=$(known_archive)
    if [ -z "$archive" ]; then
        # A new machine knows no release until its lists have been read once.
        as_root apt-get -q update > /dev/null || true
        archive=$(known_archive)
    fi
    [ -n "$archive" ] || die "this machine's package sources have no archive of $suite"
    echo "$archive"
}

known_archive() {
    apt-get indextargets --format '$(CODENAME) $(COMPONENT) $(REPO_URI)' 'Created-By: Packages' |
        awk -v suite=$suite '$1 == suite && $2 == "main" && !found { print $3; found = 1 }'
}
