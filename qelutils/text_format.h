// Building texts: the placeholder formatter for translated patterns, and numbers as text. All functions
// are free of state and may be called on any thread.
#pragma once

#include <array>
#include <concepts>
#include <cwchar>
#include <initializer_list>
#include <string>
#include <string_view>

namespace qel_text {

// The string that the text helpers give.
template <class Character>
using CQelStringT = std::basic_string<Character>;

// printf for numbers, for texts that are no sentences and so are never translated (dates, times). The
// pattern is a literal of the caller and must fit the numbers; it takes no texts, so that no pattern can
// make it follow a pointer. The result has at most 255 characters: a longer one comes back empty.
template <std::integral... Numbers>
CQelStringT<wchar_t> Format(const wchar_t* pattern, Numbers... numbers) {
    std::array<wchar_t, 256> buffer{};
    const int length = std::swprintf(buffer.data(), buffer.size(), pattern, numbers...);
    // Not every runtime answers a text that does not fit with a negative number.
    const bool fits = length > 0 && static_cast<size_t>(length) < buffer.size();
    return fits ? std::wstring(buffer.data(), static_cast<size_t>(length)) : std::wstring();
}

namespace detail {

// Fills a pattern that has been translated already: "{1}" stands for the first argument, "{2}" for the
// second and so on, in any order and any number of times; "{{" stands for one "{". All else stays as it
// stands: a "}" that ends no placeholder (also two of them), a "{" that begins none ("{x}", "{", "{1" at
// the end) and a number without an argument ("{0}", "{9}", however many digits), so that a faulty
// translation shows where it is faulty and reads nothing but the given arguments. The text of an argument
// is never looked at for placeholders.
CQelStringT<wchar_t> qel_safefmt_impl(std::wstring_view pattern,
                                      std::initializer_list<std::wstring_view> arguments);

}  // namespace detail
}  // namespace qel_text

namespace qel_formats {

// The number in decimal, with a leading "-" if it is negative and without grouping.
qel_text::CQelStringT<wchar_t> IntToString(int number);

}  // namespace qel_formats
