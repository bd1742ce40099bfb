#include "programs/reelview/source/clip_source.h"

#include <map>
#include <string_view>

namespace velmora::reelview {
namespace {

constexpr std::size_t kMostDigits = 15;

bool IsDigit(char16_t c) {
    return c >= u'0' && c <= u'9';
}

struct NumberedName {
    std::u16string_view before, after;
    std::uint64_t number;
};

std::optional<NumberedName> Split(std::u16string_view name) {
    std::size_t end = name.find_last_of(u'.');
    if (end == std::u16string_view::npos) end = name.size();
    while (end > 0 && !IsDigit(name[end - 1])) --end;
    std::size_t start = end;
    while (start > 0 && IsDigit(name[start - 1])) --start;
    if (start == end || end - start > kMostDigits) return std::nullopt;
    std::uint64_t number = 0;
    for (std::size_t i = start; i < end; ++i) number = number * 10 + (name[i] - u'0');
    return NumberedName{name.substr(0, start), name.substr(end), number};
}

std::u16string Digits(std::uint64_t number) {
    const std::string digits = std::to_string(number);
    return {digits.begin(), digits.end()};
}

std::u16string Escaped(std::u16string_view text) {
    std::u16string escaped;
    for (const char16_t c : text) escaped.append(c == u'%' ? 2 : 1, c);
    return escaped;
}

}  // namespace

std::vector<std::u16string> SequenceOf(const std::u16string& name, const std::vector<std::u16string>& names) {
    const auto chosen = Split(name);
    if (!chosen) return {name};
    std::map<std::uint64_t, const std::u16string*> numbered;
    for (const std::u16string& other : names) {
        const auto split = Split(other);
        if (split && split->before == chosen->before && split->after == chosen->after) {
            numbered.emplace(split->number, &other);
        }
    }
    numbered[chosen->number] = &name;
    auto first = numbered.find(chosen->number);
    while (first != numbered.begin() && std::prev(first)->first + 1 == first->first) --first;
    std::vector<std::u16string> sequence;
    for (auto next = first; next != numbered.end() && next->first == first->first + sequence.size(); ++next) {
        sequence.push_back(*next->second);
    }
    return sequence;
}

std::optional<Numbering> NumberingOf(const std::vector<std::u16string>& paths) {
    const auto first = paths.empty() ? std::nullopt : Split(paths[0]);
    if (!first) return std::nullopt;
    const std::size_t width = paths[0].size() - first->before.size() - first->after.size();
    for (std::size_t i = 1; i < paths.size(); ++i) {
        std::u16string number = Digits(first->number + i);
        if (number.size() < width) number.insert(0, width - number.size(), u'0');
        if (paths[i] != std::u16string(first->before) + number + std::u16string(first->after))
            return std::nullopt;
    }
    const std::u16string format = width == 1 ? u"%d" : u"%0" + Digits(width) + u"d";
    return Numbering{Escaped(first->before) + format + Escaped(first->after), first->number};
}

}  // namespace velmora::reelview
