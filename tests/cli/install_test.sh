#!/usr/bin/env bash
# An installed tree is complete and works on its own: programs, man pages, completions, plug-ins;
# and uninstalling removes exactly that.
set -u
project=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd -P)
build=${FOTOMILL%/fotomill}
[[ -f $build/cmake_install.cmake && -f $build/plugin/FMWPL_pnm.so ]] || exit 77
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
prefix=$work/prefix
export FOTOMILL_DATA=$work/data HOME=$work
failures=0
Expect() {  # Expect NAME WANTED FOUND
  [[ $3 == $2 ]] || {  # shellcheck disable=SC2053
    printf '%s: expected "%s", found "%s"\n' "$1" "$2" "$3"
    failures=$((failures + 1))
  }
}

components=(cli plugins)
[[ ! -x $build/fotomill-desktop ]] || components+=(desktop)
for component in "${components[@]}"; do
  cmake --install "$build" --prefix "$prefix" --component "$component" >"$work/log" 2>&1 || {
    cat "$work/log"
    exit 1
  }
done

# The program without its build tree.
Expect "German is found" "*Befehle:*" \
  "$(LANGUAGE=de LC_ALL=C.UTF-8 "$prefix/bin/fotomill" --lang de help)"
printf 'P6\n2 1\n255\n\1\2\3\4\5\6' >"$work/a.ppm"
Expect "the plug-in is found" "0" \
  "$("$prefix/bin/fotomill" convert "$work/a.ppm" --to bmp >/dev/null 2>&1; echo $?)"
Expect "what it wrote" "2x1" "$("$prefix/bin/fotomill" info --json "$work/a.bmp" |
  python3 -c 'import json,sys
p = json.load(sys.stdin)[0]
print("%dx%d" % (p["width"], p["height"]))')"

# Every command has a man page, and groff reports no warnings.
commands=$("$prefix/bin/fotomill" help | sed -nE '/^Commands/,/^$/ s/^  ([a-z -]+[a-z])  .*/\1/p' |
  grep -vx help | tr ' ' '-' | sort)
Expect "a page a command" "$commands" \
  "$(ls "$prefix/share/man/man1" | sed -nE 's/^fotomill-(.*)\.1$/\1/p' | grep -vx desktop | sort)"
Expect "the main page" "*.SH \"COMMANDS\"*convert*" "$(<"$prefix/share/man/man1/fotomill.1")"
if command -v groff >/dev/null; then
  Expect "pages are clean" "" "$(groff -man -Tutf8 -ww -z "$prefix"/share/man/man1/*.1 2>&1)"
fi
for file in bash-completion/completions/fotomill zsh/site-functions/_fotomill \
  fish/vendor_completions.d/fotomill.fish; do
  Expect "$file" "*convert*" "$(<"$prefix/share/$file")"
done

# Errors and warnings but one: the program has no web page.
AppStreamProblems() {
  local file=$prefix/share/metainfo/org.fotomill.Fotomill.metainfo.xml
  appstreamcli validate --no-net "$file" >"$work/log" 2>&1
  grep -q 'alidation' "$work/log" || cat "$work/log"
  grep -E '^ *[EW]: ' "$work/log" | grep -v 'url-homepage-missing$'
}

if [[ -x $prefix/bin/fotomill-desktop ]]; then
  for file in man/man1/fotomill-desktop.1 applications/fotomill-desktop.desktop \
    icons/hicolor/scalable/apps/fotomill-desktop.svg mime/packages/fotomill-formats.xml \
    thumbnailers/fotomill.thumbnailer metainfo/org.fotomill.Fotomill.metainfo.xml; do
    Expect "$file" "yes" "$([[ -s $prefix/share/$file ]] && echo yes)"
  done
  ! command -v desktop-file-validate >/dev/null ||
    Expect "desktop entry" "" \
      "$(desktop-file-validate "$prefix/share/applications/fotomill-desktop.desktop")"
  ! command -v appstreamcli >/dev/null || Expect "AppStream" "" "$(AppStreamProblems)"
fi

# Uninstalling removes our files and keeps others.
mkdir -p "$prefix/share/fotomill"
for component in "${components[@]}"; do
  sed -e '$a\' "$build/install_manifest_$component.txt"
done | sort -u >"$prefix/share/fotomill/installed-files"
echo /etc/hostname >>"$prefix/share/fotomill/installed-files"
if [[ -x $prefix/bin/fotomill-desktop ]]; then  # what the desktop's tools make of our files
  mkdir -p "$prefix/share/mime/image"
  touch "$prefix/share/mime/"{globs,mime.cache,image/x-macpaint.xml} \
    "$prefix/share/applications/mimeinfo.cache" "$prefix/share/icons/hicolor/icon-theme.cache"
fi
touch "$prefix/share/man/man1/other.1" "$work/outside"
echo "$prefix/../outside" >>"$prefix/share/fotomill/installed-files"
"$project/packaging/install" uninstall --prefix "$prefix" 2>/dev/null
Expect "uninstalled" "share/man/man1/other.1" "$(cd "$prefix" && find . -type f -printf '%P\n')"
Expect "folders that are ours go" "no" "$([[ -e $prefix/share/mime ]] && echo yes || echo no)"
Expect "files outside stay" "yes" "$([[ -f $work/outside ]] && echo yes)"
Expect "twice" "1" \
  "$("$project/packaging/install" uninstall --prefix "$prefix" 2>/dev/null; echo $?)"
exit $((failures > 0))
