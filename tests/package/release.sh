#!/usr/bin/env bash
# release.sh SOURCES FOLDER: releases are made in a clone of the sources, as they are committed there. What writes the binary
# interface is stood in for, since that builds both libraries; so `./run abi` itself is not part of this test.
set -euo pipefail
SOURCES=$1
rm -rf "$2"
mkdir -p "$2"
cd "$2"
export GIT_AUTHOR_NAME=a GIT_AUTHOR_EMAIL=a@invalid GIT_COMMITTER_NAME=a GIT_COMMITTER_EMAIL=a@invalid GIT_CONFIG_GLOBAL=/dev/null

fail() { echo "FAILED: $*"; cat log 2>/dev/null; exit 1; }
commit() { git -C clone add -A && git -C clone commit -qm "$1"; }
tree() { git -C clone rev-parse 'HEAD^{tree}'; }
# stand_in: the interface of the version that is set by then
cat >write_interface <<'STAND_IN'
#!/usr/bin/env bash
set -e
version=$(sed -nE 's/^project\(callcontrol VERSION ([0-9.]+) .*/\1/p' CMakeLists.txt)
mkdir -p packaging/abi/"$version" && echo "$version" >packaging/abi/"$version"/interface
STAND_IN
chmod +x write_interface
release() { clone/packaging/release.sh "$@" "$PWD/write_interface" >log 2>&1; }
# refused VERSION REASON: and nothing is changed
refused() {
    local before status=0
    before=$(git -C clone rev-parse HEAD; git -C clone tag; git -C clone status --porcelain)
    release "$1" || status=$?
    ((status == 2)) && grep -q "$2" log || fail "$1: exit status $status instead of a refusal: $2"
    [[ $before == "$(git -C clone rev-parse HEAD; git -C clone tag; git -C clone status --porcelain)" ]] || fail "$1: refused, and changed"
}

# the sources as they lie there, committed or not, in a repository of its own
mkdir clone
git -C "$SOURCES" ls-files -co --exclude-standard -z -- CMakeLists.txt CHANGELOG.md packaging |
    tar -C "$SOURCES" --null --ignore-failed-read --files-from=- -c | tar -x -C clone
git -C clone init -q -b main
sed -i -E 's/^(project\(callcontrol VERSION )[0-9.]+/\11.2.3/; ' clone/CMakeLists.txt
sed -i '/^## /,$d' clone/CHANGELOG.md
printf '## [Unreleased]\n\n- Something new.\n\n## [1.2.2] - 2026-01-02\n\n- Something old.\n' >>clone/CHANGELOG.md
sed -i '1s/(.*)/(1.2.3)/' clone/packaging/debian/changelog
commit 'What is there'

refused 1.2 'MAJOR.MINOR.PATCH'
refused 1.02.3 'MAJOR.MINOR.PATCH'
refused 1.2.2 'older than 1.2.3'
refused 2.0.0 'no package of the libraries of major version 2'
touch clone/stray
refused 1.2.3 'not committed'
rm clone/stray
git -C clone checkout -q --detach
refused 1.2.3 'no branch'
git -C clone checkout -q main

release 1.2.3 || fail "the version that is there already"
[[ -z $(git -C clone status --porcelain) && $(git -C clone log -1 --format=%s) == "Release 1.2.3" ]] || fail "no clean commit"
[[ $(git -C clone rev-parse 'v1.2.3^{commit}') == $(git -C clone rev-parse HEAD) ]] || fail "no tag"
[[ -f clone/packaging/abi/1.2.3/interface ]] || fail "no interface"
[[ $(grep -c '^callcontrol (1.2.3)' clone/packaging/debian/changelog) == 1 ]] || fail "two entries of one version"
[[ $(sed '0,/^## /d' clone/CHANGELOG.md | head -n 4) == $'\n'"## [1.2.3] - $(date -u +%F)"$'\n\n- Something new.' ]] || fail "CHANGELOG.md: $(cat clone/CHANGELOG.md)"

refused 1.2.3 'not newer than 1.2.3'
refused 1.3.0 'nothing unreleased'
sed -i 's/^## \[Unreleased\]$/&\n\n- More./' clone/CHANGELOG.md
commit 'More'
release 1.10.0 || fail "1.10.0 after 1.2.3"
[[ $(dpkg-parsechangelog -l clone/packaging/debian/changelog -S Version) == 1.10.0 ]] || fail "the changelog of the packages"
[[ $(dpkg-parsechangelog -l clone/packaging/debian/changelog --offset 1 --count 1 -S Version) == 1.2.3 ]] || fail "its entry before"
dpkg-parsechangelog -l clone/packaging/debian/changelog --all >/dev/null 2>log && [[ ! -s log ]] || fail "not a changelog of Debian"
grep -q '^project(callcontrol VERSION 1.10.0 ' clone/CMakeLists.txt || fail "the version in CMakeLists.txt"
sed -i 's/^## \[Unreleased\]$/&\n\n- And more./' clone/CHANGELOG.md
commit 'And more'
refused 1.9.0 'not newer than 1.10.0'

# what fails on the way leaves nothing behind
before=$(git -C clone rev-parse HEAD)
printf '#!/bin/sh\nmkdir -p packaging/abi/1.11.0; touch packaging/abi/1.11.0/half; exit 1\n' >write_interface
release 1.11.0 && fail "released without its interface"
[[ -z $(git -C clone status --porcelain) && $(git -C clone rev-parse HEAD) == "$before" && -z $(git -C clone tag --list v1.11.0) ]] ||
    fail "a release that failed has left: $(git -C clone status --porcelain)"
echo passed
