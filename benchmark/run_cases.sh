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
# Takes files and folders away, emptied. Nothing is deleted before the end: for some minutes a file system may
# keep the places of deleted files free, and each new file is then slower the more there are of them.
put_aside() {
  local aside
  aside=$(mktemp -d "$work/aside.XXXXXX")
  xargs -0 -r mv -t "$aside"
  find "$aside" -type f -size +0 -exec truncate -s 0 {} +
}
clear_sides() {
  mkdir -p "$work/pc" "$work/device"
  printf '%s\0' "$work/pc" "$work/device" | put_aside
  mkdir -p "$work/pc/Jobs" "$work/device/Jobs"
}
# Files p... are the PC's own and d... the device's: takes back what a first synchronization has copied.
take_back() {
  find "$work/pc" -name 'd*.qvj' -print0 | put_aside
  find "$work/device" -name 'p*.qvj' -print0 | put_aside
  sync
}
# So that no run pays for the start of Wine's server.
wake_wine() { tools/wine.sh cmd /c exit </dev/null >/dev/null 2>&1; }

# Names the case that runs; those that are run in turn have one name for all.
tell() { [ -n "${in_turn:-}" ] || echo "  $1" >&2; }

# measure CASE RUNS ARGUMENT...: runs the bench program in each of which a case is one line or more. What Wine's
# own processes complain about is no failure of a case: all that is said is shown only where one failed.
measure() {
  local name=$1 runs=$2 run
  shift 2
  tell "$name"
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
  tell "$1"
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

prepare_first() {
  take_back
  wake_wine
}
# first_case NAME RUNS COUNT BYTES: ours and the others in turn, in any order, so that what the machine does
# meanwhile hits all.
first_case() {
  local run tool before_each=prepare_first
  tell "$1, and xcopy and rsync"
  local in_turn=1
  clear_sides
  lay pc p "$3" "$4"
  lay device d "$3" "$4"
  for ((run = 1; run <= $2; run++)); do
    for tool in $(shuf -e ours xcopy rsync); do
      if [ "$tool" != ours ]; then
        measure_other "$1 $tool" 1 "${tool}_both"
        continue
      fi
      measure_sync "$1" 1
      if [ "$(find "$work/pc" "$work/device" -name '*.qvj' -size "$4c" | wc -l)" != $((4 * $3)) ]; then
        echo "$1, run $run: not all files were copied" >>"$work/errors.txt"
      fi
    done
  done
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
  lay device d "$(of_size 200000)" 0 # 2,000 folders
  measure listing 1 listing
}

start_cases() {
  clear_sides
  before_each=wake_wine measure_other "start xcopy" 9 xcopy_both
  tools/settings.sh SyncPath_DT "${work////\\}/pc/Jobs/" SyncPath_CE /Jobs/ Start_File_View 0
  measure "start" 1 start "$(windows_path "$release/orvanelink.exe")"
}

all_cases() {
  rm -rf "$work"
  mkdir -p "$work"
  head -c 8388608 /dev/urandom >"$work/noise"
  decision_cases
  nothing_cases
  first_case "first small" 5 "$(of_size 1000)" 20480
  first_case "first big" 9 "$(of_size 20)" 8388608
  call_cases
  latency_cases
  slow_cases
  list_cases
  start_cases
  rm -rf "$work"/aside.* "$work/pc" "$work/device" "$work/noise"
}
