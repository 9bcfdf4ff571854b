#!/usr/bin/env bash
# Tries the packages of build/package in build/package_trial, on a display that is there: try_packages.sh VERSION
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
trial=$root/build/package_trial
demo=$trial/sample
source "$root/tools/demo.sh"
version=$1
packed=$trial/orvanelink-$version
installer=$root/build/package/orvanelink-$version-x64.msi
archive=$root/build/package/orvanelink-$version-x64.zip

# Another program of this version, and the next version with a third.
for other in same next; do
  cp -rp "$packed" "$trial/$other"
  echo $other >>"$trial/$other/orvanelink.exe"
done
same_installer=$trial/same.msi
"$root/packaging/make_msi.sh" "$trial/same" "$version" "$same_installer"
next=${version%.*}.$((${version##*.} + 1))
next_installer=$trial/next.msi
"$root/packaging/make_msi.sh" "$trial/next" "$next" "$next_installer"

done_with() { echo "  $*"; }
fail() {
  echo "FAILED: $*"
  exit 1
}
wine() { "$root/tools/wine.sh" "$@" 2>>"$trial/wine.log" </dev/null | tr -d '\r'; }
# msi OPTION INSTALLER [PROPERTY...], without a window.
msi() { wine msiexec "$1" "Z:${2//\//\\}" /qn "${@:3}" >>"$trial/wine.log"; }

uninstall_key='Software\Microsoft\Windows\CurrentVersion\Uninstall'
auto_start='HKLM\Software\Microsoft\Windows CE Services\AutoStartOnConnect'
# values KEY NAME: the data of all values of that name below the key.
values() { wine reg query "$1" /s | sed -nE "s/^ +$2 +REG_[A-Z]+ +//p"; }
# Wine lists installations for one user with those for all.
installed() { values "HKLM\\$uninstall_key" "${1:-DisplayVersion}"; }
# What users and programs have on the drive; Windows' own folder is Windows' business.
drive_files() { (cd "$WINEPREFIX/drive_c" && find . -path ./windows -prune -o -type f -print | LC_ALL=C sort); }

start() {
  "$root/tools/wine.sh" explorer /desktop=orvane,1280x1024 "$1" >"$demo/program.log" 2>&1 </dev/null &
  program=$!
  drive wait "$main_window" || fail "$1 does not start"
}
leave() {
  drive click "$main_window" 1009
  wait "$program"
}
# synchronize PROGRAM: it brings the sample folders into step.
synchronize() {
  rm -rf "$demo"
  lay_out_demo
  apply_demo_settings
  start "$1"
  drive click "$main_window" 1007
  drive wait-text "$main_window" 1008 "Synchronization complete." || fail "$1 does not synchronize"
  leave
  check_sides >"$demo/sides.txt" || fail "$1: $(cat "$demo/sides.txt")"
}

echo "Trying the packages:"
wine cmd /c exit
before=$(drive_files)
msi /i "$installer" || fail "the installer does not install"
folder=$(installed InstallLocation)
folder=$WINEPREFIX/drive_c/$(sed 's/^C:.//; s/\\/\//g' <<<"$folder")
diff -r "$packed" "$folder" || fail "other files were installed than are packed"
[[ $folder == */AppData/Local/Programs/Orvanelink/ ]] || fail "installed in $folder"
[ "$(installed)" = "$version" ] || fail "the installed version is $(installed)"
[ -n "$(installed Size)" ] || fail "the list of programs shows no size"
[ -n "$(values 'HKCU\Software\Microsoft\Installer\Products' ProductIcon)" ] || fail "nor an icon"
grep -q '/Start Menu/.*/Orvanelink.lnk' <<<"$(drive_files)" || fail "the Start menu has no entry"
DLL_FOLDER=$folder/folder_device FOLDER_DEVICE_ROOT='J:\device' synchronize "$folder/orvanelink.exe"
done_with "installed for one user; the installed program synchronizes"

msi /i "$same_installer" || fail "another program of the same version does not install"
[ "$(installed)" = "$version" ] || fail "after it the versions are $(installed)"
diff -r "$trial/same" "$folder" || fail "another program of the same version was not installed"
done_with "another program of the same version takes its place"

# Wine hands pages to this browser; without Wine's own they are of no type.
wine reg add 'HKCR\.html' /ve /d htmlfile /f >>"$trial/wine.log"
printf '#!/bin/sh\necho "$1" >"%s"\n' "$trial/opened" >"$trial/browser"
chmod +x "$trial/browser"
wine reg add 'HKCU\Software\Wine\WineBrowser' /v Browsers /d "$trial/browser" /f >>"$trial/wine.log"
start "$folder/orvanelink.exe"
drive command "$main_window" 0 $((0x20))
for ((tenths = 0; tenths < 100; ++tenths)); do
  [ -s "$trial/opened" ] && break
  sleep 0.1
done
grep -q '/Orvanelink/guide/user_guide.html$' "$trial/opened" || fail "Help opens: $(cat "$trial/opened")"
done_with "Help opens the guide"

status=0
msi /i "$next_installer" || status=$?
[ $status -eq $((3010 % 256)) ] || fail "an upgrade of the running program answers $status"
leave
wine wineboot  # The restart that 3010 asks for.
[ "$(installed)" = "$next" ] || fail "after an upgrade the versions are $(installed)"
diff -r "$trial/next" "$folder" || fail "the upgrade of a running program left other files"
done_with "upgraded while the program ran: its file was replaced at the restart"
msi /i "$installer" && fail "an older version was installed over a newer one"
[ "$(installed)" = "$next" ] || fail "after a refusal the versions are $(installed)"
done_with "an older version is refused"

touch "$folder/folder_device.ini"  # A user's file.
msi /x "$next_installer" || fail "the installer does not uninstall"
[ -z "$(installed)" ] || fail "after the removal version $(installed) is listed"
left=$(comm -13 <(echo "$before") <(drive_files))
[ "$left" = "./${folder#"$WINEPREFIX/drive_c/"}folder_device.ini" ] || fail "the removal left: $left"
[ -n "$(values 'HKCU\Software\Veltrano\CE Devices' SyncPath_DT)" ] || fail "the settings are gone"
done_with "removed; the user's file and the settings are there"

msi /i "$installer" ALLUSERS=1 AUTOSTART=1 || fail "no installation for all users"
program='C:\Program Files\Orvanelink\orvanelink.exe'
[ "$(values "$auto_start" 'ORVANE ActiveSync')" = "$program" ] || fail "no auto-start entry"
msi /x "$installer" || fail "no removal for all users"
[ -z "$(values "$auto_start" 'ORVANE ActiveSync')" ] || fail "the auto-start entry is left"
[ -e "$WINEPREFIX/drive_c/Program Files/Orvanelink" ] && fail "the program folder is left"
msi /i "$installer" ALLUSERS=1
wine reg add "$auto_start" /v 'ORVANE ActiveSync' /d 'C:\other.exe' /f >/dev/null
msi /x "$installer"
[ "$(values "$auto_start" 'ORVANE ActiveSync')" = 'C:\other.exe' ] || fail "another program's entry is gone"
done_with "installed for all users with auto-start, and removed"

unzip -q "$archive" -d "$trial/portable"
portable=$trial/portable/orvanelink-$version
diff -r "$packed" "$portable"
cp "$portable/folder_device/RAPI.DLL" "$portable"
printf '[folder_device]\r\nROOT=J:\\device\r\n' >"$portable/folder_device.ini"
synchronize "$portable/orvanelink.exe"
done_with "unzipped, with the folder device beside the program it synchronizes a card"

for link in $(grep -ohE '(src|href)="[^"#:]+' "$packed"/guide/*.html | sed 's/.*"//'); do
  [ -f "$packed/guide/$link" ] || fail "the guide has no $link"
done
ls -l "$installer" "$archive"
