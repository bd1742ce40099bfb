#include "user_presets/dialogs.h"

#include <algorithm>
#include <cstring>
#include <string_view>

#include "api/host_api.h"

namespace velmora {

namespace {

struct LibraryCode {
    const char* libraryName;
    std::u16string_view code;
};

// Other libraries of the family would add their rows here.
constexpr LibraryCode kLibraryCodes[] = {
    {kLibraryName, u"rel"},
};
constexpr std::u16string_view kUnknownLibrary = u"unk";

std::u16string_view FindLibraryCode(const char* libraryName) {
    for (const LibraryCode& row : kLibraryCodes) {
        if (std::strcmp(row.libraryName, libraryName) == 0) return row.code;
    }
    return kUnknownLibrary;
}

char16_t* Put(char16_t* out, std::u16string_view text) {
    return std::copy(text.begin(), text.end(), out);
}

// As much of a label word as `capacity` characters hold, without half a surrogate pair at its end.
std::u16string_view Cut(std::u16string_view word, std::size_t capacity) {
    if (word.size() <= capacity) return word;
    const bool isSplit = capacity > 0 && (word[capacity - 1] & 0xFC00) == 0xD800;
    return word.substr(0, isSplit ? capacity - 1 : capacity);
}

}  // namespace

PresetExtension MakePresetExtension(const char* libraryName, std::uint32_t effectIndex) noexcept {
    PresetExtension extension = {};
    if (libraryName == nullptr) {
        Put(extension.data(), u"prs");
        return extension;
    }
    char16_t* out = Put(Put(extension.data(), u"fxp"), FindLibraryCode(libraryName));
    // No library has more effects than there are letters; an index past "z" gets no letter.
    if (effectIndex < 26) *out = static_cast<char16_t>(u'a' + effectIndex);
    return extension;
}

PresetFilter MakePresetFilter(const char* libraryName, std::uint32_t effectIndex,
                              const char16_t* labelWord) noexcept {
    const PresetExtension buffer = MakePresetExtension(libraryName, effectIndex);
    const std::u16string_view extension(buffer.data());
    const std::u16string_view word = labelWord != nullptr ? labelWord : u"Preset Files";
    // Everything but the word: " (*.", ")" and "*.", the extension twice and three terminators.
    PresetFilter filter = {};
    const std::size_t capacity = filter.size() - (4 + 1 + 2 + 2 * extension.size() + 3);
    char16_t* out = Put(Put(Put(Put(filter.data(), Cut(word, capacity)), u" (*."), extension), u")") + 1;
    Put(Put(out, u"*."), extension);
    return filter;
}

}  // namespace velmora
