#!/usr/bin/env bash
# Collects what is handed out in a folder: collect.sh FOLDER. Every file gets the time SOURCE_DATE_EPOCH.
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."
folder=$1
rm -rf "$folder"
mkdir -p "$folder"/{guide/pictures,licences,folder_device}

cp build/release/orvanelink.exe "$folder"
cp build/release/folder_device/RAPI.DLL "$folder/folder_device"

# A page of docs/ as HTML; links between the pages stay links.
page() {
  pandoc --from=gfm --to=html5 --template=packaging/page.html --metadata=title:"$2" "docs/$1.md" |
    sed -E 's/(href="[a-z_]+)\.md/\1.html/g' >"$folder/guide/$1.html"
}
page user_guide "Orvanelink: user guide"
page folder_device "Orvanelink: the folder device"
cp docs/pictures/*.png "$folder/guide/pictures"

# text NAME: standard input as a text file of Windows.
text() { sed 's/$/\r/' >"$folder/$1"; }
text folder_device/README.txt <packaging/folder_device.txt
text licences/Orvanelink.txt <LICENSE
# Of what is linked into the program: the C++ library and the compiler's, the C runtime and the threads.
text licences/GCC.txt </usr/share/doc/gcc-mingw-w64-base/copyright
text licences/GPL-3.txt </usr/share/common-licenses/GPL-3
text licences/mingw-w64.txt </usr/share/doc/mingw-w64-x86-64-dev/copyright

find "$folder" -exec touch -d "@$SOURCE_DATE_EPOCH" {} +
