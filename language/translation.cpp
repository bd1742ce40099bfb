#include "language/translation.h"

#include <algorithm>
#include <cstring>

#include "api/reference.h"
#include "text/strings.h"

namespace velmora {

TranslationHelper::~TranslationHelper() = default;

void TranslationHelper::SetContext(com::IUnknown* textSource, const char* languageCode) noexcept {
    m_text[0] = 0;
    m_textSource = textSource;
    // Reads at most three bytes of the code: a host may pass a long text.
    const bool isCode = languageCode != nullptr && languageCode[0] != '\0' && languageCode[1] != '\0' &&
                        languageCode[2] == '\0';
    std::memcpy(m_languageCode, isCode ? languageCode : "en", sizeof m_languageCode);
}

const char16_t* TranslationHelper::Translate(std::int32_t category, const char* key, const char* fallback,
                                             bool* wasFound) noexcept {
    m_text[0] = 0;
    const bool isFound = LookUp(category, key);
    if (!isFound) CopyFallback(fallback != nullptr ? fallback : key);
    if (wasFound != nullptr) *wasFound = isFound;
    return m_text;
}

// The interface is requested for every lookup and never kept: the source may gain or lose its language file.
bool TranslationHelper::LookUp(std::int32_t category, const char* key) noexcept {
    if (m_textSource == nullptr) return false;
    const auto texts = QueryFor<IMultiLingual>(*m_textSource, kIidMultiLingual);
    if (!texts) return false;
    const std::int32_t written = texts->GetText(m_languageCode, category, key, m_text, kCapacity);
    m_text[kCapacity - 1] = 0;  // in case another maker's language module did not terminate it
    return written > 0;
}

void TranslationHelper::CopyFallback(const char* fallback) noexcept {
    m_text[0] = 0;
    const VMUnicodeString wide = VMString(fallback, kMeasureText).ToUnicode();
    if (!wide.IsNotEmpty()) return;
    const std::uint32_t length = std::min<std::uint32_t>(wide.Length(), kCapacity - 1);
    std::copy_n(wide.Text(), length, m_text);
    m_text[length] = 0;
}

}  // namespace velmora
