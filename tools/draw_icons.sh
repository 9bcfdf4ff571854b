#!/usr/bin/env bash
# Draws the icons of res/. Every size is a drawing of its own whose edges lie between pixels, so that none is
# blurred: lines and lengths are whole pixels of that size. The icons are checked in; run this after a change here.
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."
tools/setup.sh librsvg2-bin
pictures=$(mktemp -d)
trap 'rm -r "$pictures"' EXIT

# share NUMERATOR: that many 48ths of the size, in whole pixels.
share() { echo $((($1 * size + 24) / 48)); }

# icon NAME DRAWING SIZES [ARGUMENT]: makes NAME.ico, in each size what DRAWING prints as SVG.
# `line` is the width of an outline there.
icon() {
  local size line name
  rm -f "$pictures"/*
  for size in $3; do
    line=$(((size + 16) / 32))
    name=$pictures/$(printf '%03d' "$size")
    {
      echo "<svg xmlns='http://www.w3.org/2000/svg' width='$size' height='$size'>"
      "$2" "${4:-}"
      echo "</svg>"
    } >"$name.svg"
    rsvg-convert -o "$name.png" "$name.svg"
  done
  convert "$pictures"/*.png "res/$1.ico"
}

# outlined COLOR: the shapes of the standard input with an outline, each point of which is the pixel at the line's
# upper left corner.
outlined() {
  local half=$((line / 2)).$((line % 2 * 5))
  echo "<g stroke='$1' stroke-width='$line' transform='translate($half,$half)'>"
  cat
  echo "</g>"
}

# box COLOR LEFT TOP RIGHT BOTTOM
box() { echo "<path fill='$1' d='M $2,$3 H $4 V $5 H $2 z'/>"; }

# Two opposite arrows on blue.
program() {
  local thick edge
  thick=$(share 6)
  edge=$(share 1)
  echo "<rect fill='#2a6f97' x='$edge' y='$edge' width='$((size - 2 * edge))' height='$((size - 2 * edge))'" \
    "rx='$(share 5)'/>"
  arrow ''
  arrow "rotate(180,$((size / 2)),$((size / 2)))"
}

# arrow TRANSFORM: the upper arrow, its tail at the left.
arrow() {
  local left top bottom
  left=$(share 7)
  bottom=$((size / 2 - $(share 2)))
  top=$((bottom - thick))
  echo "<path fill='#fff' transform='$1' d='M $left,$bottom V $top H $((size - left - 2 * thick - 1))" \
    "v -$thick L $((size - left)),$bottom z'/>"
}

# A sheet with a folded corner and three lines of text, the last one shorter.
file() {
  local left top right bottom fold margin step
  left=$(share 8)
  top=$(share 2)
  right=$((size - left - line))
  bottom=$((size - top - line))
  fold=$(share 11)
  margin=$(share 6)
  step=$(share 7)
  outlined '#5b6877' <<END
    <path fill='#fff' d='M $left,$top H $((right - fold)) l $fold,$fold V $bottom H $left z'/>
    <path fill='#c5ced8' stroke-linejoin='bevel' d='M $((right - fold)),$top v $fold h $fold z'/>
END
  local lines
  for lines in 1 2 3; do
    local y=$((bottom - lines * step))
    box '#9ca9b8' $((left + margin)) $y $((right + line - margin - (lines == 1 ? step : 0))) $((y + line))
  done
}

# folder_back WIDTH: what stands behind a folder's front, with its tab. Sets the places that the front needs.
folder_back() {
  left=$(share 2)
  top=$(share 9)
  bottom=$((size - $(share 5) - line))
  tab=$(share 5)
  echo "<path fill='#e8b23c' d='M $left,$top h $(share 15) l $tab,$tab H $1 V $bottom H $left z'/>"
}

folder_closed() {
  local left top bottom tab right
  right=$((size - $(share 2) - line))
  {
    folder_back $right
    box '#ffd873' "$left" $((top + tab + $(share 5))) $right "$bottom"
  } | outlined '#8a6314'
}

folder_open() {
  local left top bottom tab slant right
  slant=$(share 9)
  right=$((size - $(share 1) - line))
  {
    folder_back $((right - slant + $(share 1)))
    echo "<path fill='#ffe49a' d='M $left,$bottom l $slant,$((top + tab + $(share 7) - bottom))" \
      "H $right L $((right - slant)),$bottom z'/>"
  } | outlined '#8a6314'
}

# load_frame NUMBER: a handheld and a computer, and a dot at the first to the fifth place of its way over. Nothing
# is drawn at the bottom: the dialog is a little less high than the icon with some fonts.
load_frame() {
  local bezel radius hand_left hand_right hand_top screen_left screen_right from to
  bezel=$(share 3)
  hand_left=$(share 2)
  hand_right=$(share 15)
  hand_top=$(share 14)
  screen_left=$(share 24)
  screen_right=$((size - $(share 2) - line))
  {
    box '#a4aeba' "$hand_left" "$hand_top" "$hand_right" "$(share 42)"
    box '#7fb2e5' $((hand_left + bezel)) $((hand_top + bezel)) $((hand_right - bezel)) "$(share 29)"
    box '#a4aeba' "$screen_left" "$(share 16)" $screen_right "$(share 35)"
    box '#7fb2e5' $((screen_left + bezel)) $(($(share 16) + bezel)) $((screen_right - bezel)) \
      $(($(share 35) - bezel))
    box '#a4aeba' $((screen_left + bezel)) "$(share 39)" $((screen_right - bezel)) "$(share 42)"
  } | outlined '#3c4653'
  box '#3c4653' $((screen_left + $(share 9))) "$(share 35)" $((screen_right + line - $(share 9))) "$(share 39)"
  box '#e4e9ef' $((hand_left + bezel)) "$(share 33)" $((hand_right + line - bezel)) $(($(share 42) - bezel + line))

  radius=$(share 4)
  from=$(((hand_left + hand_right + line) / 2))
  to=$(((screen_left + screen_right + line) / 2))
  echo "<circle fill='#d2452d' cx='$((from + (to - from) * ($1 - 1) / 4))' cy='$(($(share 1) + radius))'" \
    "r='$radius'/>"
}

icon orvanelink program "16 20 24 32 40 48 64 256"
icon folder_open folder_open "16 20 24 32"
icon folder_closed folder_closed "16 20 24 32 40 48 64"
icon file file "16 20 24 32 40 48 64"
for number in 1 2 3 4 5; do
  icon load_frame_$number load_frame "32 40 48 64" $number
done
