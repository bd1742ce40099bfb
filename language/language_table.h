// The texts of one language file.
#pragma once

#include <cstddef>
#include <cstdint>
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
    // Reads the bytes of a language file (format: see the head of VMReelEffectsLang.xml). Nothing when any part of it
    // is broken or unknown. Throws std::bad_alloc.
    static std::optional<LanguageTable> Read(std::string_view file);

    // The text of a key, zero-terminated and never empty; null when there is none. `languageCode` and `key` are
    // zero-terminated or null; the code may be in either case.
    const char16_t* Find(const char* languageCode, std::int32_t category, const char* key) const noexcept;

    std::size_t Size() const noexcept { return m_texts.size(); }

  private:
    friend class TableReader;

    // Identifies a text, so that it can be looked up without allocating.
    struct PlaceView {
        std::string_view code;  // lower case
        std::int32_t category;
        std::string_view key;
    };
    struct Place {
        std::string code;
        std::int32_t category;
        std::string key;

        operator PlaceView() const noexcept { return {code, category, key}; }
    };
    struct Order {
        using is_transparent = void;
        bool operator()(const PlaceView& a, const PlaceView& b) const noexcept {
            return std::tie(a.code, a.category, a.key) < std::tie(b.code, b.category, b.key);
        }
    };
    std::map<Place, std::u16string, Order> m_texts;
};

// Checks a language file before it is parsed into a tree.
//
// The tree parser is recursive, trusts the first byte of a UTF-8 sequence for its length (even past the file's end),
// stops at the first zero byte, and lets through what it does not understand (unknown entities, declarations, text
// after the root). A file that passes here is simple enough that the tree holds exactly what the file says and the
// parser does not overflow the stack.

// Maximum depth of nested elements; the format needs 4.
inline constexpr int kDeepestElement = 8;

// True when the file is well-formed UTF-8 and consists only of an optional byte order mark, an optional XML
// declaration, comments, one root element, elements nested up to kDeepestElement, text within elements, and references
// to the five predefined entities or to characters by number. Attribute values contain neither '<' nor '>'. The names
// of start and end tags are not compared here: the tree parser does that.
bool IsPlainMarkup(std::string_view file) noexcept;

}  // namespace velmora::language
