#!/usr/bin/env bash
# Installs a build, moves the installed tree to another folder, and uses it there: the command, and the examples as a
# CMake project and by make with pkg-config. The compilers and their flags come in CC, CXX, CFLAGS and CXXFLAGS.
#   installed.sh BUILD SOURCE CMAKE
set -euo pipefail
build=$1 source=$2 cmake=$3
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
fail() {
    echo "$*" >&2
    exit 1
}

"$cmake" --install "$build" --prefix "$folder/first" >/dev/null
prefix="$folder/moved here"
mv "$folder/first" "$prefix"
if grep -rlF -e "$folder" -e "$build" -e "$source" "$prefix"; then
    fail "These installed files know where they were built or first installed"
fi

[ "$("$prefix/bin/morvik" --version)" = "$("$build/bin/morvik" --version)" ] || fail "The command does not start"
libraries=$(ldd "$prefix/bin/morvik")
[[ "$libraries" == *"$prefix/bin/../lib/libmorvik_v1_0_bitacc_cmodel.so.1"* ]] || fail "The command uses another library"

for file in man/man1/morvik-decode.1 bash-completion/completions/morvik zsh/site-functions/_morvik; do
    [ -s "$prefix/share/$file" ] || fail "share/$file is not installed"
done

echo "As a CMake project"
"$cmake" -S "$source/examples" -B "$folder/cmake" -DCMAKE_PREFIX_PATH="$prefix" >/dev/null
"$cmake" --build "$folder/cmake" >/dev/null
(cd "$folder/cmake" && ctest --output-on-failure)

echo "By make and pkg-config"
mkdir "$folder/make"
PKG_CONFIG_PATH="$prefix/lib/pkgconfig" OUT="$folder/make" make -C "$source/examples" check
