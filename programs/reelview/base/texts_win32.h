// The program's texts in the user's language, from the library's language file. Windows only, the window's thread.
#pragma once

#include <string>
#include <string_view>

#include "api/host_api.h"

namespace velmora::reelview {

class Texts {
  public:
    // `library` may be null and outlives the texts. `language` has two letters.
    Texts(IEffectLibrary* library, std::string language);

    [[nodiscard]] const std::string& Language() const { return m_language; }
    // The text of a key of text_keys.h, in English where there is none.
    [[nodiscard]] std::wstring operator()(const char* key) const;
    // Without the mark of the menu letter.
    [[nodiscard]] std::wstring Plain(const char* key) const;

  private:
    IEffectLibrary* m_library;
    std::string m_language;
};

// The two letters of the user's interface language.
[[nodiscard]] std::string SystemLanguage();

// Texts of the library are in the system's code page.
[[nodiscard]] std::wstring WideOf(const std::string& text);
[[nodiscard]] std::string Utf8Of(const std::wstring& text);

}  // namespace velmora::reelview
