#include "programs/reelview/base/texts.h"

#include <windows.h>

#include <utility>

namespace velmora::reelview {
namespace {

constexpr std::int32_t kLongest = 512;

std::wstring Converted(const std::string& text, UINT codePage) {
    std::wstring wide(text.size(), L'\0');
    const int length = MultiByteToWideChar(codePage, 0, text.data(), static_cast<int>(text.size()),
                                           wide.data(), static_cast<int>(wide.size()));
    wide.resize(static_cast<std::size_t>(length));
    return wide;
}

}  // namespace

Texts::Texts(IEffectLibrary* library, std::string language)
    : m_library(library), m_language(std::move(language)) {}

std::wstring Texts::operator()(const char* key) const {
    void* found = nullptr;
    if (m_library != nullptr && m_library->QueryInterface(&kIidMultiLingual, &found) == kStatusOk &&
        found != nullptr) {
        auto* const texts = static_cast<IMultiLingual*>(found);
        char16_t buffer[kLongest] = {};
        const std::int32_t length =
            texts->GetText(m_language.c_str(), text::kCategory, key, buffer, kLongest);
        texts->Release();
        buffer[kLongest - 1] = 0;
        if (length > 0) return reinterpret_cast<const wchar_t*>(buffer);
    }
    return Converted(key, CP_UTF8);
}

// In languages without Latin letters the menu letter follows the text in brackets, which are removed with it.
std::wstring Texts::Plain(const char* key) const {
    std::wstring text = (*this)(key);
    const std::size_t mark = text.find(L'&');
    if (mark == std::wstring::npos) return text;
    const bool isBracketed =
        mark > 0 && text[mark - 1] == L'(' && mark + 2 < text.size() && text[mark + 2] == L')';
    return isBracketed ? text.erase(mark - 1, 4) : text.erase(mark, 1);
}

std::string SystemLanguage() {
    wchar_t name[16] = {};
    GetLocaleInfoW(MAKELCID(GetUserDefaultUILanguage(), SORT_DEFAULT), LOCALE_SISO639LANGNAME, name, 16);
    std::string letters;
    for (const wchar_t* c = name; *c != 0; ++c) letters += static_cast<char>(*c);
    return letters.size() == 2 ? letters : "en";
}

std::wstring WideOf(const std::string& text) {
    return Converted(text, CP_ACP);
}

std::string Utf8Of(const std::wstring& text) {
    const auto length = static_cast<int>(text.size());
    std::string narrow(text.size() * 3, '\0');
    const int size = WideCharToMultiByte(CP_UTF8, 0, text.data(), length, narrow.data(),
                                         static_cast<int>(narrow.size()), nullptr, nullptr);
    narrow.resize(static_cast<std::size_t>(size));
    return narrow;
}

}  // namespace velmora::reelview
