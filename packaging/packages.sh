# SPDX-License-Identifier: Apache-2.0
# The lists are used, and $top is set, by the scripts that source this.
# shellcheck shell=bash disable=SC2034,SC2154
# The Debian 12 packages that each purpose needs, and the one way to install what is missing. Sourced by run and test.

packages_build="g++ cmake ninja-build pkg-config ccache mold libcli11-dev libtomlplusplus-dev libncurses-dev \
qt6-base-dev qt6-base-dev-tools qt6-declarative-dev qt6-declarative-dev-tools libgl-dev libxkbcommon-dev"
# QML modules are loaded by name at run time, so no library pulls them in. Fonts: digits need one.
packages_window="qml6-module-qtqml qml6-module-qtqml-models qml6-module-qtqml-workerscript qml6-module-qtquick \
qml6-module-qtquick-controls qml6-module-qtquick-layouts qml6-module-qtquick-templates qml6-module-qtquick-window \
qt6-wayland fonts-dejavu-core"
packages_test="libgtest-dev libgmock-dev libprotobuf-dev protobuf-compiler nlohmann-json3-dev python3 locales tzdata dbus"
# What holds the tree against its rules. Each version of clang-format formats a little differently, so it is named.
packages_rules="clang-format-14 shellcheck python3-flake8"
# A compiler and an emulator for the processor of most phones, and the test library as sources.
packages_arm64="g++-aarch64-linux-gnu qemu-user googletest"
packages_coverage="gcovr"
packages_deep="$packages_arm64 clang clang-tidy-14 libclang-rt-14-dev valgrind"
# The peers that the benchmarks measure against, and what counts their instructions (its header comes with it).
packages_bench="libprotozero-dev nanopb libnanopb-dev libprotobuf-dev protobuf-compiler valgrind"

# A line on standard output. A reader that has gone away has seen enough: then the script ends, with status_unread.
status_unread=141
say() { printf '%s\n' "$*" 2>/dev/null || exit "$status_unread"; }

# Reads the output of something long. On a terminal the last line shows, rewritten in place and wiped at the end; else
# nothing does.
show_progress() {
  local line width
  if [ ! -t 2 ]; then
    cat >/dev/null
    return 0
  fi
  width=$(stty size <&2 2>/dev/null | cut -d ' ' -f 2) || true
  if [ "${width:-0}" -lt 20 ]; then width=80; fi
  while IFS= read -r line || [ -n "$line" ]; do
    line=${line//[[:cntrl:]]/ }
    printf '\r\033[K%s' "${line:0:width-1}" >&2 || true
  done
  printf '\r\033[K' >&2 || true
}

# logged LOG COMMAND…: adds the output to the file and shows on a terminal how far it has come; the command's status.
logged() {
  local log=$1
  shift
  "$@" 2>&1 </dev/null | tee -a "$log" | show_progress
  return "${PIPESTATUS[0]}"
}

# Who holds the lock of the package manager, as a process number; nothing when it is free.
dpkg_lock=${dpkg_lock:-/var/lib/dpkg/lock-frontend}
dpkg_lock_holder() {
  local inode
  inode=$(stat -c %i "$dpkg_lock" 2>/dev/null) || return 0
  sed -n "s/^[0-9]*: *[A-Z]* *[A-Z]* *WRITE \([0-9]*\) [0-9a-f]*:[0-9a-f]*:$inode .*/\1/p" /proc/locks | head -n 1 || true
}

# Installs those of the packages named that are missing.
install_packages() {
  local missing="" package
  for package in "$@"; do
    dpkg-query -W -f '${db:Status-Status}' "$package" 2>/dev/null | grep -qx installed || missing="$missing $package"
  done
  [ -n "$missing" ] || return 0
  say "installing:$missing"
  local sudo="" holder
  if [ "$(id -u)" != 0 ]; then
    if ! command -v sudo >/dev/null; then
      echo "error: these packages are missing and there is neither root nor sudo to install them:$missing" >&2
      return 1
    fi
    sudo=sudo
  fi
  # Another apt may be at work; wait for it rather than fail.
  holder=$(dpkg_lock_holder)
  if [ -n "$holder" ]; then
    echo "waiting for process $holder, which is installing packages, for at most 5 minutes" >&2
  fi
  local apt="$sudo env DEBIAN_FRONTEND=noninteractive apt-get -o DPkg::Lock::Timeout=300 -q"
  local log="$top/build/packages.log"
  : >"$log"
  # shellcheck disable=SC2086
  if ! logged "$log" $apt install -y --no-install-recommends $missing; then
    # Most often the lists of packages are old or absent.
    : >"$log"
    # shellcheck disable=SC2086
    if ! { logged "$log" $apt update && logged "$log" $apt install -y --no-install-recommends $missing; }; then
      tail -n 5 "$top/build/packages.log" >&2
      echo "error: the packages could not be installed; the whole story is in build/packages.log" >&2
      return 1
    fi
  fi
}

# stage "what": prints what begins and, before it, how long the one before took.
stage_name=""
stage() {
  local now
  now=$(date +%s)
  if [ -n "$stage_name" ]; then say "-- $stage_name: $((now - stage_began)) s"; fi
  stage_name=$1
  stage_began=$now
  if [ -n "$1" ]; then say "== $1"; fi
}

# configure_and_build PRESET [CMake arguments]: quiet when all is well, the errors otherwise. Builds everything, or what
# build_targets names.
build_targets=${build_targets:-all}
configure_and_build() {
  local preset=$1 log="$top/build/$1.log"
  shift
  # Two builds of one folder at once would write over each other.
  exec 8>"$top/build/$preset.lock"
  if ! flock -n 8; then
    echo "waiting for another build of build/$preset to end" >&2
    flock 8
  fi
  : >"$log"
  if ! logged "$log" cmake --preset "$preset" "$@"; then
    tail -n 30 "$log" >&2
    echo "error: configuring failed; the whole story is in ${log#"$top"/}" >&2
    return 1
  fi
  # shellcheck disable=SC2086
  if ! logged "$log" cmake --build "$top/build/$preset" --target $build_targets; then
    grep -E 'error|undefined reference|FAILED' "$log" | head -n 30 >&2 || tail -n 10 "$log" >&2
    echo "error: the build failed; the whole story is in ${log#"$top"/}" >&2
    return 1
  fi
  exec 8>&-
}
