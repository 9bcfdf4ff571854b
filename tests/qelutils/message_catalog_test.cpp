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
    constexpr size_t kHalf = 0x10000;
    static char* const memory =
        static_cast<char*>(VirtualAlloc(nullptr, 2 * kHalf, MEM_RESERVE | MEM_COMMIT, PAGE_READWRITE));
    DWORD before = 0;
    VirtualProtect(memory + kHalf, kHalf, PAGE_NOACCESS, &before);
    char* copy = memory + kHalf - content.size();
    std::memcpy(copy, content.data(), content.size());
    return ParseCatalog(std::as_bytes(std::span(copy, content.size())));
}

TEST(MessageCatalog, GivesNoTextsWhenDamagedAnywhere) {
    const std::string sound = GermanFile();
    ASSERT_FALSE(Parse(sound).empty());
    for (size_t size = 0; size + 1 < sound.size(); ++size) {
        EXPECT_TRUE(Parse(sound.substr(0, size)).empty()) << "cut to " << size;
    }
    uint32_t count = 0;
    std::memcpy(&count, &sound[8], sizeof(count));
    std::string overlapping = sound;
    for (size_t offset = 0; offset < 28 + size_t{count} * 16; offset += 4) {
        for (const auto number : {0xFFFFFFFFU, 0x7FFFFFFFU, static_cast<uint32_t>(sound.size() + 1)}) {
            std::string damaged = sound;
            std::memcpy(&damaged[offset], &number, sizeof(number));
            // The low half of the revision and the two numbers of the hash table are of no matter.
            EXPECT_EQ(Parse(damaged).empty(),
                      (offset != 4 || number > 0xFFFF) && offset != 20 && offset != 24)
                << number << " at " << offset;
        }
        if (offset >= 28 && offset % 8 == 4) {
            // Each string is said to be the keys from the second one on, and together they outgrow the file.
            const uint32_t length = 120;
            std::memcpy(&overlapping[offset], &length, sizeof(length));
            std::memcpy(&overlapping[offset + 4], &sound[28 + 8 + 4], sizeof(uint32_t));
        }
    }
    EXPECT_TRUE(Parse(overlapping).empty());
    EXPECT_TRUE(Parse(sound.substr(0, sound.size() - 2) + "\xFF").empty()) << "not UTF-8";
}

TEST(MessageCatalog, ChoosesWithinThePrimaryLanguage) {
    constexpr LANGID kNeutral = 0x0007;  // German; the others are of Germany, Austria and Luxembourg
    constexpr LANGID kGermany = 0x0407;
    constexpr LANGID kAustria = 0x0C07;
    constexpr LANGID kLuxembourg = 0x1007;
    constexpr LANGID kFrance = 0x040C;
    struct Case {
        std::vector<LANGID> available;
        LANGID wanted;
        std::optional<LANGID> expected;
    };
    const Case cases[] = {
        {{kFrance, kNeutral, kGermany, kAustria}, kAustria, kAustria},
        {{kLuxembourg, kGermany, kNeutral, kFrance}, kAustria, kNeutral},
        {{kLuxembourg, kGermany, kFrance}, kAustria, kGermany},
        {{kFrance, kLuxembourg}, kNeutral, kLuxembourg},
        {{kFrance, 0, 0x0409}, kGermany, std::nullopt},
    };
    for (const Case& c : cases) {
        EXPECT_EQ(ChooseCatalogLanguage(c.available, c.wanted), c.expected) << c.wanted;
    }
}

}  // namespace
}  // namespace qel_text
