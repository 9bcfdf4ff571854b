# Names the Wine prefix of this checkout; sourced. It is WINEPREFIX if that is set, else build/wine_prefix_UID:
# Wine wants a prefix to belong to the user who runs it.
export WINEPREFIX=${WINEPREFIX:-$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)/build/wine_prefix_$(id -u)}
