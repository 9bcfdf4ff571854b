#!/usr/bin/env bash
# Runs a Windows program in Wine: wine.sh PROGRAM [ARGUMENT...]
#
# The prefix (see wine_prefix.sh) is created on first use. DLL_FOLDER, a path of this system, is put in front
# of the program's PATH. A display must exist (see with_display.sh).
set -eu
source "$(dirname "${BASH_SOURCE[0]}")/wine_prefix.sh"
# Without a UTF-8 locale Wine cannot make files of names beyond ASCII.
if [ "$(locale charmap 2>/dev/null)" != UTF-8 ]; then
  export LC_ALL=C.UTF-8
fi
export WINEDEBUG=${WINEDEBUG:--all}
# Without the last override a program that crashes would wait for a debugger for ever.
export WINEDLLOVERRIDES="mscoree,mshtml,winedbg.exe="
wine=/usr/lib/wine/wine64

mkdir -p "$(dirname "$WINEPREFIX")"
(
  flock 9
  if [ ! -e "$WINEPREFIX/.ready" ]; then
    # What an interrupted attempt has left is no prefix.
    rm -rf "$WINEPREFIX"
    "$wine" wineboot -i
    # This Wine looks for fonts in the prefix and in those of the system, not in its own folder, where the
    # pictures of the caption's buttons are.
    ln -s /usr/share/wine/fonts/marlett.ttf "$WINEPREFIX/drive_c/windows/Fonts/"
    # Without a window manager a managed window that closes can wait for two seconds.
    "$wine" reg add 'HKCU\Software\Wine\X11 Driver' /v Managed /d N /f
    /usr/lib/wine/wineserver -w
    touch "$WINEPREFIX/.ready"
  fi
) 9>"$WINEPREFIX.lock" >"$WINEPREFIX.log" 2>&1 </dev/null

if [ -n "${DLL_FOLDER:-}" ]; then
  WINEPATH=Z:${DLL_FOLDER//\//\\}
  export WINEPATH
fi
exec "$wine" "$@"
