# Shared by the scripts of this folder: where the tree is, and how missing packages are installed.
# To be sourced.

set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
i386Root=$root/.deps/i386

say() { printf '==> %s\n' "$*"; }
die() {
  printf 'error: %s\n' "$*" >&2
  exit 1
}

asRoot() {
  if [ "$(id -u)" = 0 ]; then "$@"; else sudo "$@"; fi
}

installed() { [ "$(dpkg-query -W -f='${db:Status-Status}' "$1" 2>/dev/null)" = installed ]; }

# The files of the tree, in an unpacked archive too.
treeFiles() {
  if [ -e "$root/.git" ] && command -v git >/dev/null; then
    git -C "$root" ls-files "$@"
  else
    local names=() pattern
    for pattern in "$@"; do names+=(-o -name "$pattern"); done
    (cd "$root" && find -- * \( -path build -prune \) -o -type f \( "${names[@]:1}" \) -print) | sort
  fi
}

# Of the lines that match a pattern, lets one through every 15 seconds, so that a long job shows that it
# lives; of the others, those that do not match the second pattern.
heartbeat() {
  local often=$1 never=${2:-^$} last=-15 line
  while IFS= read -r line; do
    if [[ $line =~ $often ]]; then
      ((SECONDS - last >= 15)) || continue
      last=$SECONDS
    elif [[ $line =~ $never ]]; then
      continue
    fi
    printf '%s\n' "$line"
  done
}

# Installs those of the named Debian packages that are missing, and waits for another package manager
# that is at work. An index that is partly out of reach may still be good enough, so only the packages
# decide.
needPackages() {
  local missing=() package
  for package in "$@"; do installed "$package" || missing+=("$package"); done
  [ ${#missing[@]} = 0 ] && return
  say "installing ${missing[*]}"
  asRoot apt-get -o DPkg::Lock::Timeout=600 update -qq || true
  asRoot env DEBIAN_FRONTEND=noninteractive apt-get -o DPkg::Lock::Timeout=600 \
    install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
  for package in "${missing[@]}"; do installed "$package" || die "package $package did not install"; done
}

# Unpacks those libraries of the i386 architecture that have no 64-bit package for 32-bit programs
# into the private folder .deps/i386, without touching the system's packages.
needI386Libraries() {
  local packages=(libpng16-16 libpng-dev libgtest-dev libbenchmark-dev libbenchmark1debian
    libxcb1 libxcb1-dev libxau6 libxdmcp6 libbsd0 libmd0
    libxcb-shm0 libxcb-shm0-dev libxcb-xfixes0 libxcb-xfixes0-dev
    libxcb-damage0 libxcb-damage0-dev libxcb-xinput0 libxcb-xinput-dev
    libxcb-xtest0 libxcb-xtest0-dev libxcb-keysyms1 libxcb-keysyms1-dev
    libxcb-render0 libxcb-render0-dev libxcb-shape0 libxcb-shape0-dev)
  [ "$(cat "$i386Root/complete" 2>/dev/null)" = "${packages[*]}" ] && return
  local work=$root/.deps/i386-packages
  local apt=(apt-get -o "Dir::State=$work/state" -o Dir::State::status=/dev/null
    -o "Dir::Cache=$work/cache" -o APT::Architecture=i386 -o APT::Architectures=i386
    -o APT::Sandbox::User=root)
  say "fetching the 32-bit libraries into .deps/i386"
  mkdir -p "$work/state/lists/partial" "$work/cache/archives/partial" "$i386Root"
  "${apt[@]}" update -qq >/dev/null 2>&1 || true
  (cd "$work" && "${apt[@]}" download -qq "${packages[@]}" >/dev/null)
  local file
  for file in "$work"/*.deb; do dpkg -x "$file" "$i386Root"; done
  rm -rf "$work"
  echo "${packages[*]}" >"$i386Root/complete"
}

needBuildTools() {
  needPackages g++ cmake ninja-build doxygen help2man pkg-config libpng-dev libhwy-dev libgtest-dev \
    libbenchmark-dev libcli11-dev libxcb1-dev libxcb-shm0-dev libxcb-xfixes0-dev libxcb-render0-dev \
    libxcb-damage0-dev libxcb-xinput-dev libxcb-xtest0-dev libxcb-keysyms1-dev zlib1g-dev
  case $1 in
    i386*)
      needPackages g++-multilib lib32z1-dev
      needI386Libraries
      ;;
  esac
}

# What the tests compare with and draw on; a test says so when one of them is not there. Some programs of
# netpbm are Perl scripts, which it does not depend on.
needTestPackages() {
  needPackages xvfb pngcheck netpbm perl imagemagick x11-apps x11-xserver-utils xterm xfonts-base ffmpeg \
    x11vnc gvncviewer tigervnc-viewer xtightvncviewer libpixman-1-dev libswscale-dev libavutil-dev \
    libsdl2-dev libcairo2-dev man-db python3
}

# Configures (once) and builds a preset; further arguments are targets.
buildPreset() {
  local preset=$1
  shift
  needBuildTools "$preset"
  cd "$root"
  [ -e "build/$preset/build.ninja" ] || cmake --preset "$preset" >/dev/null
  cmake --build --preset "$preset" ${1:+--target "$@"}
}
