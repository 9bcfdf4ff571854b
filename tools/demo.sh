# The real program on sample folders; sourced by ./run, which sets `root`. All but the layout needs a display.
source "$root/tools/wine_prefix.sh"
release=$root/build/release
demo=${demo:-$root/build/demo}
main_window="Desktop-Mobile Device Synchronization"
file_view="File Transfer - Copy From"
progress_window="{Copying File*"

# A sample is laid out once: a second run finds both sides as the first one left them.
lay_out_demo() {
  if [ ! -e "$demo/.laid_out" ]; then
    rm -rf "$demo"
    mkdir -p "$demo"
    "$root/tools/make_sample.sh" "$demo"
    touch "$demo/.laid_out"
  fi
  rm -f "$demo/trace.txt"
}

# The sample folders are drive J: of the prefix.
apply_demo_settings() {
  "$root/tools/wine.sh" cmd /c exit >/dev/null 2>&1 </dev/null
  ln -sfn "$demo" "$WINEPREFIX/dosdevices/j:"
  local types=() type
  for type in qvj tn3 rd3 pt3 ln3 jpg bmp img xml tp3 wkf txt; do
    types+=("Sync_${type}_files" 1)
  done
  "$root/tools/settings.sh" SyncPath_DT 'J:/pc/Jobs/' SyncPath_CE '/Jobs/' "${types[@]}" \
    Sync_all_files 1 Overwrite_old_files 1 Overwrite_bkp 1 Overwrite_warn 0 Start_File_View 0
}

# start_program [CALL_DELAY]: the program in the virtual desktop that captions need, with the folder device
# on its PATH and so many milliseconds for each call to it.
start_program() {
  DLL_FOLDER=$release/folder_device FOLDER_DEVICE_ROOT='J:\device' FOLDER_DEVICE_TRACE='J:\trace.txt' \
    FOLDER_DEVICE_CALL_DELAY=${1:-} \
    "$root/tools/wine.sh" explorer /desktop=orvane,1280x1024 "$release/orvanelink.exe" \
    >"$demo/program.log" 2>&1 </dev/null &
  program=$!
}

drive() {
  WINDOW_DESKTOP=orvane "$root/tools/wine.sh" "$release/tools/window_driver.exe" "$@" 2>/dev/null \
    </dev/null | tr -d '\r'
}

# screenshot NAME: what is on the desktop, as NAME.png of the demo folder.
screenshot() {
  sleep 0.7  # What was pressed just now is painted.
  import -window root png:- | convert - -bordercolor '#256e95' -trim +repage "$demo/$1.png"
}

# Every file and folder of both sides with its time and size, as the user sees them.
print_sides() {
  local side
  for side in pc device; do
    echo "  $side:"
    (cd "$demo/$side/Jobs" && find . -mindepth 1 -printf '    %TY-%Tm-%Td %.8TT %6s  %P%y\n' | sort -k4 |
      sed 's/d$/\//; s/f$//')
  done
}

# Whether both sides hold exactly what they should.
check_sides() {
  if diff -r "$demo/expected/pc" "$demo/pc" && diff -r "$demo/expected/device" "$demo/device"; then
    echo "Both folders hold what they should. Screenshots: ${demo#"$root"/}/*.png"
  else
    echo "The folders do not hold what they should."
    return 1
  fi
}

synchronize_demo() {
  apply_demo_settings
  start_program
  drive wait "$main_window"
  screenshot idle
  echo "Before:"
  print_sides
  drive click "$main_window" 1007
  drive wait-text "$main_window" 1008 "Synchronization complete."
  echo "Log:"
  drive list "$main_window" 1020 | sed 's/^/  /'
  screenshot complete
  drive click "$main_window" 1009
  wait "$program"
  echo "After:"
  print_sides
  check_sides
}

# Both pages of the manual view, then everything that differs is copied, slowly enough to be seen.
file_view_demo() {
  apply_demo_settings
  "$root/tools/settings.sh" Start_File_View 1
  start_program 10
  drive wait "$file_view"
  drive wait-disabled "$file_view" 1044  # Both sides are listed.
  drive click "$file_view" 1040
  screenshot file_view_pc
  drive tab "$file_view" 1046 1
  screenshot file_view_device
  drive click "$file_view" 1045
  drive wait "$progress_window"
  screenshot copy_progress
  drive wait-disabled "$file_view" 1045  # Nothing is left to copy.
  drive click "$file_view" 3
  wait "$program"
  check_sides
}
