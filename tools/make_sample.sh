#!/usr/bin/env bash
# Lays out a sample job folder on both sides: make_sample.sh FOLDER makes FOLDER/pc/Jobs and
# FOLDER/device/Jobs, and FOLDER/expected with what both must hold after a synchronization of all file types
# that overwrites older files and keeps backups.
set -eu
demo=$1

# put PATH TIME CONTENT: writes a file below the demo folder.
put() {
  mkdir -p "$(dirname "$demo/$1")"
  printf '%s\n' "$3" >"$demo/$1"
  touch -d "$2" "$demo/$1"
}
# expect NAME CONTENT: what both sides must hold; expect_on SIDE NAME CONTENT: what one side must hold.
expect_on() { put "expected/$1/Jobs/$2" "2024-01-01" "$3"; }
expect() { expect_on pc "$1" "$2"; expect_on device "$1" "$2"; }
# only_on SIDE NAME: a file that one side has and the other must get.
only_on() { put "$1/Jobs/$2" "2024-03-01 10:00:00" "$2 from $1"; expect "$2" "$2 from $1"; }

only_on pc site.qvj
only_on pc site.tn3
only_on pc site.rd3
only_on pc site.pt3
only_on pc site.ln3
only_on pc CONTROL.TP3
only_on pc plans/north/plan.xml
only_on device photo.jpg
only_on device map.bmp
only_on device scan.img
only_on device "day 1/notes.txt"
only_on device "day 1/detail/photo 2.jpg"

# A job file takes the folder of its name along, whatever that holds.
only_on pc bridge.wkf
only_on pc bridge/points.dat
only_on pc bridge/raw/observations.dat
only_on device tunnel.wkf
only_on device tunnel/points.dat

# The newer copy wins, and the older one is kept as a backup.
put pc/Jobs/level.qvj "2024-03-02 08:00:00" "level, newer"
put device/Jobs/level.qvj "2024-03-01 17:30:00" "level, older"
expect level.qvj "level, newer"
expect_on device level.qvj.001 "level, older"
put pc/Jobs/road.qvj "2024-03-01 17:30:00" "road, older"
put device/Jobs/road.qvj "2024-03-02 08:00:00" "road, newer"
expect road.qvj "road, newer"
expect_on pc road.qvj.001 "road, older"

# Nine seconds apart on one day is one version: both stay.
put pc/Jobs/same.qvj "2024-03-01 12:00:00" "same, as the PC has it"
put device/Jobs/same.qvj "2024-03-01 12:00:09" "same, as the device has it"
expect_on pc same.qvj "same, as the PC has it"
expect_on device same.qvj "same, as the device has it"

# No type that takes part: these stay where they are.
put pc/Jobs/letter.doc "2024-03-01 09:00:00" "letter"
expect_on pc letter.doc "letter"
put device/Jobs/memo.doc "2024-03-01 09:00:00" "memo"
expect_on device memo.doc "memo"
