#!/usr/bin/env bash
# Runs a 32-bit Windows program under wine, quietly, in the project's own
# wine prefix (created on first use).
set -eu
export WINEDEBUG=-all
export WINEDLLOVERRIDES="mscoree,mshtml=;winemenubuilder.exe=d"
export WINEPREFIX="${ZOR_WINEPREFIX:-${HOME:-/tmp}/.zor-wine32}"
export WINEARCH=win32
if [ ! -f "$WINEPREFIX/system.reg" ]; then
  wineboot --init >/dev/null 2>&1 || true
  wineserver -w || true
fi
exec wine "$@"
