# shellcheck shell=bash
# The Debian packages that the verbs of ./dev need, and how they come onto the machine.

# shellcheck disable=SC2034  # used by ./dev
{
  PACKAGES_BUILD=(g++ cmake ninja-build ccache libgtest-dev libgmock-dev libxml2-dev)
  PACKAGES_MEDIAHOST=(ffmpeg libavformat-dev libavcodec-dev libswscale-dev libswresample-dev
    libsdl2-dev libcli11-dev zlib1g-dev pkg-config)
  PACKAGES_CLANG=(clang-19 libclang-rt-19-dev llvm-19)
  PACKAGES_WINDOWS=(g++-mingw-w64-x86-64-posix googletest libcli11-dev libz-mingw-w64-dev wine64)
  PACKAGES_BENCH=(libbenchmark-dev pkg-config python3 libabsl-dev libace-dev libboost-dev
    libboost-thread-dev libconcurrentqueue-dev libglib2.0-dev libpoco-dev libpugixml-dev libtbb-dev
    libxml2-dev qt6-base-dev)
  PACKAGES_DOCS=(doxygen graphviz python3)
  PACKAGES_CHECK=(clang-format-19 clang-tidy-19 pkg-config python3 shellcheck)
}

say() { printf '== %s\n' "$*"; }

fail() {
  printf 'dev: %s\n' "$*" >&2
  exit 1
}

# Those of the given packages that are not installed.
missing_packages() {
  local installed
  installed=$(dpkg-query -W -f '${Package} ${db:Status-Status}\n' "$@" 2>/dev/null || true)
  for package in "$@"; do
    grep -qx "$package installed" <<<"$installed" || echo "$package"
  done
}

as_root() {
  if [ "$(id -u)" = 0 ]; then
    "$@"
  else
    sudo "$@"
  fi
}

install_packages() {
  as_root env DEBIAN_FRONTEND=noninteractive apt-get install -y -q --no-install-recommends "$@" \
    </dev/null
}

# Makes sure that the given packages are installed; does nothing when they are.
need() {
  command -v apt-get >/dev/null || {
    say "no apt-get here: what this verb needs (in Debian's names: $*) must be there already"
    return
  }
  local missing
  mapfile -t missing < <(missing_packages "$@")
  [ ${#missing[@]} -gt 0 ] || return 0
  [ "$(id -u)" = 0 ] || command -v sudo >/dev/null ||
    fail "not root and no sudo; let root run: apt-get install ${missing[*]}"
  say "installing ${missing[*]}"
  mkdir -p build/logs
  local log=build/logs/install.txt
  install_packages "${missing[@]}" >"$log" 2>&1 && return
  # An unknown or outdated package: the lists may be missing or old.
  as_root apt-get update -q >>"$log" 2>&1 </dev/null || true
  install_packages "${missing[@]}" >>"$log" 2>&1 && return
  tail -n 20 "$log" >&2
  fail "apt-get could not install: ${missing[*]} (no network, or no rights? see $log)"
}
