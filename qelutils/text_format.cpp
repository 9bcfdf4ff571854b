#include "qelutils/text_format.h"

#include <cstddef>
#include <optional>

namespace qel_text::detail {
namespace {

struct Placeholder {
    size_t number;  // 1 to the count of arguments
    size_t length;  // of its text, braces included
};

// The placeholder that `text`, which begins with "{", begins with.
std::optional<Placeholder> ReadPlaceholder(std::wstring_view text, size_t argument_count) {
    size_t number = 0;
    size_t end = 1;
    for (; end < text.size() && text[end] >= L'0' && text[end] <= L'9'; ++end) {
        number = number * 10 + static_cast<size_t>(text[end] - L'0');
        if (number > argument_count) {
            return std::nullopt;  // Looked at per digit, so that the number cannot overflow.
        }
    }
    if (number == 0 || end == text.size() || text[end] != L'}') {
        return std::nullopt;
    }
    return Placeholder{number, end + 1};
}

}  // namespace

CQelStringT<wchar_t> qel_safefmt_impl(std::wstring_view pattern,
                                      std::initializer_list<std::wstring_view> arguments) {
    std::wstring text;
    while (!pattern.empty()) {
        const size_t literal = pattern.find(L'{');
        text += pattern.substr(0, literal);
        if (literal == std::wstring_view::npos) {
            break;
        }
        pattern.remove_prefix(literal);
        if (const auto placeholder = ReadPlaceholder(pattern, arguments.size())) {
            text += arguments.begin()[placeholder->number - 1];
            pattern.remove_prefix(placeholder->length);
        } else {
            text += L'{';
            pattern.remove_prefix(pattern.starts_with(L"{{") ? 2 : 1);
        }
    }
    return text;
}

}  // namespace qel_text::detail

namespace qel_formats {

qel_text::CQelStringT<wchar_t> IntToString(int number) {
    return std::to_wstring(number);
}

}  // namespace qel_formats
