#!/usr/bin/env bash
# Runs a command on a display of its own: with_display.sh COMMAND [ARGUMENT...]
#
# The wine server of WINEPREFIX (by default build/wine_prefix_UID of this checkout) is ended afterwards, so
# that no process stays behind.
set -u
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
export WINEPREFIX=${WINEPREFIX:-$root/build/wine_prefix_$(id -u)}

xvfb-run -a -s "-screen 0 1280x1024x24" "$@"
status=$?
/usr/lib/wine/wineserver -k >/dev/null 2>&1
exit $status
