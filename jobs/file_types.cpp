#include "jobs/file_types.h"

#include "platform/text_case.h"

namespace orvane {

namespace {

std::wstring_view ExtensionOf(std::wstring_view name) {
    return name.size() > kExtensionChars ? name.substr(name.size() - kExtensionChars) : name;
}

}  // namespace

FileTypes SynchronizedTypes(FileTypes chosen) {
    chosen[RowOfType(L".img")] = chosen[RowOfType(L".bmp")];
    return chosen;
}

bool PassesExtensionFilter(std::wstring_view name, const FileTypes& types) {
    const std::wstring_view extension = ExtensionOf(name);
    const auto type = std::ranges::find_if(kFileTypes, [extension](const FileType& candidate) {
        return EqualIgnoringCase(extension, candidate.extension);
    });
    return type != kFileTypes.end() && types[static_cast<std::size_t>(type - kFileTypes.begin())];
}

bool IsListedType(std::wstring_view name, const FileTypes& types) {
    return name.size() > kExtensionChars && PassesExtensionFilter(name, types);
}

bool HasCompanionFolder(std::wstring_view name) {
    return IsListedType(name, FileTypes().set(RowOfType(L".wkf")));
}

std::wstring_view CompanionFolder(std::wstring_view name) {
    return name.substr(0, name.size() - kExtensionChars);
}

}  // namespace orvane
