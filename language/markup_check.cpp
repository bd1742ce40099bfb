#include "language/language_table.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstddef>
#include <cstdint>
#include <system_error>

#include "text/encodings.h"

namespace velmora::language {
namespace {

constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";
constexpr std::string_view kDeclarationStart = "<?xml ";
constexpr std::string_view kCommentStart = "<!--";
constexpr std::string_view kCommentEnd = "-->";
constexpr std::string_view kWhiteSpace = " \t\r\n";

bool IsCharacter(std::uint32_t value) {
    if (value < 0x20) return value == '\t' || value == '\n' || value == '\r';
    const bool isSurrogate = value >= 0xD800 && value <= 0xDFFF;
    return !isSurrogate && value <= 0x10FFFF && value != 0xFFFE && value != 0xFFFF;
}

// `name` is the text between '&' and ';'.
bool IsKnownReference(std::string_view name) {
    constexpr std::array<std::string_view, 5> kNamed = {"amp", "lt", "gt", "quot", "apos"};
    if (!name.starts_with('#')) return std::find(kNamed.begin(), kNamed.end(), name) != kNamed.end();
    name.remove_prefix(1);
    const int base = name.starts_with('x') ? 16 : 10;
    if (base == 16) name.remove_prefix(1);
    std::uint32_t value = 0;
    const auto [end, error] = std::from_chars(name.data(), name.data() + name.size(), value, base);
    return error == std::errc() && end == name.data() + name.size() && IsCharacter(value);
}

bool HasOnlyKnownReferences(std::string_view text) {
    for (std::size_t at = text.find('&'); at != std::string_view::npos; at = text.find('&', at + 1)) {
        // The longest is "#1114111" with some leading zeros; the limit keeps a file full of '&' fast.
        const std::size_t length = text.substr(at + 1, 16).find(';');
        if (length == std::string_view::npos || !IsKnownReference(text.substr(at + 1, length))) return false;
    }
    return true;
}

class Scanner {
  public:
    explicit Scanner(std::string_view file) : m_rest(file) {}

    bool Scan() {
        if (m_rest.starts_with(kByteOrderMark)) m_rest.remove_prefix(kByteOrderMark.size());
        if (m_rest.starts_with(kDeclarationStart) && !PassDeclaration()) return false;
        while (!m_rest.empty()) {
            if (!PassText()) return false;
            if (m_rest.empty()) break;
            if (m_rest.starts_with(kCommentStart) ? !PassComment() : !PassTag()) return false;
        }
        return m_depth == 0 && m_hasRoot;
    }

  private:
    bool PassText() {
        const std::string_view text = m_rest.substr(0, m_rest.find('<'));
        m_rest.remove_prefix(text.size());
        if (m_depth == 0) return text.find_first_not_of(kWhiteSpace) == std::string_view::npos;
        return HasOnlyKnownReferences(text);
    }

    bool PassComment() {
        const std::size_t end = m_rest.find(kCommentEnd, kCommentStart.size());
        if (end == std::string_view::npos) return false;
        m_rest.remove_prefix(end + kCommentEnd.size());
        return true;
    }

    bool PassDeclaration() {
        const std::string_view tag = TakeTag();
        return tag.ends_with('?');
    }

    // Takes a tag and returns what is between '<' and '>'; empty when there is no such tag. Attribute values contain
    // neither character, so the end of a tag is never ambiguous, however quotes are read.
    std::string_view TakeTag() {
        const std::size_t end = m_rest.find_first_of("<>", 1);
        if (end == std::string_view::npos || m_rest[end] == '<') return {};
        const std::string_view tag = m_rest.substr(1, end - 1);
        m_rest.remove_prefix(end + 1);
        return HasClosedQuotes(tag) && HasOnlyKnownReferences(tag) ? tag : std::string_view();
    }

    static bool HasClosedQuotes(std::string_view tag) {
        for (std::size_t at = tag.find_first_of("\"'"); at != std::string_view::npos;
             at = tag.find_first_of("\"'", at + 1)) {
            at = tag.find(tag[at], at + 1);
            if (at == std::string_view::npos) return false;
        }
        return true;
    }

    bool PassTag() {
        const std::string_view tag = TakeTag();
        if (tag.empty() || tag.front() == '!' || tag.front() == '?') return false;
        if (tag.front() == '/') return --m_depth >= 0;
        if (m_depth == 0 && m_hasRoot) return false;
        m_hasRoot = true;
        if (!tag.ends_with('/')) ++m_depth;
        return m_depth <= kDeepestElement;
    }

    std::string_view m_rest;
    int m_depth = 0;
    bool m_hasRoot = false;
};

bool HasOnlyTextBytes(std::string_view file) {
    return std::all_of(file.begin(), file.end(),
                       [](char byte) { return IsCharacter(static_cast<unsigned char>(byte)); });
}

}  // namespace

bool IsPlainMarkup(std::string_view file) noexcept {
    return HasOnlyTextBytes(file) && IsUtf8(file) && Scanner(file).Scan();
}

}  // namespace velmora::language
