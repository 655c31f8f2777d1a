# shellcheck shell=bash
# Shared by the scripts that build; to be sourced. No function here writes to standard output.

top=$(readlink -f "$(dirname "$(readlink -f "${BASH_SOURCE[0]}")")/..")

# Installs what is missing of the package groups given. Asking dpkg takes time, so the answer is kept until the list
# or what is installed changes.
setup() {
  local IFS=-
  local stamp=$top/build/.setup-$*
  if [ -n "${HCLI_NO_SETUP:-}" ] || [[ $stamp -nt $top/scripts/packages && $stamp -nt /var/lib/dpkg/status ]]; then
    return 0
  fi
  "$top/scripts/setup" "$@" && touch "$stamp"
}

# Configures preset $1 where that was not done yet, and builds the targets behind it, or all. Unless someone watches a
# first build, only failures are shown.
build() {
  local folder=$top/build/$1 output
  if [ ! -e "$folder/build.ninja" ]; then
    echo "Building hcli ($1); this takes a minute or two the first time." >&2
    if ! output=$(cd "$top" && cmake --preset "$1" 2>&1); then
      printf '%s\n' "$output" >&2
      return 1
    fi
    [ ! -t 2 ] || ninja -C "$folder" "${@:2}" >&2 || return
  fi
  ninja -C "$folder" --quiet "${@:2}" 2>&1 | sed '/^ninja: no work to do/d; /^-- /d' >&2
}

# Runs the arguments while no other script of this project sets up or builds in the same tree.
alone() {
  local lock status=0
  mkdir -p "$top/build" || return
  exec {lock}>"$top/build/.lock"
  flock "$lock"
  # What is started here must not keep the lock, should it outlive us.
  "$@" {lock}>&- || status=$?
  exec {lock}>&-
  return $status
}
