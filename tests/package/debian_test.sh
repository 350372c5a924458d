#!/usr/bin/env bash
# Installs the packages in a minimal chroot, uses them as README.md and the tutorial say, removes them, and looks for
# files that are left.
# usage: debian_test.sh DIRECTORY-OF-PACKAGES ROOT.tar ROOT
set -euo pipefail
packages=$1 base=$2 root=$3
top=$(dirname "$0")/../..
rm -rf "$root"
mkdir -p "$root/packages"
tar -x --numeric-owner -f "$base" -C "$root"
cp "$packages"/*.deb "$root/packages"
mkdir "$root/program"

block() { sed -n "/^\`\`\`$1\$/,/^\`\`\`\$/p" "$top/${2:-README.md}" | sed -n "/^\`\`\`$1\$/,/^\`\`\`\$/{/^\`\`\`/!p;/^\`\`\`\$/q}"; }
block cpp >"$root/program/program.cpp"
{
  echo 'cmake_minimum_required(VERSION 3.22)'
  echo 'project(program LANGUAGES CXX)'
  echo 'add_executable(program program.cpp)'
  block cmake
} >"$root/program/CMakeLists.txt"
# The programs of the tutorial; a test compares them with its page.
mkdir "$root/tmp/tutorial"
cp "$top"/examples/tutorial/*.{cpp,h,txt} "$root/tmp/tutorial"
{
  block cmake docs/tutorial.md
  echo 'add_executable(count count.cpp)'
  echo 'add_executable(reword reword.cpp)'
} >"$root/tmp/tutorial/CMakeLists.txt"

cat >"$root/tmp/check" <<'BARE'
quietly() { "$@" >/tmp/log 2>&1 || { cat /tmp/log; echo "failed: $*"; exit 1; }; }
files() {
  find / -xdev \( -path /proc -o -path /tmp -o -path /var/lib/dpkg -o -path /var/lib/apt -o -path /var/cache \
    -o -path /var/log \) -prune -o -type d -print -o -printf '%p %s %l\n' | sort
}
expect() { # WANTED COMMAND...
  local got
  got=$("${@:2}")
  [ "$got" = "$1" ] || { echo "${*:2} printed $got instead of $1"; exit 1; }
}

files >/tmp/before
cd /packages
quietly apt-get install -y --no-install-recommends ./*.deb
cd /program
g++ -std=c++17 -I/usr/include/mirel program.cpp -lmirel_utils -o /tmp/bare
g++ -std=c++17 program.cpp $(pkg-config --cflags --libs mirel) -o /tmp/pkg-config
g++ -std=c++17 program.cpp $(pkg-config --cflags --libs --static mirel) -static -o /tmp/static
quietly cmake -S . -B /tmp/cmake
quietly cmake --build /tmp/cmake
for program in /tmp/bare /tmp/pkg-config /tmp/static /tmp/cmake/program; do
  expect 'Grüße!! 世界 has 10 units' "$program"
done
cd /tmp/tutorial
quietly cmake -B build
quietly cmake --build build
expect $'2 replaced\nGuten Tag, 世界!\nGuten Tag, 🌍!' build/reword greeting.txt Hallo 'Guten Tag'
expect 'Grüße' sh -c "printf Grüße | transcode --to=utf-16be | transcode --from=utf-16be --to=utf-8"
version=$(dpkg-query -W -f '${Version}' libmirel-dev)
expect "transcode (mirel) $version" transcode --version
expect "$version" pkg-config --modversion mirel
ls /usr/share/doc/libmirel-doc/html/index.html >/tmp/log
quietly apt-get purge -y $(dpkg-query -W -f '${Package}\n' '*mirel*')
files | diff /tmp/before -
echo "$version: installed, used and removed, and nothing left"
BARE
LC_ALL=C.UTF-8 DEBIAN_FRONTEND=noninteractive chroot "$root" /bin/bash -euo pipefail /tmp/check </dev/null
rm -rf "$root"
