# What the gates share. Usage, in a gate: . gate.sh SETTINGS
# shellcheck shell=bash disable=SC1090,SC2034
set -u
export LC_ALL=C
. "$1"
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
broken=0

# fault TEXT [LINES]: reports a fault and goes on.
fault() {
    broken=1
    printf '%s\n' "$1"
    [ $# -lt 2 ] || printf '%s\n' "$2" | sed 's/^/    /'
}

# Status 77 means skipped.
skip() {
    printf '%s\n' "$1"
    exit 77
}

finish() { exit $broken; }
