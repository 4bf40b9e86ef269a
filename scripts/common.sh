# What the scripts share. To be sourced; expects to be run by bash with `set -euo pipefail`.

project=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)

say() { printf '%s\n' "$*" >&2; }

# Ends the script with one line that says what went wrong.
die() {
  say "${0##*/}: $*"
  exit 1
}

# Names the packages of the given groups of scripts/packages, one a line.
packages_of() {
  local group
  for group in "$@"; do
    awk -v group="$group" '$1 == group { print $2 }' "$project/scripts/packages"
  done | sort -u
}

is_installed() { [ "$(dpkg-query -W -f '${db:Status-Status}' "$1" 2>/dev/null)" = installed ]; }

# Runs a command as root: as it is for root, else through sudo.
as_root() {
  if [ "$(id -u)" -eq 0 ]; then
    "$@"
  elif command -v sudo >/dev/null; then
    sudo "$@"
  else
    die "root rights are needed for: $* (there is no sudo here; run that as root, then try again)"
  fi
}

# On a terminal the user is asked; where nobody can be asked, running the script is the leave.
may_install() {
  [ -t 0 ] && [ -t 2 ] && [ -z "${CI:-}" ] || return 0
  local answer
  read -r -p "Install them now? [Y/n] " answer
  case "$answer" in '' | [Yy]*) return 0 ;; *) return 1 ;; esac
}

# Installs what is missing of the given groups of packages.
install_packages() {
  command -v dpkg-query >/dev/null || die "this is no Debian system: install by hand what scripts/packages lists"
  local missing=() package
  for package in $(packages_of "$@"); do
    is_installed "$package" || missing+=("$package")
  done
  [ ${#missing[@]} -eq 0 ] && return
  say "Debian packages that are missing: ${missing[*]}"
  may_install || die "not installed: ${missing[*]}"
  local log
  log=$(mktemp)
  { as_root apt-get update -q && as_root env DEBIAN_FRONTEND=noninteractive \
      apt-get install -y -q --no-install-recommends "${missing[@]}"; } >"$log" 2>&1 ||
    { tail -n 5 "$log" >&2; die "apt-get could not install: ${missing[*]} (whole output: $log)"; }
  rm -f "$log"
}

# build PRESET [CMAKE OPTION...]: configures and builds build/PRESET. Quiet unless it fails.
build() {
  local preset=$1 log
  shift
  mkdir -p "$project/build/$preset"
  log=$project/build/$preset/build.log
  say "Building ($preset) ..."
  (cd "$project" && cmake --preset "$preset" "$@" && cmake --build --preset "$preset") >"$log" 2>&1 ||
    { grep -E -A 3 'error|Error|FAILED' "$log" | head -n 40 >&2 || tail -n 40 "$log" >&2
      die "the build failed (whole output: $log)"; }
}
