#!/usr/bin/env bash
# Installs what building, running and testing need on Debian 12, and the packages named as arguments.
# Does nothing where all is there.
set -eu
packages=(
  g++-mingw-w64-x86-64-posix cmake ninja-build gettext    # building
  googletest                                              # tests
  wine64 fonts-wine fonts-liberation xvfb xauth           # running; the fonts before the first Wine prefix
  imagemagick                                             # screenshots
)
packages+=("$@")
missing=()
for package in "${packages[@]}"; do
  if ! dpkg-query -W -f '${Status}' "$package" 2>/dev/null | grep -q '^install ok installed$'; then
    missing+=("$package")
  fi
done
[ ${#missing[@]} -eq 0 ] && exit 0

as_root=()
if [ "$(id -u)" -ne 0 ]; then
  as_root=(sudo)
fi
echo "Installing ${missing[*]}"
"${as_root[@]}" apt-get update -q </dev/null
"${as_root[@]}" env DEBIAN_FRONTEND=noninteractive apt-get install -y -q --no-install-recommends \
  "${missing[@]}" </dev/null
