#!/usr/bin/env bash
# Holds the sources to README.md's table of rooms: a row names rooms below it only, and a room includes itself
# and the rooms that its row names.
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."
{
  sed -nE 's/^\| `([a-z_]+)\/` \|[^|]*\| ?([^|]*)\|$/row \1 \2/p' README.md | tr -d ,
  find . -path ./build -prune -o -path './[!.]*/*' \( -name '*.cpp' -o -name '*.h' -o -name '*.rc' \) -print0 |
    xargs -0 grep -noE '^ *# *include +"[a-z_]+/' /dev/null
} | awk '
  function wrong(text) { print text; failed = 1 }
  $1 == "row" {
    above[$2] = ++rows
    for (i = 3; i <= NF; i++) {
      if ($i in above) wrong("README.md: " $2 " uses " $i ", which is not below it")
      uses[$2, $i] = 1
    }
    next
  }
  {
    split($0, place, /[\/:"]/)  # ./room/file:line:#include "used/
    room = place[2]
    split($0, quoted, /["]/)
    used = substr(quoted[2], 1, length(quoted[2]) - 1)
    if (room ~ /^(tests|benchmark|tools)$/ || used == room || uses[room, used] ||
        (uses[room, "all"] && used in above)) next
    wrong($0 "  " (room in above ? "is not among what " room "/ uses" : room "/ has no row in README.md"))
  }
  END {
    if (NR < 100 || rows < 10) wrong("README.md or the sources were not read")
    exit failed
  }'
