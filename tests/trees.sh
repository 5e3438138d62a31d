# tests/trees.sh: fresh trees of Debian, made by debootstrap, and programs that run in them. To be
# sourced. It takes the machine's own mirror, and needs the network and root (or sudo); what was
# downloaded is kept in build/trees/archives.

project=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
trees=$project/build/trees
as_root=()
((EUID == 0)) || as_root=(sudo)

say() { printf '\n== %s (%d s)\n' "$*" "$SECONDS"; }

# repositories CODENAME: what this machine's apt is configured to have of a release of Debian.
repositories() {
    apt-get indextargets --format \
        'deb $(REPO_URI) $(CODENAME) $(COMPONENT) $(ORIGIN)' 'Created-By: Packages' |
        sed -n "s/^\(deb [^ ]* $1[^ ]* [^ ]*\) Debian$/\1/p"
}

# mirror CODENAME: where it has that release from.
mirror() {
    local from
    from=$(repositories "$1" | awk -v codename="$1" '$3 == codename { print $2; exit }')
    [ -n "$from" ] || { echo "No mirror of Debian $1 in the configuration of apt" >&2; return 1; }
    echo "$from"
}

# make_tree TREE SUITE MIRROR REPOSITORIES: makes a tree of a suite, in which apt then has REPOSITORIES.
make_tree() {
    local tree=$1 suite=$2 from=$3 has=$4
    mkdir -p "$trees/archives"
    "${as_root[@]}" rm -rf "$tree"
    # debootstrap makes every suite from Debian 12 on by its script for sid, and may not know the name.
    "${as_root[@]}" debootstrap --variant=minbase --include=ca-certificates \
        --cache-dir="$trees/archives" "$suite" "$tree" "$from" sid
    "${as_root[@]}" tee "$tree/etc/apt/sources.list" <<<"$has"
    apt-config dump | grep -E '^Acquire::https?::Proxy ' |
        "${as_root[@]}" tee "$tree/etc/apt/apt.conf.d/proxy" || true
}

# in_tree TREE FOLDER PROGRAM ARGUMENT...: runs a program in a tree, with FOLDER from outside as /try, in
# namespaces of its own, so that no mount and no process is left.
in_tree() {
    "${as_root[@]}" unshare --mount --pid --fork --kill-child bash -euc '
        archives=$1 tree=$2 folder=$3
        shift 3
        mkdir -p "$tree/try"
        mount -t proc proc "$tree/proc"
        mount --bind "$folder" "$tree/try"
        mount --bind "$archives" "$tree/var/cache/apt/archives"
        exec chroot "$tree" env -i PATH=/usr/sbin:/usr/bin:/sbin:/bin HOME=/root LC_ALL=C.UTF-8 \
            DEBIAN_FRONTEND=noninteractive "$@"' in_tree "$trees/archives" "$@"
}
