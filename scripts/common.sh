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
