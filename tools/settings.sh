#!/usr/bin/env bash
# Sets the program's settings in the Wine prefix: settings.sh NAME VALUE [NAME VALUE]...
# A folder's "/" become "\".
set -eu
here=$(cd "$(dirname "${BASH_SOURCE[0]}")" && pwd)
while [ $# -ge 2 ]; do
  "$here/wine.sh" reg add 'HKCU\Software\Veltrano\CE Devices' /v "$1" /d "${2//\//\\}" /f >/dev/null 2>&1
  shift 2
done
