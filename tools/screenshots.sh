# Pictures of every dialog, one page for all of them; sourced by ./run after demo.sh. `languages` names the
# catalogs of res/lang/ (and "en"), "all" for every one; `scale` is the density in percent.
shots=$root/build/screenshots
dialogs=(sync about options folder_chooser loading device_browser properties running cancelled
  file_view_pc file_view_device copy_progress)

# picture NAME WINDOW: the window as it stands on the desktop.
picture() {
  take "$1" "$(drive rect "$2")"
}
# open PRESSED ID WINDOW NAME: presses a button and takes a picture of the window that opens.
open() {
  take "$4" "$(drive open "$1" "$2" "$3")"
}
take() {
  sleep 0.5  # What was pressed just now is painted.
  import -window root png:- | convert - -crop "$2" +repage "$shots/$WINDOW_LANGUAGE/$1.png"
}
close() {
  drive click "$1" "$2"
  drive gone "$1"
}

# The dialogs in one language, on a device slow enough for the passing ones to be seen.
show_dialogs() {
  start_program 40
  drive wait "$main_window"
  picture sync "$main_window"
  drive command "$main_window" 0 16
  drive wait "About Orvanelink"
  picture about "About Orvanelink"
  close "About Orvanelink" 1

  open "$main_window" 1010 "Options" options
  open "Options" 4 "Select Directory" folder_chooser
  close "Select Directory" 2
  mkdir -p "$demo/device/Archive/"{001..400}  # So many that reading them can be seen.
  open "Options" 3 "#1026" loading
  drive wait "Mobile Device Browse"
  picture device_browser "Mobile Device Browse"
  drive command "Mobile Device Browse" 1023 32773
  drive wait "Dialog"
  picture properties "Dialog"
  close "Dialog" 1
  rm -r "$demo/device/Archive"
  close "Mobile Device Browse" 2
  close "Options" 2

  drive click "$main_window" 1007
  drive wait-text "$main_window" 1009 "Cancel"
  picture running "$main_window"
  drive click "$main_window" 1009
  drive wait-text "$main_window" 1008 "Sychronization cancelled"
  picture cancelled "$main_window"

  # What is left goes over in the manual view.
  drive click "$main_window" 1011
  drive wait "$file_view"
  drive wait-disabled "$file_view" 1044  # Both sides are listed.
  drive click "$file_view" 1040
  picture file_view_pc "$file_view"
  drive tab "$file_view" 1046 1
  picture file_view_device "$file_view"
  open "$file_view" 1045 "#1052" copy_progress
  drive wait-disabled "$file_view" 1045
  close "$file_view" 3
  drive click "$main_window" 1009
  wait "$program"
  check_sides
}

# set_up_prefix: the density for all, and the language of the next program with a font that has its characters,
# as the dialog font of a system of that language would.
set_up_prefix() {
  local desktop='HKCU\Control Panel\Desktop' font="Liberation Sans"
  local substitutes='HKLM\Software\Microsoft\Windows NT\CurrentVersion\FontSubstitutes'
  case $WINDOW_LANGUAGE in ja | zh*) font="WenQuanYi Micro Hei" ;; esac
  "$root/tools/wine.sh" reg add "$desktop" /v LogPixels /t REG_DWORD /d $((96 * scale / 100)) /f
  "$root/tools/wine.sh" reg add "$substitutes" /v "MS Shell Dlg" /d "$font" /f
  "$root/tools/settings.sh" Language "$WINDOW_LANGUAGE"
  /usr/lib/wine/wineserver -k
  /usr/lib/wine/wineserver -w
} >/dev/null 2>&1 </dev/null

write_page() {
  local name picture
  echo '<!DOCTYPE html><meta charset="utf-8"><title>Orvanelink</title>'
  echo '<style>body { font-family: sans-serif } figure { display: inline-block; vertical-align: top }</style>'
  for name in "${dialogs[@]}"; do
    echo "<h2>$name</h2>"
    for picture in "$shots"/*/"$name.png"; do
      picture=${picture#"$shots"/}
      echo "<figure><img src=\"$picture\" alt=\"$picture\"><figcaption>${picture%%/*}</figcaption></figure>"
    done
  done
}

screenshots_demo() {
  demo=$shots/sample
  [ "$languages" != all ] || languages="en $(cd "$root/res/lang" && ls ./*.po | sed 's/\.po$//; s|^\./||; s/_/-/')"
  for WINDOW_LANGUAGE in $languages; do
    echo "$WINDOW_LANGUAGE"
    export WINDOW_LANGUAGE
    mkdir -p "$shots/$WINDOW_LANGUAGE"
    rm -rf "$demo"
    lay_out_demo
    apply_demo_settings
    set_up_prefix
    show_dialogs
  done
  write_page >"$shots/index.html"
  echo "All of them on one page: ${shots#"$root"/}/index.html"
}
