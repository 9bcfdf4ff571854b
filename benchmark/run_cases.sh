# The cases of ./bench, which sources this file: how their folders are laid out, how often they run. Every
# function that runs something adds lines to $raw: what the bench program prints, with the case's name.
work=$root/build/bench
raw=$work/raw.jsonl
windows_path() { printf 'Z:%s' "${1//\//\\}"; }

# lay SIDE LETTER COUNT BYTES: files LETTER<number>.qvj in folders of 100, alike on every side.
lay() {
  local first number names folder
  for ((first = 0; first < $3; first += 100)); do
    folder=$work/$1/Jobs/site$((first / 100))
    names=()
    for ((number = first; number < first + 100 && number < $3; number++)); do
      names+=("$2$number.qvj")
    done
    mkdir -p "$folder"
    (
      cd "$folder"
      if [ "$4" -gt 0 ]; then
        head -c "$4" "$work/noise" | tee "${names[@]}" >/dev/null
      fi
      touch -d "2024-03-01 12:00 UTC + $((first / 100)) minutes" "${names[@]}"
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

# measure CASE RUNS ARGUMENT...: runs the bench program in each of which a case is one line or more.
measure() {
  local name=$1 runs=$2 run
  shift 2
  echo "  $name" >&2
  for ((run = 0; run < runs; run++)); do
    [ "${before_each:-}" = "" ] || "$before_each"
    DLL_FOLDER=$release/folder_device FOLDER_DEVICE_ROOT=$(windows_path "$work/device") \
      timeout 400 tools/wine.sh "$release/bench/orvane_bench.exe" "$@" </dev/null 2>>"$work/errors.txt" |
      tr -d '\r' | jq -c --arg case "$name" '{case: $case} + .' >>"$raw" ||
      echo "$name: did not run to its end" >>"$work/errors.txt"
  done
}
measure_sync() { measure "$1" "$2" sync "$(windows_path "$work/pc/Jobs")\\"; }

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

all_cases() {
  mkdir -p "$work"
  rm -f "$raw" "$work/errors.txt"
  head -c 8388608 /dev/urandom >"$work/noise"
  decision_cases
  nothing_cases
  first_case "first small" "$(of_size 1000)" 20480
  first_case "first big" "$(of_size 20)" 8388608
  latency_cases
  list_cases
  rm -rf "$work/pc" "$work/device" "$work/noise"
}
