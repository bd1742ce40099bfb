// User-visible texts in the user's language, with built-in English to fall back on.
#pragma once

#include <cstdint>

#include "api/host_api.h"

namespace velmora {

// Groups of texts in the language file.
enum TextCategory : std::int32_t {
    kTextsOfPresets = 4,
    kTextsOfOptions = 5,
    kTextsOfButtons = 8,
};

// A member of every object that shows translated texts. For one thread at a time: all lookups share one buffer.
class TranslationHelper {
  public:
    TranslationHelper() noexcept = default;
    virtual ~TranslationHelper();

    // Sets the source of texts (null: none; no reference is taken, so the source must stay alive while it is set) and
    // the language, a two-letter code; any other code, or null, means "en".
    void SetContext(com::IUnknown* textSource, const char* languageCode) noexcept;

    // The text for a key, at most 2047 characters; without a translation, the fallback (8-bit text in the system code
    // page), or the key itself when `fallback` is null. Never null; valid until the next lookup or SetContext.
    // `wasFound` (may be null) receives whether there was a translation.
    const char16_t* Translate(std::int32_t category, const char* key, const char* fallback = nullptr,
                              bool* wasFound = nullptr) noexcept;

  private:
    static constexpr std::int32_t kCapacity = 2048;

    bool LookUp(std::int32_t category, const char* key) noexcept;
    void CopyFallback(const char* fallback) noexcept;

    char m_languageCode[3] = "en";
    char16_t m_text[kCapacity] = {};
    com::IUnknown* m_textSource = nullptr;
};

}  // namespace velmora
