# The cases of ./bench, which sources this file: how their folders are laid out, how often they run. Every
# function that runs something adds lines to $raw: what the bench program prints, with the case's name.
work=$root/build/bench
raw=$work/raw.jsonl
windows_path() { printf 'Z:%s' "${1//\//\\}"; }

# lay SIDE LETTER COUNT BYTES [PER_FOLDER]: files LETTER<number>.qvj in folders of 100 or so many, alike on
# every side.
lay() {
  local first number names folder each=${5:-100}
  for ((first = 0; first < $3; first += each)); do
    folder=$work/$1/Jobs/site$((first / each))
    names=()
    for ((number = first; number < first + each && number < $3; number++)); do
      names+=("$2$number.qvj")
    done
    mkdir -p "$folder"
    (
      cd "$folder"
      if [ "$4" -gt 0 ]; then
        head -c "$4" "$work/noise" | tee "${names[@]}" >/dev/null
      fi
      touch -d "2024-03-01 12:00 UTC + $((first / each)) minutes" "${names[@]}"
    )
  done
}
clear_sides() {
  rm -rf "$work/pc" "$work/device"
  mkdir -p "$work/pc/Jobs" "$work/device/Jobs"
}
# Files p... are the PC's own and d... the device's: takes back what a first synchronization has copied.
take_back() {
  find "$work/pc" -name 'd*.qvj' -delete
  find "$work/device" -name 'p*.qvj' -delete
  sync
}

# measure CASE RUNS ARGUMENT...: runs the bench program in each of which a case is one line or more. What Wine's
# own processes complain about is no failure of a case: all that is said is shown only where one failed.
measure() {
  local name=$1 runs=$2 run
  shift 2
  echo "  $name" >&2
  for ((run = 0; run < runs; run++)); do
    [ "${before_each:-}" = "" ] || "$before_each"
    DLL_FOLDER=$release/folder_device FOLDER_DEVICE_ROOT=$(windows_path "$work/device") \
      timeout 400 tools/wine.sh "$release/bench/orvane_bench.exe" "$@" </dev/null 2>>"$work/said.txt" |
      tr -d '\r' | jq -c --arg case "$name" '{case: $case} + .' >>"$raw" ||
      echo "$name: did not run to its end" >>"$work/errors.txt"
  done
}
# measure_sync CASE RUNS [BACKUPS]
measure_sync() { measure "$1" "$2" sync "$(windows_path "$work/pc/Jobs")\\" "${3:-0}"; }

# on_one_processor COMMAND...: with Wine's server there as well. On two, each call of the server costs a
# multiple as soon as the system wakes it on the other processor, from which on it stays there: mostly after
# some 50 ms. A long run then looks worse than a short one by more than its length.
on_one_processor() (
  processor=$(taskset -cp "$BASHPID" | sed 's/.*: //; s/[-,].*//')
  taskset -cp "$processor" "$BASHPID" >/dev/null
  source tools/wine_prefix.sh
  end_wine_server() {
    /usr/lib/wine/wineserver -k || true # There may be none.
    /usr/lib/wine/wineserver -w
  }
  end_wine_server
  trap end_wine_server EXIT
  "$@"
)

# What a user would pick instead, on the same folders: both ways, one after the other.
xcopy_both() {
  local pc device
  pc=$(windows_path "$work/pc/Jobs")
  device=$(windows_path "$work/device/Jobs")
  tools/wine.sh xcopy "$pc\\*" "$device\\" /D /S /Y </dev/null >/dev/null 2>&1
  tools/wine.sh xcopy "$device\\*" "$pc\\" /D /S /Y </dev/null >/dev/null 2>&1
}
rsync_both() {
  rsync -a --update "$work/pc/Jobs/" "$work/device/Jobs/"
  rsync -a --update "$work/device/Jobs/" "$work/pc/Jobs/"
}
measure_other() { # CASE RUNS FUNCTION
  local run start
  echo "  $1" >&2
  for ((run = 0; run < $2; run++)); do
    [ "${before_each:-}" = "" ] || "$before_each"
    start=${EPOCHREALTIME/./}
    "$3" || echo "$1: failed" >>"$work/errors.txt"
    printf '{"case": "%s", "ms": %s}\n' "$1" "$(((${EPOCHREALTIME/./} - start) / 1000))" >>"$raw"
  done
}

