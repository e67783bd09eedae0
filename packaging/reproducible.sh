#!/usr/bin/env bash
# Builds and installs two copies of the tree, in folders of different names, one after the other and without a cache, and compares
# what is installed octet by octet.
#
#     packaging/reproducible.sh FOLDER [ARGUMENT-OF-INSTALL]...
set -euo pipefail
SOURCES=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
rm -rf "$1"
mkdir -p "$1"
cd "$1"
shift

# install_copy NAME ARGUMENT...: what else may get into a binary differs as well
install_copy() {
    mkdir -p "$1"
    git -C "$SOURCES" ls-files -co --exclude-standard -z |
        tar -C "$SOURCES" --null --ignore-failed-read --files-from=- -c | tar -x -C "$1"
    (cd "$1" && CMAKE_CXX_COMPILER_LAUNCHER='' ./run install "$OLDPWD/installed-from-$1" "${@:2}")
}
TZ=UTC LC_ALL=C install_copy one "$@"
TZ=Asia/Tokyo LC_ALL=C.UTF-8 HOSTNAME=another install_copy another-with-a-longer-name "$@"
diff -r installed-from-one installed-from-another-with-a-longer-name ||
    { echo "the same sources, and something else is installed" >&2; exit 1; }
echo "equal: $(find installed-from-one -type f | wc -l) files, $(du -sb installed-from-one | cut -f 1) octets"
