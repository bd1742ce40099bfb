# Shared by the scripts: folders and messages. Sourced, never run.

velmoraRoot=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)

# Everything that is made once per machine and not once per build is in this folder, which may be deleted at any time.
velmoraCache=${VELMORA_CACHE:-${XDG_CACHE_HOME:-$HOME/.cache}/velmora-reel-effects}
wineTree=$velmoraCache/wine32-tree
tinyxmlSource=$velmoraCache/tinyxml

say() { printf '%s: %s\n' "${0##*/}" "$*" >&2; }
die() { say "$*"; exit 1; }

# The package names in a list, without comments and empty lines.
package_list() { sed -e 's/#.*//' -e '/^[[:space:]]*$/d' "$1"; }

as_root() {
    if [ "$(id -u)" = 0 ]; then "$@"; else sudo "$@"; fi
}

# The Debian release from which the Windows tools are taken, whatever release the machine has.
suite=bookworm

# The address of that release's archive, from the machine's own package sources.
main_archive() {
    local archive
    archive=$(known_archive)
    if [ -z "$archive" ]; then
        # On a new machine no release is known until the lists have been read once.
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
