#!/usr/bin/env bash
# Builds the Debian packages for amd64 and arm64 in build/package, and checks them: runs lintian, compares the binary
# interface with the last version's, and uses the packages in a minimal chroot.
set -euo pipefail
cd "$(dirname "$0")/.."
out=$PWD/build/package
as_root=$([ "$(id -u)" = 0 ] || echo sudo)

say() { printf '\033[1m==> %s\033[0m\n' "$*"; }

build() { # ARCHITECTURE [OPTION...]
  local dir=$out/$1
  say "building the packages for $1"
  rm -rf "$dir"
  mkdir -p "$dir/source" "$dir/root"
  tar -c --exclude=./build --exclude=./.git . | tar -x -C "$dir/source"
  (cd "$dir/source" && dpkg-buildpackage -us -uc "${@:2}") >"$dir/log" 2>&1 || { tail -40 "$dir/log"; exit 1; }
  # No licence has been chosen, and debian/copyright claims none.
  lintian --allow-root --fail-on error,warning --suppress-tags copyright-without-copyright-notice "$dir"/*.changes
  for package in "$dir"/*.deb; do
    dpkg-deb -x "$package" "$dir/root"
  done
}

# Compares the binary interface with the stored description. A later version may only add functions; the described
# version may change in every way until it is released, and is then described again.
compare_interfaces() {
  local kept=(debian/abi/*.xz) version
  say "comparing the binary interface with ${kept[0]}"
  version=$(dpkg-parsechangelog --show-field Version)
  (cd "$out/amd64/root" && abidw --debug-info-dir usr/lib/debug --headers-dir usr/include/mirel --no-corpus-path \
    --no-show-locs --no-comp-dir-path --no-write-default-sizes --drop-private-types --type-id-style hash \
    usr/lib/*/libmirel_utils.so.*.*.*) >"$out/new.abi"
  xz -dc "${kept[0]}" >"$out/old.abi"
  abidiff --no-added-syms --suppressions debian/abi/suppressions "$out/old.abi" "$out/new.abi" && return
  [ $(($? & 3)) = 0 ] || exit 1 # abidiff failed
  echo "To store this interface: xz -9c $out/new.abi >debian/abi/$version.xz"
  [ "${kept[0]}" = "debian/abi/$version.xz" ] || exit 1
}

# Makes, once, a minimal chroot with what it takes to compile programs, from the archive that apt uses here.
make_base() {
  [ ! -e "$out/base.tar" ] || return 0
  local format='deb $(REPO_URI) $(RELEASE) $(COMPONENT)'
  # Without its lists, apt doesn't know which of its archives are Debian's.
  [ -n "$(apt-get indextargets 'Created-By: Packages' 'Origin: Debian')" ] || $as_root apt-get update >/dev/null
  apt-get indextargets --format "$format" 'Created-By: Packages' 'Origin: Debian' >"$out/sources.list"
  $as_root mmdebstrap --quiet --mode=root --variant=apt --include=g++,make,cmake,pkg-config '' "$out/partial.tar" \
    "$out/sources.list"
  mv "$out/partial.tar" "$out/base.tar"
}

mkdir -p "$out"
trap wait EXIT # a process may still be at work on the root
make_base &
base=$!
build amd64 -b
compare_interfaces
build arm64 -B -aarm64 -d -Pcross,nocheck # -d: only headers are needed, so no packages of arm64
qemu-aarch64 -L /usr/aarch64-linux-gnu -E LD_LIBRARY_PATH="$out/arm64/root/usr/lib/aarch64-linux-gnu" \
  "$out/arm64/root/usr/bin/transcode" --version
say 'making a minimal chroot'
wait "$base"
say 'installing the packages in a minimal chroot, using and removing them'
$as_root tests/package/debian_test.sh "$out/amd64" "$out/base.tar" "$out/bare"