decision_cases() {
  local count
  for count in $(of_size 10000) $(of_size 40000) $(of_size 160000); do
    measure "decision folders $count" 9 decision "$count" 100 0 1
    measure "decision one $count" 9 decision "$count" "$count" 0 1
  done
  count=$(of_size 40000)
  measure "decision close" 5 decision "$count" 100 2 1
  measure "decision strewn" 5 decision "$count" "$count" 0 7919
}

nothing_cases() {
  local count
  for count in $(of_size 10000) $(of_size 40000); do
    clear_sides
    lay pc p "$count" 0
    lay device p "$count" 0
    measure_sync "nothing $count" 3
    on_one_processor measure_sync "nothing $count one" 5
    measure_other "nothing $count rsync" 3 rsync_both
    if [ "$count" = "$(of_size 10000)" ]; then
      measure_other "nothing $count xcopy" 3 xcopy_both
    fi
  done
}

# first_case NAME COUNT BYTES
first_case() {
  clear_sides
  lay pc p "$2" "$3"
  lay device d "$2" "$3"
  local before_each=take_back
  measure_sync "$1" 3
  if [ "$(find "$work/pc" "$work/device" -name '*.qvj' -size "$3c" | wc -l)" != $((4 * $2)) ]; then
    echo "$1: not all files were copied" >>"$work/errors.txt"
  fi
  measure_other "$1 xcopy" 3 xcopy_both
  measure_other "$1 rsync" 3 rsync_both
}

# Every copy with the same chunk of less than 8192 bytes: what differs is what becomes of the old file.
call_cases() {
  local to from old count
  count=$(of_size 100)
  for to in device pc; do
    from=$([ $to = pc ] && echo device || echo pc)
    for old in new replaced kept; do
      clear_sides
      lay $from f "$count" 1024
      if [ $old != new ]; then
        lay $to f "$count" 512
        find "$work/$to" -name '*.qvj' -exec touch -d "2024-02-01 UTC" {} +
      fi
      measure_sync "calls $to $old" 1 $([ $old = kept ] && echo 1)
      if [ "$(find "$work/$to" -name '*.qvj' -size 1024c | wc -l)" != "$count" ] ||
        { [ $old = kept ] && [ "$(find "$work/$to" -name '*.001' -size 512c | wc -l)" != "$count" ]; }; then
        echo "calls $to $old: not all files were copied" >>"$work/errors.txt"
      fi
    done
  done
}

# A device that is slow enough for its listing alone to take seconds, with some files to copy.
slow_cases() {
  local count side
  count=$(of_size 50)
  clear_sides
  for side in pc device; do
    lay $side s $((2 * count)) 0 2
  done
  lay pc p 8 1024
  lay device d 8 1024
  local before_each=take_back
  FOLDER_DEVICE_CALL_DELAY=20 measure_sync "slow calls" 3
}

latency_cases() {
  local delay
  clear_sides
  lay pc p 100 20480
  lay device d 100 20480
  local before_each=take_back
  for delay in 1 5; do
    FOLDER_DEVICE_CALL_DELAY=$delay measure_sync "latency $delay" 3
  done
}

list_cases() {
  local count
  for count in $(of_size 10000) $(of_size 100000); do
    clear_sides
    lay pc p "$count" 0
    lay device d "$count" 0
    measure "lists $count" 1 lists "$(windows_path "$work/pc/Jobs")\\"
  done
  clear_sides
  measure_other "start xcopy" 3 xcopy_both
  lay device d "$(of_size 200000)" 0 # 2,000 folders
  measure listing 1 listing
}

start_cases() {
  clear_sides
  tools/settings.sh SyncPath_DT "${work////\\}/pc/Jobs/" SyncPath_CE /Jobs/ Start_File_View 0
  measure "start" 1 start "$(windows_path "$release/orvanelink.exe")"
}

all_cases() {
  mkdir -p "$work"
  rm -f "$raw" "$work/errors.txt" "$work/said.txt"
  head -c 8388608 /dev/urandom >"$work/noise"
  decision_cases
  nothing_cases
  first_case "first small" "$(of_size 1000)" 20480
  first_case "first big" "$(of_size 20)" 8388608
  call_cases
  latency_cases
  slow_cases
  list_cases
  start_cases
  rm -rf "$work/pc" "$work/device" "$work/noise"
}
