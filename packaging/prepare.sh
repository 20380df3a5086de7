# Installs the packages of packages.txt and builds presets, for ./fotomill, ./check and fuzz/run. Source it in bash with
# `root` set to the project folder. Messages go to standard error, logs to build/.

Say() { printf '%s: %s\n' "${0##*/}" "$*" >&2; }
Fail() {
  Say "$*"
  exit 1
}

# The version from CMakeLists.txt.
ProjectVersion() { sed -nE 's/^project\(fotomill VERSION ([0-9.]+).*/\1/p' "$root/CMakeLists.txt"; }

# CopyTree FROM TO: copies files tracked by git, including uncommitted changes; without git, everything but build/.
CopyTree() {
  if git -C "$1" rev-parse --is-inside-work-tree >/dev/null 2>&1; then
    git -C "$1" ls-files -z --cached --others --exclude-standard |
      (cd "$1" && while IFS= read -r -d '' file; do [[ -e $file || -L $file ]] && printf '%s\0' "$file"; done)
  else
    (cd "$1" && find . -path ./build -prune -o \( -type f -o -type l \) -printf '%P\0')
  fi | tar -C "$1" --null -T - -cf - | tar -C "$2" --no-same-owner -xf -
}

# ArchiveTree FOLDER NAME FILE: packs FOLDER/NAME into a reproducible archive, dated SOURCE_DATE_EPOCH.
ArchiveTree() {
  tar -C "$1" --sort=name --mtime="@$SOURCE_DATE_EPOCH" --owner=0 --group=0 --numeric-owner --mode=u+rw,go=u-w \
    --format=gnu -cf - "$2" | xz -6 -T1 >"$3"
}

# Prints the packages of the given groups, one per line; alternatives as a|b.
PackagesOf() {
  local line group='' wanted=" $* "
  while read -r line || [[ -n $line ]]; do
    line=${line%%#*}
    line=${line//[[:space:]]/}
    case $line in
      '') ;;
      '['*']') group=${line:1:-1} ;;
      *) [[ $wanted == *" $group "* ]] && echo "$line" ;;
    esac
  done <"$root/packages.txt"
}

# Prints missing packages of the given groups; of alternatives, one is enough.
MissingPackages() {
  local line installed
  local -a lines names
  mapfile -t lines < <(PackagesOf "$@")
  mapfile -t names < <(printf '%s\n' "${lines[@]//|/$'\n'}")
  installed=$(dpkg-query -W -f '${Package} ${db:Status-Status}\n' "${names[@]}" 2>/dev/null | sed -n 's/ installed$//p')
  for line in "${lines[@]}"; do
    grep -qxF "${line//|/$'\n'}" <<<"$installed" || echo "$line"
  done
}

# Installs the missing packages of the given groups. If there are none, it only calls dpkg-query.
EnsurePackages() {
  local -a missing apt
  local wanted
  if ! command -v dpkg-query >/dev/null; then
    Say "not a Debian or Ubuntu system; install the equivalents of:" $(PackagesOf "$@")
    return 0
  fi
  mapfile -t missing < <(MissingPackages "$@")
  ((${#missing[@]} > 0)) || return 0
  printf -v wanted '%s, ' "${missing[@]//|/ | }"
  wanted=${wanted%, }

  # dpkg needs the sbin folders, which a plain `su` leaves out of PATH.
  apt=(env "PATH=$PATH:/usr/local/sbin:/usr/sbin:/sbin" DEBIAN_FRONTEND=noninteractive
       apt-get -qq -y -o DPkg::Lock::Timeout=300 -o Dpkg::Use-Pty=0)
  if ((EUID != 0)); then
    command -v sudo >/dev/null || Fail "missing packages, and no sudo to install them; as root run:" \
      "apt-get satisfy --no-install-recommends '$wanted'"
    apt=(sudo "${apt[@]}")
  fi
  Say "installing ${missing[*]}"
  mkdir -p "$root/build"
  # Try the existing package lists first; update them only if that fails.
  if ! "${apt[@]}" satisfy --no-install-recommends "$wanted" >"$root/build/packages.log" 2>&1; then
    "${apt[@]}" update >>"$root/build/packages.log" 2>&1 &&
      "${apt[@]}" satisfy --no-install-recommends "$wanted" >>"$root/build/packages.log" 2>&1 || {
      tail -n 5 "$root/build/packages.log" >&2
      Fail "could not install packages (build/packages.log); as root run:" \
        "apt-get satisfy --no-install-recommends '$wanted'"
    }
  fi
  packagesChanged=1
}

# Allows only one build at a time in this tree, until the script ends or ReleaseBuildLock is called.
TakeBuildLock() {
  mkdir -p "$root/build" 2>/dev/null && exec 9>"$root/build/.lock" || Fail "cannot write to $root/build"
  flock -n 9 || {
    Say "waiting for another build of this tree"
    flock 9
  }
}
ReleaseBuildLock() { exec 9>&-; }

# Configure PRESET TARGET: skipped if the build already has the target and no packages were installed. A moved or copied
# tree is configured from scratch.
Configure() {
  local folder=$root/build/$1 cache=$root/build/$1/CMakeCache.txt
  local -a fresh=()
  if [[ -f $cache ]] && ! grep -qxF "CMAKE_HOME_DIRECTORY:INTERNAL=$root" "$cache"; then
    fresh=(--fresh)
  elif [[ -z ${packagesChanged:-} ]] && grep -qs "^build $2:" "$folder/build.ninja"; then
    return 0
  fi
  mkdir -p "$folder"
  (cd "$root" && cmake "${fresh[@]}" --preset "$1") >"$folder/configure.log" 2>&1 || {
    tail -n 20 "$folder/configure.log" >&2
    Fail "configuring build/$1 failed (build/$1/configure.log)"
  }
}

# Uses ccache's default folder or CCACHE_DIR; if that is not writable, build/ccache.
ChooseCache() {
  local folder
  [[ -z ${CCACHE_DIR:-} ]] && folder=$(ccache --get-config cache_dir 2>/dev/null) || return 0
  mkdir -p "$folder" 2>/dev/null && [[ -w $folder ]] || export CCACHE_DIR=$root/build/ccache
}

# Build PRESET [TARGET...]: shows errors; the full output is in the preset's build.log. Shows progress on a terminal.
Build() {
  local folder=$root/build/$1 line
  ChooseCache
  (shift; exec ninja -C "$folder" "$@") 2>&1 9>&- | tee "$folder/build.log" | while read -r line; do
    [[ -t 2 && $line == '['* ]] && printf '\r%s \r' "${line%%]*}]" >&2
  done
  if ((PIPESTATUS[0] != 0)); then
    grep -aE -A 3 'error|FAILED|undefined reference' "$folder/build.log" | head -n 40 >&2
    Fail "building build/$1 failed (build/$1/build.log)"
  fi
}
