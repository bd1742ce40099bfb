#include "text/names.h"

#include <cstddef>
#include <vector>

namespace velmora {
namespace {

// One preset kept its first spelling, by which saved projects refer to it.
constexpr std::string_view kSpelt = "fluorescent", kMisspelt = "flourescent";

// What counts when names are compared.
std::string EssenceOf(std::string_view text) {
    std::string kept;
    for (const char c : text) {
        const char lower = ToLower(c);
        if ((lower >= 'a' && lower <= 'z') || (lower >= '0' && lower <= '9')) kept += lower;
    }
    if (const std::size_t at = kept.find(kSpelt); at != std::string::npos) {
        kept.replace(at, kSpelt.size(), kMisspelt);
    }
    return kept;
}

// How many letters must be added, left out, replaced or exchanged with their neighbours to make one of the other.
std::size_t Distance(std::string_view a, std::string_view b) {
    std::vector<std::size_t> beforeLast(b.size() + 1), last(b.size() + 1), row(b.size() + 1);
    for (std::size_t j = 0; j <= b.size(); ++j) row[j] = j;
    for (std::size_t i = 1; i <= a.size(); ++i) {
        beforeLast.swap(last);
        last.swap(row);
        row[0] = i;
        for (std::size_t j = 1; j <= b.size(); ++j) {
            const std::size_t replaced = last[j - 1] + (a[i - 1] == b[j - 1] ? 0 : 1);
            row[j] = std::min({last[j] + 1, row[j - 1] + 1, replaced});
            const bool isExchanged = i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1];
            if (isExchanged) row[j] = std::min(row[j], beforeLast[j - 2] + 1);
        }
    }
    return row[b.size()];
}

}  // namespace

bool IsSameName(std::string_view a, std::string_view b) {
    return EssenceOf(a) == EssenceOf(b);
}

std::optional<std::string> NearestName(std::string_view name, std::span<const std::string> names) {
    const std::string typed = EssenceOf(name);
    if (typed.size() < 3) return std::nullopt;  // anything would be near
    const std::size_t most = std::max<std::size_t>(1, typed.size() / 3);
    std::optional<std::string> nearest;
    std::size_t least = most + 1;
    for (const std::string& each : names) {
        const std::string essence = EssenceOf(each);
        const std::size_t distance = essence.starts_with(typed) ? 1 : Distance(typed, essence);
        if (distance == least && each != nearest) nearest.reset();
        if (distance >= least) continue;
        least = distance;
        nearest = each;
    }
    return nearest;
}

}  // namespace velmora
