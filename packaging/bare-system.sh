# A bare Debian in a chroot, for try-release and deb/try: created once by debootstrap in build/releases/RELEASE/bare, and
# copied to `used` for each run. Source it in bash as root with `root` and `release` set, after prepare.sh.
#
# MIRROR overrides the Debian mirror from this system's apt sources. Downloaded packages are kept for the next run. `cache`
# is a ccache folder for compiling in the chroot, optional.

((EUID == 0)) || Fail "a system in a folder is made and entered by root only"
folder=$root/build/releases/$release
bare=$folder/bare used=$folder/used packages=$folder/packages cache=${cache:-}

Mirror() {
  apt-get indextargets --format '$(ORIGIN) $(REPO_URI)' 'Created-By: Packages' |
    sed -n '/security/d; s/^Debian //p' | head -n 1
}

MakeBare() {
  local mirror=${MIRROR:-$(Mirror)}
  [[ -n $mirror ]] || Fail "this system's apt sources name no Debian mirror; say MIRROR=URL"
  Say "making a bare $release"
  rm -rf "$bare.new"
  PATH=$PATH:/usr/sbin:/sbin debootstrap --variant=minbase "$release" "$bare.new" "$mirror" >"$folder/bare.log" 2>&1 || {
    tail -n 5 "$folder/bare.log" >&2
    Fail "could not make a bare $release ($folder/bare.log)"
  }
  mv "$bare.new" "$bare"
}

# Makes a fresh copy of the bare system, creating that first if needed. One run at a time.
FreshCopy() {
  EnsurePackages release
  mkdir -p "$packages"
  exec 8>"$folder/.lock"
  flock 8
  [[ -d $bare ]] || MakeBare
  rm -rf "$used"
  cp -a "$bare" "$used"
  cp "$(readlink -f /etc/resolv.conf)" "$used/etc/resolv.conf"
}

# The same with this tree in /tree: files tracked by git, including uncommitted changes.
FreshCopyWithTree() {
  FreshCopy
  mkdir "$used/tree"
  CopyTree "$root" "$used/tree"
}

# Inside COMMAND: runs it in the chroot, in /tree if it exists, else in /; unmounts everything afterwards.
Inside() {
  # shellcheck disable=SC2016
  unshare --mount --pid --fork --kill-child bash -c '
    mount -t proc proc "$1/proc" && mount --rbind /dev "$1/dev" && mount --bind "$2" "$1/var/cache/apt/archives" || exit 125
    [[ -z $4 ]] || { mkdir -p "$1/var/cache/ccache" && mount --bind "$4" "$1/var/cache/ccache"; } || exit 125
    exec chroot "$1" /usr/bin/env -i PATH=/usr/sbin:/usr/bin:/sbin:/bin HOME=/root TERM="${TERM:-dumb}" \
      ${4:+CCACHE_DIR=/var/cache/ccache} ${SOURCE_DATE_EPOCH:+SOURCE_DATE_EPOCH=$SOURCE_DATE_EPOCH} \
      bash -c "[ ! -d /tree ] || cd /tree; $3"' inside "$used" "$packages" "$1" "$cache"
}

# Timed WANTED COMMAND: prints the elapsed time; fails if the exit status is not WANTED.
Timed() {
  local begin=$SECONDS status
  Inside "$2"
  status=$?
  Say "$release: $2: $((SECONDS - begin)) s, exit status $status"
  ((status == $1))
}
