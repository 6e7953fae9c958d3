#!/bin/bash
# Runs a Windows program under Wine, with a prefix of its own, which the first call makes:
#   wine.sh PROGRAM [ARG ...]
# It lies in SIMGP_WINEPREFIX, or beside the other temporary files.
set -u
export WINEPREFIX=${SIMGP_WINEPREFIX:-${TMPDIR:-/tmp}/simgp-wine-$(id -u)}
export WINEDEBUG=${WINEDEBUG:--all} WINEDLLOVERRIDES="mscoree=;mshtml=;winemenubuilder.exe="
mkdir -p "$WINEPREFIX"
(
    flock 9
    [ -f "$WINEPREFIX/made" ] || { wine wineboot --init && touch "$WINEPREFIX/made"; }
) 9>"$WINEPREFIX/lock" >/dev/null 2>&1 || {
    echo "wine.sh: Wine makes no prefix in $WINEPREFIX" >&2
    exit 1
}
# Paths that GoogleTest must take for absolute ones.
[[ ${GTEST_OUTPUT:-} == xml:/* ]] && export GTEST_OUTPUT=xml:Z:${GTEST_OUTPUT#xml:}
exec wine "$@"
