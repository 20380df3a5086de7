#!/bin/bash
# Completes command lines with the scripts printed by the program: bash here, zsh and fish if
# installed.
set -u
faults=0
source <("$FOTOMILL" completion bash) || exit 1

# complete WORD... EXPECTED: completes the last word before EXPECTED.
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
check fotomill help exit "exit-status"
check fotomill exit ""
check fotomill info tw "two words.bmp"
check fotomill --vers "--version"
check fotomill completion b "bash"

check fotomill config describe UndoL "UndoLevels"
check fotomill config set ThumbnailMat "ThumbnailMatte"
check fotomill --set UndoL "UndoLevels="
check fotomill --color = al "always"
check fotomill turn x.bmp --rotate l "left"
check fotomill operations sharp "sharpen"
check fotomill completion p "powershell"
check fotomill help config des "describe"
check fotomill convert --jobs 4 ""
check fotomill info --js "--json"
COMP_TYPE=63
check fotomill config un "unset"
COMP_WORDS=(fotomill config "") COMP_CWORD=2 COLUMNS=60
_fotomill
[[ "${COMPREPLY[*]}" == *"describe                 (explain keys"* ]] ||
  { echo "bash shows no descriptions: ${COMPREPLY[*]}"; faults=1; }
unset COMP_TYPE

# The same with zsh and fish, if installed.
if command -v zsh > /dev/null; then
  "$FOTOMILL" completion zsh > "$folder/_fotomill"
  zshWords() { # WORD...: what _describe is given, or *files
    zsh -f -c '
      compdef() { :; }; compset() { :; }; _files() { print "*files"; }
      _describe() { print -rl -- "${(@P)4}"; }
      source '"$folder"'/_fotomill
      words=("$@"); CURRENT=$#; _fotomill' zsh "$@"
  }
  zshCheck() {
    local expected=${*: -1} found
    found=$(zshWords "${@:1:$#-1}" 2>&1)
    grep -qF -- "$expected" <<< "$found" && return
    echo "zsh, ${*:1:$#-1}: \"$expected\" is not in \"${found:0:300}\""
    faults=1
  }
  zshCheck fotomill "" "convert:convert pictures to another format"
  zshCheck fotomill help "" "json:what --json prints"
  zshCheck fotomill config "" "unset:reset a key to its default"
  zshCheck fotomill --color never config get "" "UndoLevels:How many file operations"
  zshCheck fotomill config get "" "SecureDelete:unused in this build"
  zshCheck fotomill --set "" "UndoLevels=:How many"
  zshCheck fotomill convert --overwrite "" "keep-both:"
  zshCheck fotomill convert --overwrite= "keep-both:"
  zshCheck fotomill convert -t "" "png:(PNG)"
  zshCheck fotomill convert -- "--quality:"
  zshCheck fotomill convert "" "*files"
fi

if command -v fish > /dev/null; then
  "$FOTOMILL" completion fish > "$folder/fotomill.fish"
  fishCheck() { # LINE EXPECTED
    local found
    found=$(fish --no-config -c "source $folder/fotomill.fish; complete -C '$1'" 2>&1)
    grep -qF -- "$2" <<< "$found" && return
    echo "fish, $1: \"$2\" is not in \"${found:0:300}\""
    faults=1
  }
  fishCheck "fotomill config g" "get	print the values of keys"
  fishCheck "fotomill --color never config get UndoL" "UndoLevels	How many file operations"
  fishCheck "fotomill --set UndoL" "UndoLevels="
  fishCheck "fotomill help js" "json	what --json prints"
  fishCheck "fotomill convert --overwrite k" "keep-both"
  fishCheck "fotomill convert --overwrite=k" "keep-both"
  fishCheck "fotomill convert --js" "--json	Print a JSON array"
  fishCheck "fotomill convert --json two" "two words.bmp"
  fishCheck "fotomill completion z" "zsh"
fi

# The lists in the PowerShell script, which is rarely installed to run it: balanced, quotes doubled.
"$FOTOMILL" completion powershell > "$folder/fotomill.ps1"
python3 - "$folder/fotomill.ps1" << 'END' || faults=1
import re, sys
text = open(sys.argv[1], encoding="utf-8").read()
bare = re.sub(r"'(?:[^']|'')*'", "''", text)
entries = re.findall(r"^    '((?:[^']|'')*)' = ", text, re.M)
wrong = [name for name, bad in [
    ("quotes", "'" in bare.replace("''", "")), ("brackets", any(bare.count(a) != bare.count(b) for a, b in ("()", "{}", "[]"))),
    ("places that differ in case only", len({entry.lower() for entry in entries}) != len(entries)),
    ("commands", "second:config" not in entries or "argument:convert" not in entries)] if bad]
if wrong:
    sys.exit("PowerShell: " + ", ".join(wrong))
END
if command -v pwsh > /dev/null; then
  matches="(TabExpansion2 'fotomill config g' 17).CompletionMatches.CompletionText"
  found=$(pwsh -NoProfile -Command ". $folder/fotomill.ps1; $matches")
  [[ "$found" == get ]] || { echo "PowerShell: $found"; faults=1; }
fi
exit $faults
