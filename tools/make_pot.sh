#!/usr/bin/env bash
# Collects the texts to be translated from the sources and the dialog templates into res/lang/orvanelink.pot.
# A comment "Translators: ..." before a text goes with it.
#
#   tools/make_pot.sh          write the file
#   tools/make_pot.sh --check  fail if it is not what the sources and templates hold
#   tools/make_pot.sh --merge  write it and bring the catalogs up to it; new texts come in untranslated
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."
pot=res/lang/orvanelink.pot
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

mapfile -t sources < <(find . -path ./build -prune -o -path ./tests -prune -o \
  -name '*.cpp' -print -o -name '*.h' -print | sed 's|^\./||' | LC_ALL=C sort)
mapfile -t templates < <(find res -name '*.rc' | LC_ALL=C sort)

# xgettext sees only literals: a named array of characters would pass the compiler and be missed here.
if grep -nE '\bXlate(Key)?\(k[A-Z]' "${sources[@]}"; then
  echo "A text to be translated stands in the call itself." >&2
  exit 1
fi

# A template's texts as calls, line for line: what stands in quotes behind the first word of a statement. What
# only marks a place, or is replaced before it is seen, is left out.
mkdir "$work/res"
for template in "${templates[@]}"; do
  sed -E -e '/^ *\/\/ *Translators:/b' -e '/^ *(BLOCK|CLASS|VALUE) /s/.*//' \
    -e 's/^ *[A-Z]+ +("([^"]|"")+").*/Xlate(\1)/' -e t -e 's/.*//' "$template" |
    sed -E -e '/^Xlate\("(Static|Tree2|Desktop-Mobille Device Synchronization)"\)$/s/.*//' \
      -e 's/""/\\"/g' >"$work/$template"
done

# A text of blanks has nothing to translate.
xgettext --language=C++ --from-code=UTF-8 --keyword --keyword=Xlate --keyword=XlateKey --add-comments=Translators: \
  --add-location=file --sort-output --package-name=Orvanelink --directory="$work" --directory=. --output=- \
  "${sources[@]}" "${templates[@]}" | sed 's/charset=CHARSET/charset=UTF-8/' |
  msggrep --invert-match --msgid --extended-regexp --regexp='^ +$' - |
  sed -e '/^"\(POT-Creation-Date\|Report-Msgid-Bugs-To\):/d' \
    -e 's/YEAR-MO-DA HO:MI+ZONE/2026-11-21 00:00+0000/' -e 's/FULL NAME <EMAIL@ADDRESS>/Orvanelink/' \
    -e 's/LANGUAGE <LL@li.org>/Orvanelink/' -e '1i # Made by tools/make_pot.sh: the texts of the program, for a catalog in a new language.' \
    >"$work/new.pot"

# Where a text stands is of no matter to the catalogs.
comparable() { msgcat --no-location "$1"; }

case ${1:-} in
  --check) diff -u <(comparable "$pot") <(comparable "$work/new.pot") || { echo "Run tools/make_pot.sh --merge" >&2 && exit 1; } ;;
  --merge)
    cp "$work/new.pot" "$pot"
    for catalog in res/lang/*.po; do
      msgmerge --quiet --no-fuzzy-matching --add-location=file --sort-output --output-file="$work/merged.po" "$catalog" "$pot"
      msgattrib --no-obsolete --output-file="$catalog" "$work/merged.po"
    done
    ;;
  "") cp "$work/new.pot" "$pot" ;;
  *) sed -n '5,7s/^# \{0,1\}//p' "$0" && exit 2 ;;
esac
