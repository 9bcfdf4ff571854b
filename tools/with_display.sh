#!/usr/bin/env bash
# Runs a command on a display of its own: with_display.sh COMMAND [ARGUMENT...]
#
# The wine server of the prefix is ended afterwards, so that no process stays behind.
set -u
source "$(dirname "${BASH_SOURCE[0]}")/wine_prefix.sh"

xvfb-run -a -s "-screen 0 1280x1024x24" "$@"
status=$?
/usr/lib/wine/wineserver -k >/dev/null 2>&1
exit $status
