#!/bin/sh
# try-packages.sh DIRECTORY TREE: runs the tests of debian/tests with the packages of a directory.
#
# They are installed in a new root of Debian with nothing else in it.  Where none can be made, they are installed on this
# machine and removed afterwards.
set -eu
directory=$1
tree=$2
root=$directory/root

remove_root() {
    rm -rf --one-file-system "$root"
}

sources=$(grep -ls debian-archive-keyring /etc/apt/sources.list /etc/apt/sources.list.d/*.list /etc/apt/sources.list.d/*.sources || :)
codename=$(. /etc/os-release && echo "$VERSION_CODENAME")
# shellcheck disable=SC2086 # words on purpose
if unshare --mount true 2>"$directory/root.log" && mmdebstrap --variant=apt --include=apt-utils --mode=root \
    --skip=cleanup/apt/lists "$codename" "$root" $sources >"$directory/root.log" 2>&1; then
    echo 'vtsym: trying the packages in a new root of Debian' >&2
    trap remove_root EXIT
    runner="chroot $root"
    # Compilers ask /proc where they are, and apt wants a terminal.  Both are mounted for the tests alone.
    inside='mount -t proc proc "$0/proc" && mount -t devpts devpts "$0/dev/pts" && exec "$@"'
else
    echo 'vtsym: trying the packages on this machine, since no new root can be made (build/package/root.log)' >&2
    remove_root
    trap 'dpkg --purge python3-vtsym vtsym-doc libvtsym-z3 vtsym libvtsym-dev libvtsym0 >/dev/null 2>&1' EXIT
    runner=null
    inside='exec "$@"'
fi
rm -rf "$directory/tests"
separate=''
[ "$runner" = null ] || separate='unshare --mount'
# shellcheck disable=SC2086
$separate sh -c "$inside" "$root" autopkgtest --no-built-binaries --output-dir "$directory/tests" "$directory"/*.deb "$tree" -- \
    $runner >"$directory/tests.log" 2>&1 || {
    cat "$directory/tests.log" >&2
    exit 1
}
grep -E '(PASS|FAIL|SKIP)' "$directory/tests/summary"
