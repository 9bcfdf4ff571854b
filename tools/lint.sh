#!/usr/bin/env bash
# Holds the sources to .clang-format and .clang-tidy.
#
#   tools/lint.sh [FILE...]            both, for all sources or those named; all of them take some minutes
#   tools/lint.sh --format [FILE...]   the format alone, as ./test does
#   tools/lint.sh --fix [FILE...]      writes the format
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."
task=${1:-}
case $task in
  --format | --fix) shift ;;
  -*) sed -n '4,6s/^# \{0,1\}//p' "$0"; exit 2 ;;
  *) task=--all ;;
esac
tools/setup.sh clang-format
if [ $# -eq 0 ]; then
  mapfile -t files < <(find . -path ./build -prune -o \( -name '*.cpp' -o -name '*.h' \) -printf '%P\n' | sort)
  set -- "${files[@]}"
fi

if [ "$task" = --fix ]; then
  exec clang-format -i "$@"
fi
clang-format --dry-run --Werror "$@"
[ "$task" = --all ] || exit 0

tools/setup.sh clang-tidy
# Clang reads the sources as the cross compiler does: with its headers, but those of the processor, which
# each compiler brings along.
cmake --preset debug >/dev/null 2>&1
flags=(--extra-arg-before=--target=x86_64-w64-mingw32 --extra-arg-before=-nostdinc++)
while read -r folder; do
  flags+=("--extra-arg=-isystem$folder")
done < <(x86_64-w64-mingw32-g++-posix -x c++ -E -v /dev/null 2>&1 >/dev/null |
  sed -n '/^#include </,/^End/s/^ //p' | grep -e /c++ -e '\.\./')
printf '%s\n' "$@" | grep '\.cpp$' |
  xargs -P "$(nproc)" -n 1 clang-tidy --quiet -p build/debug --warnings-as-errors='*' "${flags[@]}" \
    2> >(grep -v -e ' warnings\? generated' -e 'warnings\? treated as error' >&2)
