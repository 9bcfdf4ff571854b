#include "qelutils/message_catalog.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace qel_text {
namespace {

// The catalog file that is built into this program.
std::string GermanFile() {
    HRSRC resource = FindResourceW(nullptr, MAKEINTRESOURCEW(0x0007), kCatalogType);
    return {static_cast<const char*>(LockResource(LoadResource(nullptr, resource))),
            SizeofResource(nullptr, resource)};
}

// Parses a copy that ends where readable memory ends, so that a read behind it is a crash.
MessageCatalog Parse(const std::string& content) {
    constexpr size_t kReadable = 0x10000;
    static char* const end =
        static_cast<char*>(VirtualAlloc(nullptr, 2 * kReadable, MEM_RESERVE, PAGE_NOACCESS)) + kReadable;
    VirtualAlloc(end - kReadable, kReadable, MEM_COMMIT, PAGE_READWRITE);
    std::memcpy(end - content.size(), content.data(), content.size());
    return ParseCatalog(std::as_bytes(std::span(end - content.size(), content.size())));
}

TEST(MessageCatalog, GivesNoTextsWhenDamagedAnywhere) {
    const std::string sound = GermanFile();
    ASSERT_FALSE(Parse(sound).empty());
    for (size_t size = 0; size + 1 < sound.size(); ++size) {
        EXPECT_TRUE(Parse(sound.substr(0, size)).empty()) << "cut to " << size;
    }
    uint32_t count = 0;
    std::memcpy(&count, &sound[8], sizeof(count));
    for (size_t offset = 0; offset < 28 + size_t{count} * 16; offset += 4) {
        for (const auto number : {0xFFFFFFFFU, static_cast<uint32_t>(sound.size() + 1)}) {
            std::string damaged = sound;
            std::memcpy(&damaged[offset], &number, sizeof(number));
            // The low half of the revision and the two numbers of the hash table are of no matter.
            EXPECT_EQ(Parse(damaged).empty(),
                      (offset != 4 || number > 0xFFFF) && offset != 20 && offset != 24)
                << number << " at " << offset;
        }
    }
    EXPECT_TRUE(Parse(sound.substr(0, sound.size() - 2) + "\xFF").empty()) << "not UTF-8";
}

TEST(MessageCatalog, ChoosesWithinThePrimaryLanguage) {
    using Languages = std::vector<LANGID>;
    constexpr LANGID kNeutral = 0x0007;  // German; the others are of Germany, Austria and Luxembourg
    constexpr LANGID kGermany = 0x0407;
    constexpr LANGID kAustria = 0x0C07;
    constexpr LANGID kLuxembourg = 0x1007;
    constexpr LANGID kFrance = 0x040C;
    EXPECT_EQ(ChooseCatalogLanguage(Languages{kNeutral, kGermany, kAustria}, kAustria), kAustria);
    EXPECT_EQ(ChooseCatalogLanguage(Languages{kLuxembourg, kGermany, kNeutral}, kAustria), kNeutral);
    EXPECT_EQ(ChooseCatalogLanguage(Languages{kLuxembourg, kGermany, kFrance}, kAustria), kGermany);
    EXPECT_EQ(ChooseCatalogLanguage(Languages{kFrance, 0}, kGermany), std::nullopt);
}

}  // namespace
}  // namespace qel_text
