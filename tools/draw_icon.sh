#!/usr/bin/env bash
# Draws the program's icon, res/orvanelink.ico: two opposite arrows on blue. Every size is a drawing of its own
# whose edges lie between pixels, so that none is blurred. The icon is checked in; run this after a change here.
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."
tools/setup.sh librsvg2-bin
pictures=$(mktemp -d)
trap 'rm -r "$pictures"' EXIT

# share NUMERATOR: that many 48ths of the size, in whole pixels.
share() { echo $((($1 * size + 24) / 48)); }

# arrow TRANSFORM: the upper arrow, its tail at the left.
arrow() {
  local left top bottom
  left=$(share 7)
  bottom=$((size / 2 - $(share 2)))
  top=$((bottom - thick))
  echo "<path fill='#fff' transform='$1' d='M $left,$bottom V $top H $((size - left - 2 * thick - 1))" \
    "v -$thick L $((size - left)),$bottom z'/>"
}

for size in 16 20 24 32 40 48 64 256; do
  thick=$(share 6)
  edge=$(share 1)
  {
    echo "<svg xmlns='http://www.w3.org/2000/svg' width='$size' height='$size'>"
    echo "<rect fill='#2a6f97' x='$edge' y='$edge' width='$((size - 2 * edge))' height='$((size - 2 * edge))'" \
      "rx='$(share 5)'/>"
    arrow ''
    arrow "rotate(180,$((size / 2)),$((size / 2)))"
    echo "</svg>"
  } >"$pictures/$size.svg"
  rsvg-convert -o "$pictures/$(printf '%03d' "$size").png" "$pictures/$size.svg"
done
convert "$pictures"/*.png res/orvanelink.ico
