#!/usr/bin/env bash
# Builds the installer from a folder of what it installs: make_msi.sh FOLDER VERSION INSTALLER
#
# Its codes are made from what it holds and its times are SOURCE_DATE_EPOCH, so that equal contents make equal
# installers, and different ones of one version replace each other.
set -euo pipefail
here=$(cd "$(dirname "${BASH_SOURCE[0]}")" && pwd)
version=$2
installer=$(realpath "$3")
work=$(mktemp -d)
trap 'rm -r "$work"' EXIT
cd "$1"  # wixl takes relative paths only.

contents=$(cat "$here/orvanelink.wxs" "$here/make_msi.sh" | sha256sum; find . -type f -print0 | LC_ALL=C sort -z | xargs -0 sha256sum)
# code NAME: a GUID of its own for these contents.
code() {
  sha256sum <<<"$1 $version $contents" |
    sed -E 's/^(.{8})(.{4}).(.{3}).(.{3})(.{12}).*/\1-\2-8\3-8\4-\5/' | tr a-f A-F
}

# Every folder below as one component.
folders() { find . -mindepth 1 -type d -printf '%P\n' | LC_ALL=C sort; }
# id PATH: a name for it in the tables.
id() { tr -c 'A-Za-z0-9.\n' _ <<<"$1"; }
{
  echo '<Wix xmlns="http://schemas.microsoft.com/wix/2006/wi"><Fragment>'
  for path in $(folders); do
    parent=$(dirname "$path")
    [ "$parent" = . ] && parent=INSTALLDIR
    echo "<DirectoryRef Id='$(id "$parent")'><Directory Id='$(id "$path")' Name='$(basename "$path")'>"
    echo "<Component Id='in_$(id "$path")' Guid='*' Win64='yes'>"
    key=yes
    for file in $(find "$path" -maxdepth 1 -type f | LC_ALL=C sort); do
      echo "<File Id='$(id "$file")' Source='$file' KeyPath='$key'/>"
      key=no
    done
    echo '</Component></Directory></DirectoryRef>'
  done
  echo '<ComponentGroup Id="Contents">'
  for path in $(folders); do
    echo "<ComponentRef Id='in_$(id "$path")'/>"
  done
  echo '</ComponentGroup></Fragment></Wix>'
} >"$work/contents.wxs"
wixl --arch x64 --output "$installer" -D Version="$version" -D ProductCode="$(code product)" \
  -D Icon="$(realpath --relative-to=. "$here/../res/orvanelink.ico")" \
  -D Kilobytes="$(du -sk --apparent-size . | cut -f1)" "$here/orvanelink.wxs" "$work/contents.wxs"

# edit TABLE EXPRESSION: what wixl cannot say, by sed in the table's lines.
edit() {
  msiinfo export "$installer" "$1" | sed -E "$2" >"$work/$1.idt"
  msibuild "$installer" -i "$work/$1.idt"
}
# Another program of the same version is replaced too: both ends of the range count (256 and 512).
edit Upgrade 's/\t256\t\tOLDERVERSION/\t768\t\tOLDERVERSION/'
# The auto-start entry is written on demand and for all users only, and stays unless the action that looks at
# it removes it: 64-bit (256), permanent (16), with a registry value as its key (4).
edit Component 's/^(AutoStart\t[^\t]*\t[^\t]*)\t[0-9]*\t\t/\1\t276\tALLUSERS=1 AND AUTOSTART=1\t/'
edit Property 's/^(SecureCustomProperties\t[^\r]*)/\1;AUTOSTART/'
time=$(TZ=UTC date -d "@$SOURCE_DATE_EPOCH" '+%Y\/%m\/%d %H:%M:%S')
edit _SummaryInformation "s/^9\t[^\r]*/9\t{$(code package)}/; s/^(12|13)\t[^\r]*/\1\t$time/"
