#include "programs/reelview/source/sequence_names.h"

#include <cstdint>
#include <map>
#include <optional>
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

}  // namespace velmora::reelview
