// Case folding for file names: the platform's own ordinal one, that is the upper-case table that the
// system's ordinal comparison uses, applied to one UTF-16 unit at a time. It does not depend on the user's
// language. Hash and comparison rest on the same folding, so that an index finds exactly what a search with
// the comparison would find.
#pragma once

#include <cstddef>
#include <string_view>

namespace orvane {

bool SameIgnoringCase(wchar_t a, wchar_t b);
bool EqualIgnoringCase(std::wstring_view a, std::wstring_view b);

// Equal texts, without regard to case, have equal hashes.
std::size_t HashIgnoringCase(std::wstring_view text);

}  // namespace orvane
