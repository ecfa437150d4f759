# What the scripts of this folder share; sourced, not run. Whatever directory a script is started
# from, it goes on at the root of the tree.

set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."

build_packages=(g++ cmake ninja-build ccache libboost-dev libxxhash-dev libcli11-dev libgeotiff-dev
                libproj-dev libtiff-dev nlohmann-json3-dev libgtest-dev)
windows_packages=(g++-mingw-w64-x86-64-posix googletest wine64)

fail() {
  echo "$*" >&2
  exit 1
}

# step LABEL COMMAND...: says what is done and how many seconds it took; what the command prints is
# shown only when it fails, which ends the script. It stays in build/SCRIPT.log until the next.
step() {
  local label=$1 started=$SECONDS log=build/${0##*/}.log status
  shift
  mkdir -p build
  printf '%s ... ' "$label"
  # Not as a condition: there the first failure inside a function would not end it.
  set +e
  (set -e; "$@") >"$log" 2>&1 </dev/null
  status=$?
  set -e
  if [ "$status" != 0 ]; then
    printf 'failed\n'
    cat "$log" >&2
    fail "$label: failed"
  fi
  printf '%d s\n' $((SECONDS - started))
}

# Installs those of the named packages that are missing.
require_packages() {
  local missing
  if ! command -v dpkg-query >/dev/null; then
    echo "Not a Debian system: taking it that these are here: $*"
    return
  fi
  missing=$(comm -23 <(printf '%s\n' "$@" | sort) <(installed_packages "$@" | sort) | xargs)
  if [ -z "$missing" ]; then return; fi
  if [ "$(id -u)" != 0 ]; then
    fail "Missing packages, to be installed as root: apt-get install $missing"
  fi
  step "Installing $missing" install_packages $missing
}

installed_packages() {
  dpkg-query --show --showformat '${Package} ${db:Status-Status}\n' "$@" 2>/dev/null |
    sed -n 's/ installed$//p'
}

install_packages() {
  apt-get update
  DEBIAN_FRONTEND=noninteractive apt-get install --yes --no-install-recommends "$@"
}

# build PRESET [TARGET...]: configures and builds everything, or the targets.
build() {
  local preset=$1
  shift
  step "Configuring $preset" cmake --preset "$preset"
  step "Building $preset" cmake --build --preset "$preset" ${1:+--target "$@"}
}

# at_exit COMMAND...: has it run when the script ends, after those that were named earlier.
exit_commands=
at_exit() {
  exit_commands+="$(printf '%q ' "$@"); "
  trap "$exit_commands" EXIT
}

# One Wine server for everything that the script runs: a start for each program takes seconds. It
# ends with the script.
start_wine() {
  step "Starting Wine" scripts/wine --start
  at_exit scripts/wine --stop
}
