#!/bin/bash
# Completes command lines with the script that the program prints for bash; zsh runs the same one.
# The script for fish is read by fish where there is one.
set -u
faults=0
source <("$FOTOMILL" completion bash) || exit 1

# complete WORD... EXPECTED: the last word but one is being typed.
check() {
  local expected=${*: -1}
  COMP_WORDS=("${@:1:$#-1}")
  COMP_CWORD=$(($# - 2))
  _fotomill
  [[ "${COMPREPLY[*]-}" == "$expected" ]] && return
  echo "${COMP_WORDS[*]}: expected \"$expected\", found \"${COMPREPLY[*]-}\""
  faults=1
}

folder=$(mktemp -d)
trap 'rm -r "$folder"' EXIT
cd "$folder" || exit 1
touch "two words.bmp"
check fotomill conv "convert"
check fotomill --color never conv "convert"
check fotomill config g "get"
check fotomill config list --ch "--changed"
check fotomill convert x.bmp --overwrite k "keep-both"
check fotomill convert x.bmp -t pcx "pcx"
check fotomill help inf "info"
check fotomill info tw "two words.bmp"
check fotomill --vers "--version"
check fotomill completion b "bash"

if command -v fish > /dev/null; then
  found=$(fish --no-config -c 'source (eval $FOTOMILL completion fish | psub); complete -C "fotomill config g"' 2>&1)
  [[ "$found" == get* ]] || { echo "fish: $found"; faults=1; }
fi
exit $faults
