// The texts of one language file.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <tuple>

namespace velmora::language {

inline constexpr std::size_t kLargestFile = std::size_t{4} << 20;  // bytes
inline constexpr std::size_t kLongestKey = 255;                    // bytes

class LanguageTable {
  public:
    // Reads the bytes of a language file (its form is told at the head of VMReelEffectsLang.xml). Nothing
    // when anything in it is broken or unknown. Throws std::bad_alloc.
    static std::optional<LanguageTable> Read(std::string_view file);

    // The text of a key, zero-terminated and never empty; null when there is none. `languageCode` and `key`
    // are zero-terminated or null; letters of the code may be small or capital.
    const char16_t* Find(const char* languageCode, std::int32_t category, const char* key) const noexcept;

    std::size_t Size() const noexcept { return m_texts.size(); }

  private:
    friend class TableReader;

    // Language code in small letters, category, key.
    using Place = std::tuple<std::string, std::int32_t, std::string>;
    std::map<Place, std::u16string, std::less<>> m_texts;
};

}  // namespace velmora::language
