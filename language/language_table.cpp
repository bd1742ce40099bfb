#include "language/language_table.h"

#include <algorithm>
#include <charconv>
#include <cstring>
#include <initializer_list>
#include <system_error>
#include <utility>

#include <tinyxml.h>

#include "text/encodings.h"

namespace velmora::language {
namespace {

constexpr std::size_t kCodeLength = 2;

bool IsSmallLetter(char character) {
    return character >= 'a' && character <= 'z';
}

bool IsLanguageCode(std::string_view code) {
    return code.size() == kCodeLength && std::all_of(code.begin(), code.end(), IsSmallLetter);
}

// The value of an attribute; null unless the element has the attributes `names` and no others.
const char* OnlyAttributes(const TiXmlElement& element, std::initializer_list<const char*> names,
                           const char* wanted) {
    std::size_t count = 0;
    for (const TiXmlAttribute* a = element.FirstAttribute(); a; a = a->Next()) ++count;
    const bool hasAll = std::all_of(names.begin(), names.end(),
                                    [&](const char* name) { return element.Attribute(name) != nullptr; });
    return hasAll && count == names.size() ? element.Attribute(wanted) : nullptr;
}

std::optional<std::int32_t> CategoryFrom(const char* text) {
    const char* const textEnd = text + std::strlen(text);
    std::int32_t category = 0;
    const auto [end, error] = std::from_chars(text, textEnd, category);
    if (error != std::errc() || end != textEnd || category < 0) return std::nullopt;
    return category;
}

// The text of an element that contains nothing else; null when it contains anything else or is empty.
const char* OnlyText(const TiXmlElement& element) {
    const TiXmlText* found = nullptr;
    for (const TiXmlNode* child = element.FirstChild(); child; child = child->NextSibling()) {
        if (child->ToComment()) continue;
        if (found || !child->ToText()) return nullptr;
        found = child->ToText();
    }
    return found ? found->Value() : nullptr;
}

// Calls `read` for each child; false when one is not an element of this name or `read` refuses it.
template <typename Function>
bool ReadChildren(const TiXmlNode& parent, std::string_view name, Function read) {
    for (const TiXmlNode* child = parent.FirstChild(); child; child = child->NextSibling()) {
        if (child->ToComment()) continue;
        const TiXmlElement* const element = child->ToElement();
        if (!element || element->Value() != name || !read(*element)) return false;
    }
    return true;
}

const TiXmlElement* RootOf(const TiXmlDocument& document) {
    const TiXmlElement* const root = document.RootElement();
    if (!root || root->Value() != std::string_view("texts")) return nullptr;
    const char* const version = OnlyAttributes(*root, {"version"}, "version");
    return version && version == std::string_view("1") ? root : nullptr;
}

}  // namespace

// Fills a table from the tree, with one operation for each level of elements. False stops the reading.
class TableReader {
  public:
    explicit TableReader(LanguageTable& table) : m_table(table) {}

    bool ReadLanguage(const TiXmlElement& element) {
        const char* const code = OnlyAttributes(element, {"code", "name"}, "code");
        if (!code || !IsLanguageCode(code)) return false;
        return ReadChildren(element, "category",
                            [&](const TiXmlElement& child) { return ReadCategory(child, code); });
    }

  private:
    bool ReadCategory(const TiXmlElement& element, const char* code) {
        const char* const id = OnlyAttributes(element, {"id"}, "id");
        if (!id) return false;
        const std::optional<std::int32_t> category = CategoryFrom(id);
        if (!category) return false;
        return ReadChildren(element, "text",
                            [&](const TiXmlElement& child) { return ReadText(child, code, *category); });
    }

    bool ReadText(const TiXmlElement& element, const char* code, std::int32_t category) {
        const char* const key = OnlyAttributes(element, {"key"}, "key");
        const char* const text = OnlyText(element);
        if (!key || !text) return false;
        const std::size_t keyLength = std::strlen(key);
        if (keyLength == 0 || keyLength > kLongestKey || !Utf16FromUtf8(key)) return false;
        std::optional<std::u16string> wide = Utf16FromUtf8(text);
        if (!wide || wide->empty()) return false;
        return m_table.m_texts.try_emplace(LanguageTable::Place{code, category, key}, std::move(*wide))
            .second;
    }

    LanguageTable& m_table;
};

std::optional<LanguageTable> LanguageTable::Read(std::string_view file) {
    if (file.size() > kLargestFile || !IsPlainMarkup(file)) return std::nullopt;
    const std::string terminated(file);
    TiXmlDocument document;
    document.Parse(terminated.c_str(), nullptr, TIXML_ENCODING_UTF8);
    if (document.Error()) return std::nullopt;
    const TiXmlElement* const root = RootOf(document);
    LanguageTable table;
    TableReader reader(table);
    const auto readLanguage = [&](const TiXmlElement& element) { return reader.ReadLanguage(element); };
    if (!root || !ReadChildren(*root, "language", readLanguage)) return std::nullopt;
    return table;
}

const char16_t* LanguageTable::Find(const char* languageCode, std::int32_t category,
                                    const char* key) const noexcept {
    if (!languageCode || !key) return nullptr;
    char code[kCodeLength + 1] = {};
    for (std::size_t i = 0; i < sizeof(code) && languageCode[i] != 0; ++i) {
        const char letter = languageCode[i];
        code[i] = letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
    }
    const std::string_view smallCode(code, sizeof(code));
    if (smallCode.back() != 0) return nullptr;
    const std::string_view wanted(smallCode.substr(0, kCodeLength));
    const auto found = m_texts.find(PlaceView{wanted, category, key});
    return found != m_texts.end() ? found->second.c_str() : nullptr;
}

}  // namespace velmora::language
