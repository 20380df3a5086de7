#!/usr/bin/env bash
# ./fotomill and ./check in a small project: what is built when, standard output, test counts.
set -u
project=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd -P)
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
unset FOTOMILL FOTOMILL_CORPUS

failures=0
Expect() {  # Expect NAME WANTED FOUND: FOUND matches the pattern WANTED
  # shellcheck disable=SC2053
  [[ $3 == $2 ]] || {
    printf '%s: expected "%s", found "%s"\n' "$1" "$2" "$3"
    failures=$((failures + 1))
  }
}

tree="$work/a tree"
mkdir -p "$tree"/{packaging,src,tests/house,tests/cli}
cp "$project"/{fotomill,check} "$tree"
cp "$project"/packaging/prepare.sh "$tree/packaging"
printf '[build]\nbash # there on every system\n[cli]\n[test]\n' >"$tree/packages.txt"
cat >"$tree/CMakePresets.json" <<'JSON'
{ "version": 6, "configurePresets": [
  { "name": "release", "generator": "Ninja", "binaryDir": "${sourceDir}/build/release" },
  { "name": "asan", "generator": "Ninja", "binaryDir": "${sourceDir}/build/asan" } ] }
JSON
cat >"$tree/CMakeLists.txt" <<'CMAKE'
cmake_minimum_required(VERSION 3.25)
project(small LANGUAGES C)
message(STATUS "chatter")
add_executable(fotomill src/main.c)
if(EXISTS ${CMAKE_SOURCE_DIR}/src/desktop)
  add_executable(fotomill-desktop src/main.c)
endif()
add_custom_target(test_support)
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/tests)
file(GLOB cases CONFIGURE_DEPENDS tests/*.c)
foreach(case IN LISTS cases)
  get_filename_component(name ${case} NAME_WE)
  add_executable(test_${name} ${case})
endforeach()
CMAKE
Program() {  # Program TEXT: prints TEXT, its arguments and its standard input
  cat >"$tree/src/main.c" <<C
#include <stdio.h>
int main(int n, char** v) { printf("$1"); for (int i = 1; i < n; ++i) printf(" %s", v[i]);
  for (int c; (c = getchar()) != EOF;) putchar(c); return n; }
C
}
Case() {  # Case NAME STATEMENTS: a test program
  printf '#include <%s.h>\n' stdio stdlib >"$tree/tests/$1.c"
  printf 'int main(void) { setbuf(stdout, 0); %s return 0; }\n' "$2" >>"$tree/tests/$1.c"
}

# The launcher.
Program one
mkdir "$work/elsewhere" && cd "$work/elsewhere" || exit 1
Expect "first run, arguments, input, status" "one a b c -in- 3" \
  "$("../a tree/fotomill" a 'b c' <<<' -in-' 2>/dev/null) $?"
Expect "standard output holds results only" "" "$("$tree/fotomill" 2>&1 >/dev/null </dev/null)"
ln -s "$tree/fotomill" link
Expect "through a link" "one x" "$(./link x </dev/null 2>&1)"
PATH=/usr/bin:/bin
mkdir "$work/bin" && printf '#!/bin/sh\necho called >&2\nexit 1\n' |
  tee "$work/bin/ninja" "$work/bin/cmake" >"$work/bin/dpkg-query"
chmod +x "$work"/bin/*
Expect "up to date: no tool is called" "one" \
  "$(PATH=$work/bin:$PATH "$tree/fotomill" </dev/null 2>&1)"
sleep 0.01 && Program two
Expect "a changed source" "two" "$("$tree/fotomill" </dev/null 2>/dev/null)"
printf 'int broken(\n' >>"$tree/src/main.c"
Expect "a source that does not compile" "*main.c*error*1" \
  "$("$tree/fotomill" </dev/null 2>&1; echo $?)"
Program three
Run() { "$tree/fotomill" </dev/null 2>/dev/null; }
Expect "two at a time" "three three" "$(echo $(Run & Run; wait; echo) |
  sed 's/threethree/three three/')"
mv "$tree" "$work/moved" && tree=$work/moved
Expect "a tree that was moved" "three" "$("$tree/fotomill" </dev/null 2>/dev/null)"
Expect "no desktop program yet: a command like others" "three desktop X" \
  "$("$tree/fotomill" desktop X </dev/null 2>/dev/null)"
mkdir "$tree/src/desktop"
Expect "the desktop program, once it is there" "three X" \
  "$("$tree/fotomill" desktop X </dev/null 2>/dev/null)"
printf '[build]\nno-such-package-anywhere\n[cli]\n' >"$tree/packages.txt"
for tool in apt-get sudo; do printf '#!/bin/sh\nexit 1\n' >"$work/bin/$tool"; done
chmod +x "$work"/bin/* && rm "$work"/bin/{ninja,cmake,dpkg-query}
Expect "a package that cannot be had" "*as root run:*no-such-package-anywhere*1" \
  "$(PATH=$work/bin:$PATH "$tree/fotomill" </dev/null 2>&1; echo $?)"
printf '[build]\nno-such-package | bash\nno-such-package | nor-this\n[cli]\n' >"$tree/packages.txt"
Expect "alternatives, one of them there" \
  "*satisfy --no-install-recommends 'no-such-package | nor-this'*1" \
  "$(PATH=$work/bin:$PATH "$tree/fotomill" </dev/null 2>&1; echo $?)"
printf '[build]\nbash\n[cli]\n[test]\n' >"$tree/packages.txt"

# The check.
Check() {
  (cd / && "$tree/check" "$@" 2>"$work/log" | tail -n 1; echo "${PIPESTATUS[0]}") | tr '\n' ' '
}
Case good 'puts("[       OK ] A.a (0 ms)"); puts("noise[       OK ] A.b (1 ms)");
puts("[  SKIPPED ] A.c (0 ms)");'
printf '#!/bin/sh\ntest -x "$FOTOMILL"\n' >"$tree/tests/cli/some_test.sh"
printf '#!/bin/sh\nexit 77\n' >"$tree/tests/cli/left_test.sh"
printf '#!/bin/sh\nexit 0\n' >"$tree/tests/house/order_test.sh"
chmod +x "$tree"/tests/*/*.sh
Expect "both builds and the house" "7 passed, 0 failed 0 " "$(Check)"
Expect "fast" "4 passed, 0 failed 0 " "$(Check --fast)"
Case bad 'puts("[       OK ] A.a (0 ms)"); puts("[  FAILED  ] A.b (3 ms)");
puts("[  FAILED  ] A.b"); exit(1);'
Case crash 'puts("[       OK ] A.a (0 ms)"); abort();'
Case empty 'puts("[  PASSED  ] 0 tests.");'
Expect "a failed case, a crash, no case at all" "6 passed, 3 failed 1 " "$(Check --fast)"
Expect "the failures are named" "*test_bad*test_crash*test_empty*" "$(<"$work/log")"
rm "$tree"/tests/{bad,crash,empty}.c
printf '#!/bin/sh\nexit 3\n' >"$tree/tests/house/order_test.sh"
Expect "a failed script" "3 passed, 1 failed 1 " "$(Check --fast)"
Expect "an unknown option" "2 " "$(Check --quick)"

exit $((failures > 0))
