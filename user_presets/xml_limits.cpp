#include "user_presets/file_access.h"

#include <cstring>

namespace velmora {

namespace {

// These follow the "C" locale. A host's locale may treat more bytes as blanks; a document that would be read
// differently because of that is refused rather than let through (see Attribute).
bool IsBlank(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

bool IsNameStart(char c) {
    const auto byte = static_cast<unsigned char>(c);
    return (byte >= 'a' && byte <= 'z') || (byte >= 'A' && byte <= 'Z') || byte == '_' || byte >= 127;
}

bool IsNameCharacter(char c) {
    return IsNameStart(c) || (c >= '0' && c <= '9') || c == '-' || c == '.' || c == ':';
}

class Scanner {
  public:
    explicit Scanner(const char* document) : m_at(document) {}

    bool Run() {
        for (;;) {
            if (!SkipText()) return false;
            if (*m_at == '\0') return m_depth == 0;
            if (++m_nodes > kXmlNodeLimit) return false;
            if (!Markup()) return false;
            if (m_isOver) return true;
        }
    }

  private:
    bool StartsWith(const char* text) const { return std::strncmp(m_at, text, std::strlen(text)) == 0; }

    bool StartsWithLetters(const char* lower) const {
        for (const char* p = m_at; *lower != '\0'; ++p, ++lower) {
            const char folded = *p >= 'A' && *p <= 'Z' ? static_cast<char>(*p + ('a' - 'A')) : *p;
            if (folded != *lower) return false;
        }
        return true;
    }

    void SkipBlanks() {
        while (IsBlank(*m_at)) ++m_at;
    }

    // Skips to the next markup. Outside the root element the parser stops at any text, without an error.
    bool SkipText() {
        SkipBlanks();
        if (*m_at == '<' || *m_at == '\0') return true;
        if (m_depth == 0) {
            m_at = "";
            return true;
        }
        ++m_nodes;
        return SkipCharacters("<&");
    }

    // Skips to the first of the two characters in `endAndAmpersand`. The parser looks for the end of a numeric
    // reference first and then reads its digits backwards until the first "x" or "#", so a malformed reference swallows
    // any text, including markup. Such a document is refused.
    bool SkipCharacters(const char* endAndAmpersand) {
        for (;;) {
            m_at += std::strcspn(m_at, endAndAmpersand);
            if (*m_at != '&') return true;
            ++m_at;
            if (*m_at != '#') continue;
            ++m_at;
            const bool isHexadecimal = *m_at == 'x';
            if (isHexadecimal) ++m_at;
            m_at += std::strspn(m_at, isHexadecimal ? "0123456789abcdefABCDEF" : "0123456789");
            if (*m_at != ';') {
                m_swallows = true;
                return false;
            }
        }
    }

    // Moves past the next occurrence of a text; to the end of the document when there is none.
    bool SkipPast(const char* text) {
        const char* found = std::strstr(m_at, text);
        m_at = found != nullptr ? found + std::strlen(text) : m_at + std::strlen(m_at);
        return found != nullptr;
    }

    bool Markup() {
        if (m_depth > 0 && StartsWith("</")) {
            --m_depth;
            return SkipPast(">");
        }
        if (StartsWithLetters("<?xml")) return Declaration();
        if (StartsWith("<!--")) return Skip("<!--", "-->");
        if (StartsWith("<![CDATA[")) return Skip("<![CDATA[", "]]>");
        if (IsNameStart(m_at[1])) return Element();
        return Skip("<", ">");
    }

    // A missing end is an error only inside an element.
    bool Skip(const char* start, const char* end) {
        m_at += std::strlen(start);
        return SkipPast(end) || m_depth == 0;
    }

    bool Declaration() {
        m_at += std::strlen("<?xml");
        while (*m_at != '\0' && *m_at != '>') {
            SkipBlanks();
            if (StartsWithLetters("version") || StartsWithLetters("encoding") ||
                StartsWithLetters("standalone")) {
                if (Attribute()) continue;
                m_isOver = m_depth == 0 && !m_swallows;
                return m_isOver;
            }
            while (*m_at != '\0' && *m_at != '>' && !IsBlank(*m_at)) ++m_at;
        }
        if (*m_at == '\0') return m_depth == 0;
        ++m_at;
        return true;
    }

    bool Element() {
        ++m_at;
        while (IsNameCharacter(*m_at)) ++m_at;
        for (int attributes = 0;; ++attributes) {
            SkipBlanks();
            if (StartsWith("/>")) {
                m_at += 2;
                return m_depth < kXmlDepthLimit;
            }
            if (*m_at == '>') {
                ++m_at;
                return ++m_depth <= kXmlDepthLimit;
            }
            if (attributes == kXmlAttributeLimit || !Attribute()) return false;
        }
    }

    // False for anything that is not an attribute or is cut off by the end of the document.
    bool Attribute() {
        if (!IsNameStart(*m_at)) return false;
        while (IsNameCharacter(*m_at)) ++m_at;
        SkipBlanks();
        if (*m_at != '=') return false;
        ++m_at;
        SkipBlanks();
        if (*m_at == '"' || *m_at == '\'') {
            const char ends[] = {*m_at++, '&', '\0'};
            if (!SkipCharacters(ends) || *m_at == '\0') return false;
            ++m_at;
            return *m_at != '\0';
        }
        while (*m_at != '\0' && !IsBlank(*m_at) && *m_at != '/' && *m_at != '>') {
            if (*m_at == '"' || *m_at == '\'') return false;
            ++m_at;
        }
        return *m_at != '\0';
    }

    const char* m_at;
    int m_depth = 0;
    int m_nodes = 0;
    bool m_isOver = false;    // the parser stops here without an error
    bool m_swallows = false;  // a malformed reference was found
};

}  // namespace

bool IsWithinXmlLimits(const char* document) noexcept {
    return Scanner(document).Run();
}

}  // namespace velmora
