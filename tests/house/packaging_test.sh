#!/usr/bin/env bash
# Release packaging scripts: the source archive depends only on the files, and packaging/release
# rejects anything that is not a release. The packages themselves are tested by packaging/deb/try,
# on bare systems.
set -u
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd -P)
. "$root/packaging/prepare.sh"
command -v git >/dev/null || exit 77
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
export GIT_CONFIG_GLOBAL=/dev/null GIT_CONFIG_SYSTEM=/dev/null
export GIT_AUTHOR_NAME=a GIT_AUTHOR_EMAIL=a@example.org \
  GIT_COMMITTER_NAME=a GIT_COMMITTER_EMAIL=a@example.org SOURCE_DATE_EPOCH=1700000000
failures=0
Expect() {  # Expect NAME WANTED FOUND
  # shellcheck disable=SC2053
  [[ $3 == $2 ]] && return
  printf '%s: expected "%s", found "%s"\n' "$1" "$2" "$3"
  failures=$((failures + 1))
}

# A small project with this project's scripts.
project=$work/project
mkdir -p "$project/build" "$project/src"
cp -a "$root/packaging" "$root/packages.txt" "$project"
echo 'project(fotomill VERSION 1.2.3 LANGUAGES C CXX)' >"$project/CMakeLists.txt"
printf '# Changes\n\n## 1.2.3 (not released yet)\n' >"$project/CHANGELOG.md"
echo build/ >"$project/.gitignore"
echo x >"$project/build/made"
echo x >"$project/src/a b.cpp"
ln -s 'a b.cpp' "$project/src/link"
git -C "$project" init -q && git -C "$project" add -A && git -C "$project" commit -qm one

# Committed and changed files, without build/; the same from a folder without git.
echo new >"$project/src/new.cpp"
mkdir "$work/one" "$work/two" "$work/one/t" "$work/two/t"
CopyTree "$project" "$work/one/t"
cp -a "$project" "$work/plain" && rm -rf "$work/plain/.git"
(umask 077 && CopyTree "$work/plain" "$work/two/t")
Expect "copied" "a b.cpp link new.cpp " "$(cd "$work/one/t/src" && printf '%s ' *)"
Expect "build/ is left out" "no" \
  "$([[ -e $work/one/t/build || -e $work/two/t/build ]] && echo yes || echo no)"
find "$work/two/t" -exec touch -h -d 2001-01-01 {} +
for name in one two; do ArchiveTree "$work/$name" t "$work/$name.tar.xz"; done
Expect "the same bytes" "same" "$(cmp "$work/one.tar.xz" "$work/two.tar.xz" && echo same)"
Expect "in order" "" "$(tar -tf "$work/one.tar.xz" | LC_ALL=C sort -c 2>&1)"
Expect "its date" "*2023-11-14 *t/CMakeLists.txt*" "$(TZ=UTC tar -tvf "$work/one.tar.xz")"

# Every obstacle is reported, and nothing is created.
Release() { (cd "$work" && "$project/packaging/release" "$@" 2>&1; echo "status $?"); }
Expect "changes and no date" \
  '*changes that are not committed*no line "## 1.2.3 (YYYY-MM-DD)"*status 1' "$(Release)"
git -C "$project" add -A && git -C "$project" commit -qm two
Expect "no date" 'release: CHANGELOG.md has no line*status 1' "$(Release)"
sed -i 's/not released yet/2026-11-22/' "$project/CHANGELOG.md"
git -C "$project" commit -qam three && git -C "$project" tag v1.2.3
Expect "tagged" 'release: v1.2.3 is tagged already*status 1' "$(Release)"
git -C "$project" tag -d v1.2.3 >/dev/null
printf '#!/bin/sh\nexit 1\n' >"$project/check" && chmod +x "$project/check"
git -C "$project" add -A && git -C "$project" commit -qm four
Expect "tests that fail" '*./check fails*status 1' "$(Release)"
Expect "nothing made" "made" "$(ls "$project/build")"
Expect "a wrong option" "usage:*status 2" "$(Release --chek)"

# A release: the source, packages (a stand-in here), and checksums that hold.
printf '#!/bin/sh\nexit 0\n' >"$project/check"
printf '%s\n' '#!/bin/sh' \
  'mkdir -p "$1" && echo package >"$1/fotomill_1.2.3-1_all.deb" && echo >"$1/build.log"' \
  >"$project/packaging/deb/make"
git -C "$project" commit -qam five
Expect "a release" '*fotomill-1.2.3.tar.xz*git tag -a v1.2.3*status 0' "$(Release)"
release=$project/build/release-1.2.3
Expect "its files" "2" "$(wc -l <"$release/SHA256SUMS")"
Expect "a package" "1" "$(grep -c '  debian-.*/fotomill_1.2.3-1_all.deb$' "$release/SHA256SUMS")"
checked=$(cd "$release" && sha256sum -c --quiet SHA256SUMS >/dev/null 2>&1; echo $?)
Expect "checksums" "0" "$checked"
first=$(grep tar.xz "$release/SHA256SUMS")
touch "$project/src/a b.cpp"
Expect "the same source again" "$first" \
  "$(Release --no-check >/dev/null; grep tar.xz "$release/SHA256SUMS")"

# The packages' build dependencies are those of packages.txt.
Expect "groups" "*g++*cmake*libtiff-dev*" "$(root=$root PackagesOf build cli | tr '\n' ' ')"
Expect "a place for them" "1" \
  "$(grep -c '^Build-Depends: .*@BUILD_PACKAGES@$' "$root/packaging/deb/debian/control")"
exit $((failures > 0))
