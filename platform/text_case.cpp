#include "platform/text_case.h"

#include <windows.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <memory>

// Exported by ntdll.dll on every Windows NT; the documentation gives it for drivers, the import library
// has it for programs.
extern "C" NTSYSAPI WCHAR NTAPI RtlUpcaseUnicodeChar(WCHAR unit);

namespace orvane {

namespace {

using FoldTable = std::array<wchar_t, 0x10000>;

// The folding of every unit, read once from the system: a comparison costs no call.
std::unique_ptr<FoldTable> ReadFoldTable() {
    auto table = std::make_unique<FoldTable>();
    for (std::size_t unit = 0; unit < table->size(); ++unit) {
        (*table)[unit] = RtlUpcaseUnicodeChar(static_cast<wchar_t>(unit));
    }
    return table;
}

const FoldTable& Folding() {
    static const std::unique_ptr<FoldTable> table = ReadFoldTable();
    return *table;
}

}  // namespace

bool SameIgnoringCase(wchar_t a, wchar_t b) {
    const FoldTable& folding = Folding();
    return folding[a] == folding[b];
}

bool EqualIgnoringCase(std::wstring_view a, std::wstring_view b) {
    const FoldTable& folding = Folding();
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), [&folding](wchar_t left, wchar_t right) {
        return left == right || folding[left] == folding[right];
    });
}

std::size_t HashIgnoringCase(std::wstring_view text) {
    const FoldTable& folding = Folding();
    // FNV-1a, 64 bits, over the folded units.
    std::uint64_t hash = 0xCBF29CE484222325U;
    for (const wchar_t unit : text) {
        hash = (hash ^ folding[unit]) * 0x100000001B3U;
    }
    return static_cast<std::size_t>(hash);
}

}  // namespace orvane
