#!/usr/bin/env bash
# Runs a command on a display of its own: with_display.sh COMMAND [ARGUMENT...]
#
# It runs in English with the formats of the C locale, whatever the user has. The wine server of the prefix is ended
# afterwards, so that no process stays behind.
set -u
source "$(dirname "${BASH_SOURCE[0]}")/wine_prefix.sh"

export LC_ALL=C.UTF-8
xvfb-run -a -s "-screen 0 1280x1024x24" "$@"
status=$?
/usr/lib/wine/wineserver -k >/dev/null 2>&1
exit $status
