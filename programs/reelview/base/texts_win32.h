// The program's texts in the user's language, from the library's language file. Windows only; window's thread only.
#pragma once

#include <string>
#include <string_view>

#include "api/host_api.h"

namespace velmora::reelview {

class Texts {
  public:
    // `library` may be null and must outlive the texts. `language` is a two-letter code.
    Texts(IEffectLibrary* library, std::string language);

    [[nodiscard]] const std::string& Language() const { return m_language; }
    // The text for a key of text_keys.h; the English one when there is no translation.
    [[nodiscard]] std::wstring operator()(const char* key) const;
    // Without the ampersand of the menu letter.
    [[nodiscard]] std::wstring Plain(const char* key) const;

  private:
    IEffectLibrary* m_library;
    std::string m_language;
};

// The two-letter code of the user's interface language.
[[nodiscard]] std::string SystemLanguage();

// The library's texts are in the system's code page.
[[nodiscard]] std::wstring WideOf(const std::string& text);
[[nodiscard]] std::string Utf8Of(const std::wstring& text);

}  // namespace velmora::reelview
