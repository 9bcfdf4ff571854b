#!/usr/bin/env bash
# The sample folders of build/demo and the real program on them; sourced by ./run. Needs a display for
# everything that starts a Windows program.
demo=$root/build/demo
release=$root/build/release
main_window="Desktop-Mobile Device Synchronization"

# The sample is laid out once: a second run finds both sides as the first one left them.
lay_out_demo() {
  if [ ! -e "$demo/.laid_out" ]; then
    rm -rf "$demo"
    mkdir -p "$demo"
    "$root/tools/make_sample.sh" "$demo"
    touch "$demo/.laid_out"
  fi
  rm -f "$demo/trace.txt"
}

apply_demo_settings() {
  local types=() type
  for type in qvj tn3 rd3 pt3 ln3 jpg bmp img xml tp3 wkf txt; do
    types+=("Sync_${type}_files" 1)
  done
  "$root/tools/settings.sh" SyncPath_DT "Z:$demo/pc/Jobs/" SyncPath_CE '/Jobs/' "${types[@]}" \
    Sync_all_files 1 Overwrite_old_files 1 Overwrite_bkp 1 Overwrite_warn 0 Start_File_View 0
}

# The program in the virtual desktop that captions need, with the folder device on its PATH.
start_program() {
  DLL_FOLDER=$release/folder_device FOLDER_DEVICE_ROOT="Z:${demo//\//\\}\\device" \
    FOLDER_DEVICE_TRACE="Z:${demo//\//\\}\\trace.txt" \
    "$root/tools/wine.sh" explorer /desktop=orvane,1024x768 "$release/orvanelink.exe" \
    >"$demo/program.log" 2>&1 </dev/null &
  program=$!
}

drive() {
  WINDOW_DESKTOP=orvane "$root/tools/wine.sh" "$release/tools/window_driver.exe" "$@" 2>/dev/null </dev/null | tr -d '\r'
}
screenshot() { import -window root "$demo/$1.png"; }

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
check_sides() { diff -r "$demo/expected/pc" "$demo/pc" && diff -r "$demo/expected/device" "$demo/device"; }
