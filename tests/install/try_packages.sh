#!/usr/bin/env bash
# Installs the Debian packages into a fresh Debian that has nothing else, and builds and runs there what embeds the
# library, from the packages alone: try_installed.sh. Then takes the packages away again and looks for what they left.
#
#     try_packages.sh PACKAGE_FOLDER README WORK_FOLDER
#
# The fresh Debian is made by debootstrap, from the mirror in MIRROR. Where that can't be, for want of root or of
# debootstrap, the packages are unpacked into an empty folder instead, and this machine's compilers build there.
set -euo pipefail
packages=$(realpath "$1") readme=$(realpath "$2")
mkdir -p "$3"
work=$(realpath "$3")
here=$(dirname "$(realpath "${BASH_SOURCE[0]}")")
mirror=${MIRROR:-http://deb.debian.org/debian}
suite=bookworm
root=$work/root

# What a fresh Debian wants mounted is mounted for this process and its children alone: gone with them, however they end.
# Nothing is then left through which the next run could delete into a file system of the machine.
if [[ $(id -u) == 0 && -z ${ZR_OWN_MOUNTS:-} ]] && command -v debootstrap >/dev/null; then
    ZR_OWN_MOUNTS=1 exec unshare --mount --propagation private bash "${BASH_SOURCE[0]}" "$packages" "$readme" "$work"
fi
grep -q " $root/" /proc/mounts && { echo "something is mounted below $root" >&2; exit 1; }
rm -rf --one-file-system "$root"

# lay FOLDER: what the trial reads, beside the packages.
lay() {
    mkdir -p "$1/packages"
    cp "$packages"/*.deb "$1/packages"
    cp "$readme" "$1/README.md"
    cp "$here/headers.sh" "$here/readme.sh" "$here/try_installed.sh" "$1"
}

if [[ $(id -u) != 0 ]] || ! command -v debootstrap >/dev/null; then
    echo "no fresh Debian without root and debootstrap: the packages are unpacked into $root"
    mkdir -p "$root"
    lay "$work"
    for package in "$packages"/*.deb; do dpkg-deb --extract "$package" "$root"; done
    bash "$work/try_installed.sh" "$root/usr" "$work"
    exit
fi

echo "making a fresh Debian in $root"
debootstrap --variant=minbase "$suite" "$root" "$mirror" >"$work/debootstrap.log" 2>&1 ||
    { tail -n 20 "$work/debootstrap.log" >&2; exit 1; }
mountpoint -q "$root/proc" || mount -t proc proc "$root/proc"
lay "$root/root/trial"

in_root() { chroot "$root" env -i HOME=/root LC_ALL=C.UTF-8 PATH=/usr/sbin:/usr/bin:/sbin:/bin DEBIAN_FRONTEND=noninteractive "$@"; }
quietly() { "$@" >>"$work/apt.log" 2>&1 || { tail -n 20 "$work/apt.log" >&2; exit 1; }; }
: >"$work/apt.log"
echo "installing the packages, then compilers"
quietly in_root sh -c 'cd /root/trial/packages && apt-get -q update && apt-get -q install -y --no-install-recommends ./*.deb'
# The program needs nothing but its package.
in_root zrsql --version
quietly in_root apt-get -q install -y --no-install-recommends g++ clang cmake make pkg-config man-db

in_root bash /root/trial/try_installed.sh /usr /root/trial

quietly in_root apt-get -q purge -y libzrparsersql libzrparsersql-dev zrsql
left=$(find "$root/usr" "$root/etc" -name '*zr*sql*' | head)
[[ -z $left ]] || { echo "left behind: $left" >&2; exit 1; }
echo "the packages are removed and leave nothing"
