#include "support/mnemonics.h"

namespace velmora::support {
namespace {

// The capital form of a letter that one key types (Latin without accents, Greek, Cyrillic); 0 for all else.
char16_t CapitalLetter(char16_t c) noexcept {
    const auto shifted = [c](int distance) { return static_cast<char16_t>(c - distance); };
    if ((c >= u'A' && c <= u'Z') || (c >= 0x0391 && c <= 0x03A9) || (c >= 0x0410 && c <= 0x042F)) return c;
    if (c >= u'a' && c <= u'z') return shifted(u'a' - u'A');
    if (c == 0x03C2) return 0x03A3;  // final sigma
    if (c >= 0x03B1 && c <= 0x03C9) return shifted(0x20);
    if (c >= 0x0430 && c <= 0x044F) return shifted(0x20);
    return 0;
}

// The letter that a text marks by itself, 0 when none.
char16_t MarkedLetter(std::u16string_view text) noexcept {
    for (std::size_t i = 0; i + 1 < text.size(); ++i) {
        if (text[i] != u'&') continue;
        if (text[i + 1] != u'&') return text[i + 1];
        ++i;
    }
    return 0;
}

}  // namespace

bool MnemonicChooser::Take(char16_t letter) {
    const char16_t capital = CapitalLetter(letter);
    if (capital == 0 || m_taken.find(capital) != std::u16string::npos) return false;
    m_taken.push_back(capital);
    return true;
}

std::u16string MnemonicChooser::Mark(std::u16string_view text, char16_t substitute) {
    std::u16string marked(text);
    if (text.empty()) return marked;
    if (const char16_t own = MarkedLetter(text); own != 0) {
        Take(own);
        return marked;
    }
    for (std::size_t i = 0; i < marked.size(); ++i) {
        if (Take(marked[i])) return marked.insert(i, 1, u'&');
    }
    Take(substitute);
    marked.append(u"(&").append(1, substitute).append(1, u')');
    return marked;
}

}  // namespace velmora::support
