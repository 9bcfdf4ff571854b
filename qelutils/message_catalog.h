// Message catalogs: the user-visible texts in another language, by their English keys. A catalog is the
// binary form (.mo, little-endian, UTF-8) of a gettext .po file, built into the program as a resource of
// type kCatalogType whose number is its language; cmake/message_catalog.cmake makes one. The file format is
// that of the GNU gettext manual, "The Format of GNU MO Files".
#pragma once

#include <windows.h>

#include <cstddef>
#include <functional>
#include <map>
#include <optional>
#include <span>
#include <string>

namespace qel_text {

inline constexpr const wchar_t* kCatalogType = L"MESSAGE_CATALOG";

// English key to translation. Keys and translations are never empty.
using MessageCatalog = std::map<std::wstring, std::wstring, std::less<>>;

// Reads the content of a .mo file. It trusts no number in it: content that is damaged anywhere (cut off, a
// string outside of it, not UTF-8, not the format) gives an empty catalog. Of a plural entry the singular
// is taken; the header entry and entries without a translation are left out.
MessageCatalog ParseCatalog(std::span<const std::byte> content);

// Which of the languages that have a catalog serves a user of language `wanted`: the very same, else the
// same primary language without a sublanguage, else its default sublanguage, else its sublanguage with
// the lowest number. No other primary language is ever taken.
std::optional<LANGID> ChooseCatalogLanguage(std::span<const LANGID> available, LANGID wanted);

// The program's catalog for a user of that language, empty when it has none.
MessageCatalog LoadCatalog(LANGID wanted);

}  // namespace qel_text
