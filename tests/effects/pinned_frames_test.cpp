// Compares frames made by the effects with the digests of pinned_frames.txt and lists those that have changed.
//
//   pinned_frames_test           compares; exit code 1 when a frame has changed
//   pinned_frames_test --write   prints the table with the digests of this build

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <cstdio>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "effects/effect_session.h"

namespace velmora::effects {
namespace {

constexpr std::string_view kTable =
#include "pinned_frames_text.inc"
    ;

std::vector<std::string_view> Split(std::string_view text, std::string_view separator) {
    std::vector<std::string_view> parts;
    for (std::size_t end; (end = text.find(separator)) != std::string_view::npos;
         text.remove_prefix(end + separator.size()))
        parts.push_back(text.substr(0, end));
    parts.push_back(text);
    return parts;
}

template <typename Number>
Number Read(std::string_view text, int base = 10) {
    Number number{};
    const char* const end = text.data() + text.size();
    const auto read = std::from_chars(text.data(), end, number, base);
    if (read.ec != std::errc() || read.ptr != end)
        throw std::runtime_error("no number: " + std::string(text));
    return number;
}

// The index of the name in a list of names.
std::uint32_t Find(std::string_view name, auto&& names) {
    const auto found = std::ranges::find(names, name);
    if (found == names.end()) throw std::runtime_error("not known: " + std::string(name));
    return static_cast<std::uint32_t>(found - names.begin());
}

void Set(EffectSession& session, std::string_view setting) {
    const std::size_t equals = setting.find('=');
    const std::string_view name = setting.substr(0, equals), value = setting.substr(equals + 1);
    const auto& params = session.Effect().params;
    std::uint32_t index = 0;
    while (index < params.size() && params[index].name != name) ++index;
    if (index == params.size()) throw std::runtime_error("not known: " + std::string(name));
    const ParamRow& param = params[index];
    if (param.kind == kKindSlider) {
        const auto shown = static_cast<float>(Read<int>(value));
        session.SetValue(index, {.number = (shown - param.minimum) / (param.maximum - param.minimum)});
    } else if (param.kind == kKindMenu) {
        session.SetValue(index, {.bits = Find(value, param.items)});
    } else {
        // #RRGGBB as it is written; the stored word has red lowest.
        const auto rgb = Read<std::uint32_t>(value.substr(1), 16);
        session.SetValue(index, {.bits = rgb >> 16 | (rgb & 0xFF00u) | (rgb & 0xFFu) << 16});
    }
}

// A picture with everything that effects react to: ramps of each channel, grain, lights on black, every alpha.
std::vector<std::uint8_t> Painted(std::int32_t width, std::int32_t height) {
    std::vector<std::uint8_t> bytes;
    bytes.reserve(static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4);
    std::uint32_t noise = 1;
    for (std::int32_t y = 0; y < height; ++y) {
        for (std::int32_t x = 0; x < width; ++x) {
            noise = noise * 1664525u + 1013904223u;
            const std::int32_t dx = 4 * x - 3 * width, dy = 4 * y - height;
            const bool isLight = dx * dx + dy * dy < height * height / 4;
            const bool isDark = x > width / 2;
            const auto grain = static_cast<std::int32_t>(noise >> 27);
            const std::int32_t blue = 224 * y / height + grain, green = 224 * x / width + grain;
            for (const std::int32_t channel : {blue, green, 255 - blue})
                bytes.push_back(static_cast<std::uint8_t>(isLight ? 255 : isDark ? 0 : channel));
            bytes.push_back(static_cast<std::uint8_t>(y < height / 2 ? 255 : x));
        }
    }
    return bytes;
}

// 64-bit FNV-1a.
std::string DigestOf(const std::vector<std::uint8_t>& bytes) {
    std::uint64_t hash = 0xCBF29CE484222325u;
    for (const std::uint8_t byte : bytes) hash = (hash ^ byte) * 0x100000001B3u;
    std::string text(16, '0');
    for (auto digit = text.rbegin(); digit != text.rend(); ++digit, hash >>= 4)
        *digit = "0123456789abcdef"[hash & 15];
    return text;
}

// `columns`: a row of the table.
std::string RenderedDigest(const std::vector<std::string_view>& columns) {
    const auto sameName = [&](const EffectTable* effect) { return effect->name == columns[0]; };
    const auto effect = std::ranges::find_if(kAllEffects, sameName);
    if (effect == kAllEffects.end()) throw std::runtime_error("not known: " + std::string(columns[0]));
    const auto session = EffectSession::Create(**effect);
    const std::vector<std::string_view> settings = Split(columns[1], ", ");
    session->ApplyPreset(Find(settings[0], (*effect)->presetNames));
    for (std::size_t i = 1; i < settings.size(); ++i) Set(*session, settings[i]);
    session->PinRandom(Read<std::uint32_t>(columns[4]));

    const std::size_t cross = columns[2].find('x');
    const auto width = Read<std::int32_t>(columns[2].substr(0, cross));
    const auto height = Read<std::int32_t>(columns[2].substr(cross + 1));
    std::vector<std::uint8_t> source = Painted(width, height), result(source.size());
    const auto recordOf = [&](std::vector<std::uint8_t>& bytes) {
        return FrameRecord{bytes.data(), width, height, width * 4, 0, 0, 0};
    };
    const double seconds = (Read<int>(columns[3]) + 0.5) / 30.0;
    if (!session->Render(recordOf(source), recordOf(result), seconds))
        throw std::runtime_error("not rendered");
    if (result == source) throw std::runtime_error("the row's settings do nothing");
    return DigestOf(result);
}

int Compare(std::string_view row, const std::vector<std::string_view>& columns) {
    const std::string digest = RenderedDigest(columns);
    if (columns.size() > 5 && columns[5] == digest) return 0;
    std::printf("changed: %.*s, now %s\n", static_cast<int>(row.size()), row.data(), digest.c_str());
    return 1;
}

void Write(const std::vector<std::string_view>& columns) {
    for (std::size_t i = 0; i < 5; ++i)
        std::printf("%.*s | ", static_cast<int>(columns[i].size()), columns[i].data());
    std::printf("%s\n", RenderedDigest(columns).c_str());
}

int Run(bool writes) {
    int rows = 0, changed = 0;
    for (const std::string_view row : Split(kTable.substr(0, kTable.rfind('\n')), "\n")) {
        const std::vector<std::string_view> columns = Split(row, " | ");
        if (row.empty() || row[0] == '#') {
            if (writes) std::printf("%.*s\n", static_cast<int>(row.size()), row.data());
            continue;
        }
        if (columns.size() < 5) throw std::runtime_error("too few columns: " + std::string(row));
        ++rows;
        if (writes) {
            Write(columns);
        } else {
            changed += Compare(row, columns);
        }
    }
    if (changed == 0 && rows > 0) return 0;
    std::printf(
        "%d of %d pinned pictures have changed. If that is meant, run scripts/pin-frames and say in "
        "CHANGELOG.md why.\n",
        changed, rows);
    return 1;
}

}  // namespace
}  // namespace velmora::effects

int main(int count, char** arguments) {
    try {
        return velmora::effects::Run(count > 1 && std::string_view(arguments[1]) == "--write");
    } catch (const std::exception& error) {
        std::printf("pinned_frames.txt: %s\n", error.what());
        return 1;
    }
}
