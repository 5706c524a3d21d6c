#!/usr/bin/env bash
# Installs the packages in a new Debian system, uses them there, and removes them again. The system is a temporary one,
# which mmdebstrap makes from Debian's archive: a few minutes, most of them downloads.
#   clean_root.sh FOLDER     FOLDER is where scripts/packages has put them
set -euo pipefail
here=$(cd "$(dirname "$0")" && pwd)
packages=$(cd "$1" && pwd)
vectors=$here/../data/vectors
. /etc/os-release

# What the examples are compiled with is not part of the packages; gcc-multilib compiles for the other word size.
tools=gcc-multilib,g++-multilib,make,cmake,pkg-config,iverilog
mmdebstrap --quiet --variant=apt --architectures=amd64,i386 --include="$tools" \
    --customize-hook='mkdir "$1/packages"' \
    --customize-hook="cp '$packages'/*.deb '$vectors/k40.csv' '$vectors/k40.bits' '$here/in_clean_root.sh' \"\$1/packages\"" \
    --customize-hook='chroot "$1" env -i PATH=/usr/sbin:/usr/bin:/sbin:/bin sh /packages/in_clean_root.sh >&2' \
    "$VERSION_CODENAME" /dev/null "deb http://deb.debian.org/debian $VERSION_CODENAME main"
