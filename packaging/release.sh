#!/usr/bin/env bash
# Makes a release of the tree: the version in CMakeLists.txt, both changelogs and the binary interface, in one commit with a tag.
# Nothing is published. Whatever fails leaves the tree as it was.
#
#     packaging/release.sh VERSION [COMMAND-THAT-WRITES-THE-INTERFACE]
#
# The command is "./run abi --update" unless it is named, and is called when the version is set; before it is called,
# "./run abi" compares the interface with those of the releases before.
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."
VERSION=${1:-}
FILES=(CMakeLists.txt CHANGELOG.md packaging/debian/changelog packaging/abi)

refuse() { echo "release: $*" >&2; exit 2; }
restore() {
    git reset -q -- "${FILES[@]}"
    git checkout -q -- "${FILES[@]}"
    git clean -qfd -- packaging/abi
    echo "release: failed; the tree is as it was" >&2
}

# newer A B: whether A comes after B
newer() { [[ $1 != "$2" && $(printf '%s\n' "$1" "$2" | sort -V | tail -n 1) == "$1" ]]; }
# unreleased: the lines of that section
unreleased() { awk '/^## / { inside = /^## \[Unreleased\]$/; next } inside' CHANGELOG.md; }

check() {
    [[ $VERSION =~ ^(0|[1-9][0-9]*)\.(0|[1-9][0-9]*)\.(0|[1-9][0-9]*)$ ]] || refuse "a version is MAJOR.MINOR.PATCH, not '$VERSION'"
    [[ -z $(git status --porcelain) ]] || refuse "the tree has changes that are not committed"
    git symbolic-ref -q HEAD >/dev/null || refuse "no branch is checked out"
    local last current
    last=$(git tag --list 'v[0-9]*' | sed 's/^v//' | sort -V | tail -n 1)
    [[ -z $last ]] || newer "$VERSION" "$last" || refuse "$VERSION is not newer than $last, which is released"
    current=$(sed -nE 's/^project\(callcontrol VERSION ([0-9.]+) .*/\1/p' CMakeLists.txt)
    [[ $VERSION == "$current" ]] || newer "$VERSION" "$current" || refuse "$VERSION is older than $current in CMakeLists.txt"
    [[ -n $(unreleased | tr -d '[:space:]') ]] || refuse "CHANGELOG.md has nothing unreleased"
    grep -q "^Package: libcallcontrol${VERSION%%.*}\$" packaging/debian/control ||
        refuse "packaging/debian has no package of the libraries of major version ${VERSION%%.*}"
}

set_version() { sed -i -E "s/^(project\(callcontrol VERSION )[0-9.]+/\1$VERSION/" CMakeLists.txt; }

set_changelog() { sed -i "s/^## \[Unreleased\]\$/&\n\n## [$VERSION] - $(date -u +%F)/" CHANGELOG.md; }

# the entry of a version that has none yet goes before the others; the date of one that has is today's
set_debian_changelog() {
    local file=packaging/debian/changelog maintainer date
    maintainer=$(sed -n 's/^Maintainer: //p' packaging/debian/control)
    date=$(date -uR)
    if [[ $(head -n 1 $file) == "callcontrol ($VERSION) "* ]]; then
        sed -i "0,/^ -- .*/s// -- $maintainer  $date/" $file
    else
        printf 'callcontrol (%s) unstable; urgency=medium\n\n  * What has changed is told in CHANGELOG.md.\n\n -- %s  %s\n\n' \
            "$VERSION" "$maintainer" "$date" | cat - $file >$file.new
        mv $file.new $file
    fi
}

check
trap restore ERR
trap 'restore; exit 1' INT TERM
set_version
set_changelog
set_debian_changelog
if (($# > 1)); then
    "${@:2}"
else
    ./run abi
    ./run abi --update
fi
git add -- "${FILES[@]}"
git commit -q -m "Release $VERSION"
trap - ERR INT TERM
git tag -a "v$VERSION" -m "Version $VERSION"
echo "release: $VERSION is committed and tagged as v$VERSION; publish it with: git push --follow-tags"
