#include "qelutils/message_catalog.h"

#include <climits>
#include <cstdint>
#include <cstring>
#include <string_view>
#include <utility>
#include <vector>

namespace qel_text {
namespace {

// The start of a .mo file; each table holds a (length, offset) pair per string. What follows it, the hash
// table, is not needed.
struct Header {
    uint32_t magic;
    uint32_t revision;
    uint32_t string_count;
    uint32_t keys_offset;
    uint32_t translations_offset;
};
struct StringPlace {
    uint32_t length;  // without the terminating null
    uint32_t offset;
};
constexpr uint32_t kMagic = 0x950412DE;

// Reads from the content, within its bounds only.
class Reader {
  public:
    explicit Reader(std::span<const std::byte> content) : content_(content) {}

    template <typename T>
    std::optional<T> Read(uint64_t offset) const {
        if (offset > content_.size() || content_.size() - offset < sizeof(T)) {
            return std::nullopt;
        }
        T value;
        std::memcpy(&value, content_.data() + offset, sizeof(T));
        return value;
    }

    // The string at that index of a table, up to its first null: what follows are plural forms.
    std::optional<std::wstring> ReadString(uint32_t table_offset, uint32_t index) {
        const auto place = Read<StringPlace>(table_offset + uint64_t{index} * sizeof(StringPlace));
        if (!place || place->offset > content_.size() || content_.size() - place->offset < place->length) {
            return std::nullopt;
        }
        // Sound strings share no bytes. Without this limit a small damaged file whose strings all cover
        // the whole of it would fill the memory.
        read_ += place->length;
        if (read_ > content_.size()) {
            return std::nullopt;
        }
        const std::string_view whole(reinterpret_cast<const char*>(content_.data()) + place->offset,
                                     place->length);
        return FromUtf8(whole.substr(0, whole.find('\0')));
    }

  private:
    static std::optional<std::wstring> FromUtf8(std::string_view text) {
        if (text.empty()) {
            return std::wstring();
        }
        // UTF-16 never needs more units than UTF-8 has bytes.
        std::wstring wide(text.size(), L'\0');
        const int length = static_cast<int>(text.size());
        const int converted =
            MultiByteToWideChar(CP_UTF8, MB_ERR_INVALID_CHARS, text.data(), length, wide.data(), length);
        if (converted <= 0) {
            return std::nullopt;
        }
        wide.resize(static_cast<size_t>(converted));
        return wide;
    }

    std::span<const std::byte> content_;
    uint64_t read_ = 0;  // bytes of all strings so far
};

BOOL CALLBACK AddLanguage(HMODULE /*module*/, LPCWSTR /*type*/, LPWSTR name, LONG_PTR languages) noexcept {
    if (IS_INTRESOURCE(name)) {
        reinterpret_cast<std::vector<LANGID>*>(languages)->push_back(
            static_cast<LANGID>(reinterpret_cast<ULONG_PTR>(name)));
    }
    return TRUE;
}

}  // namespace

MessageCatalog ParseCatalog(std::span<const std::byte> content) {
    Reader reader(content);
    const auto header = reader.Read<Header>(0);
    // The upper half of the revision is the major one, where 1 adds only strings that no resource of this
    // program has. The size limit is that of the conversion's lengths.
    if (!header || header->magic != kMagic || header->revision >> 16U > 1 || content.size() > INT_MAX) {
        return {};
    }
    MessageCatalog catalog;
    for (uint32_t i = 0; i < header->string_count; ++i) {
        auto key = reader.ReadString(header->keys_offset, i);
        auto translation = reader.ReadString(header->translations_offset, i);
        if (!key || !translation) {
            return {};
        }
        if (!key->empty() && !translation->empty()) {
            catalog.emplace(*std::move(key), *std::move(translation));
        }
    }
    return catalog;
}

std::optional<LANGID> ChooseCatalogLanguage(std::span<const LANGID> available, LANGID wanted) {
    // A language number orders sublanguages within their primary language: neutral 0, default 1, others.
    std::optional<LANGID> best;
    for (const LANGID language : available) {
        if (language == wanted) {
            return language;
        }
        if (PRIMARYLANGID(language) == PRIMARYLANGID(wanted) && (!best || language < *best)) {
            best = language;
        }
    }
    return best;
}

MessageCatalog LoadCatalog(LANGID wanted) {
    // The languages are listed and one of them asked for by its number: by itself the system would fall
    // back to languages that the user did not choose.
    HMODULE program = GetModuleHandleW(nullptr);
    std::vector<LANGID> available;
    EnumResourceNamesW(program, kCatalogType, AddLanguage, reinterpret_cast<LONG_PTR>(&available));
    const auto language = ChooseCatalogLanguage(available, wanted);
    if (!language) {
        return {};
    }
    HRSRC resource = FindResourceExW(program, kCatalogType, MAKEINTRESOURCEW(*language), *language);
    HGLOBAL loaded = resource != nullptr ? LoadResource(program, resource) : nullptr;
    const void* content = loaded != nullptr ? LockResource(loaded) : nullptr;
    if (content == nullptr) {
        return {};
    }
    return ParseCatalog({static_cast<const std::byte*>(content), SizeofResource(program, resource)});
}

}  // namespace qel_text
