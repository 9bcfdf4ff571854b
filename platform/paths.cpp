#include "platform/paths.h"

#include <algorithm>
#include <array>

#include "platform/text_case.h"

namespace orvane {

namespace {

// The names that the PC takes for devices in every folder. The documentation of file naming lists them, the
// superscript digits included.
bool IsPcDeviceName(std::wstring_view name) {
    static constexpr std::array<std::wstring_view, 6> kPlain = {L"CON", L"PRN",    L"AUX",
                                                                L"NUL", L"CONIN$", L"CONOUT$"};
    static constexpr std::wstring_view kPortDigits = L"0123456789\u00B9\u00B2\u00B3";

    std::wstring_view stem = name.substr(0, name.find(L'.'));
    stem = stem.substr(0, stem.find_last_not_of(L' ') + 1);
    if (std::any_of(kPlain.begin(), kPlain.end(),
                    [stem](std::wstring_view plain) { return EqualIgnoringCase(stem, plain); })) {
        return true;
    }
    const bool is_port = stem.size() == 4 && (EqualIgnoringCase(stem.substr(0, 3), L"COM") ||
                                              EqualIgnoringCase(stem.substr(0, 3), L"LPT"));
    return is_port && kPortDigits.find(stem[3]) != std::wstring_view::npos;
}

}  // namespace

std::wstring_view WithoutTrailingBackslashes(std::wstring_view path) {
    return path.substr(0, path.find_last_not_of(L'\\') + 1);
}

std::wstring WithTrailingBackslash(std::wstring_view path) {
    std::wstring result(path);
    if (result.empty() || result.back() != L'\\') {
        result += L'\\';
    }
    return result;
}

std::wstring JoinPath(std::wstring_view folder, std::wstring_view name) {
    return WithTrailingBackslash(folder).append(name);
}

std::wstring_view ParentPath(std::wstring_view path) {
    path = WithoutTrailingBackslashes(path);
    const std::size_t cut = path.rfind(L'\\');
    return cut == std::wstring_view::npos ? std::wstring_view() : path.substr(0, cut);
}

bool IsUncRoot(std::wstring_view path) {
    path = WithoutTrailingBackslashes(path);
    return path.starts_with(L"\\\\") && std::ranges::count(path.substr(2), L'\\') <= 1;
}

bool IsPcFolderNamed(std::wstring_view folder) {
    return !WithoutTrailingBackslashes(folder).empty();
}

bool IsPathComponent(std::wstring_view name) {
    static constexpr std::wstring_view kForbidden = L"<>:\"/\\|?*";
    return !name.empty() && name != L"." && name != L".." &&
           std::none_of(name.begin(), name.end(), [](wchar_t unit) {
               return unit < L' ' || kForbidden.find(unit) != std::wstring_view::npos;
           });
}

bool IsSafePcName(std::wstring_view name) {
    return IsPathComponent(name) && name.back() != L'.' && name.back() != L' ' && !IsPcDeviceName(name);
}

bool IsSafePcRelativePath(std::wstring_view relative) {
    if (!relative.empty() && relative.front() == L'\\') {
        relative.remove_prefix(1);
    }
    for (;;) {
        const std::size_t cut = relative.find(L'\\');
        if (!IsSafePcName(relative.substr(0, cut))) {
            return false;
        }
        if (cut == std::wstring_view::npos) {
            return true;
        }
        relative.remove_prefix(cut + 1);
    }
}

}  // namespace orvane
