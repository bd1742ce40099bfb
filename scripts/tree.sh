# Debian trees: folders with a complete Debian system, in which commands run as if it were the machine's. Sourced,
# after common.sh, by the scripts that make or use one; needs root. Mounts in a tree last only while a command runs,
# so a tree can be deleted like any folder.

# in_tree TREE COMMAND...: runs a command inside a tree, with mounts that only it sees
in_tree() {
    unshare --mount bash -euc '
        tree=$1; shift
        for folder in proc sys dev; do mount --rbind "/$folder" "$tree/$folder"; done
        exec chroot "$tree" env -i HOME=/root PATH=/usr/sbin:/usr/bin:/sbin:/bin LC_ALL=C.UTF-8 \
            DEBIAN_FRONTEND=noninteractive "$@" < /dev/null' in-tree "$@"
}

# make_tree TREE ARCHITECTURE LOG: makes an empty Debian of the release that common.sh names. The security archive is
# left out on purpose: its lists for different architectures are not always in step, and nothing in a tree is exposed
# to a network.
make_tree() {
    local tree=$1 archive
    archive=$(main_archive)
    rm -rf --one-file-system "$tree"
    mkdir -p "$tree"
    debootstrap --arch="$2" --variant=minbase "$suite" "$tree" "$archive" < /dev/null > "$3" 2>&1 ||
        die "debootstrap failed: see $3"
    # The tree uses the machine's settings for the archive.
    cp -L /etc/resolv.conf /etc/hosts "$tree/etc/" 2>/dev/null || true
    apt-config dump | grep -iE '^Acquire::(https?|ftp)::' > "$tree/etc/apt/apt.conf.d/90machine" || true
}
