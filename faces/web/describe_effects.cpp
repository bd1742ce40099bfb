#include <charconv>
#include <string>
#include <string_view>

#include "effects/effect_table.h"
#include "faces/web/effect_page.h"

namespace {

using velmora::effects::EffectTable;
using velmora::effects::ParamRow;

class JsonText {
  public:
    // Between the entries of a list or of an object.
    void Next() {
        if (m_text.back() != '[' && m_text.back() != '{') m_text += ',';
    }
    void Mark(std::string_view mark) { m_text += mark; }
    void Text(std::string_view text) {
        m_text += '"';
        for (const char c : text) {
            if (c == '"' || c == '\\') m_text += '\\';
            m_text += c;
        }
        m_text += '"';
    }
    template <typename Number>
    void Value(Number number) {
        char digits[32];
        m_text.append(digits, std::to_chars(digits, digits + sizeof digits, number).ptr);
    }
    void Key(std::string_view key) {
        Next();
        Text(key);
        m_text += ':';
    }
    template <typename Entries, typename Write>
    void List(const Entries& entries, Write write) {
        m_text += '[';
        for (const auto& entry : entries) Next(), write(entry);
        m_text += ']';
    }
    [[nodiscard]] std::string Take() { return std::move(m_text); }

  private:
    std::string m_text;
};

const char* KindName(velmora::ParamKind kind) {
    switch (kind) {
        case velmora::kKindMenu:
            return "menu";
        case velmora::kKindSlider:
            return "slider";
        case velmora::kKindColour:
            return "colour";
        case velmora::kKindCheckBox:
            return "check";
        default:
            return "group";
    }
}

void WriteParam(JsonText& json, const ParamRow& param) {
    json.Mark("{");
    json.Key("name"), json.Text(param.name);
    json.Key("kind"), json.Text(KindName(param.kind));
    json.Key("default"), json.Value(param.defaultValue.bits);
    if (param.kind == velmora::kKindSlider) {
        // The shown ranges are whole numbers.
        json.Key("minimum"), json.Value(static_cast<int>(param.minimum));
        json.Key("maximum"), json.Value(static_cast<int>(param.maximum));
    } else if (param.kind == velmora::kKindMenu) {
        json.Key("items"), json.List(param.items, [&](const char* item) { json.Text(item); });
    } else if (param.kind == velmora::kKindGroup) {
        json.Key("isEnd"), json.Mark(param.isGroupEnd ? "true" : "false");
    }
    json.Mark("}");
}

void WriteEffect(JsonText& json, const EffectTable& effect) {
    json.Mark("{");
    json.Key("name"), json.Text(effect.name);
    json.Key("params"), json.List(effect.params, [&](const ParamRow& param) { WriteParam(json, param); });
    json.Key("presets");
    const std::size_t count = effect.params.size();
    std::size_t first = 0;
    json.List(effect.presetNames, [&](const char* name) {
        json.Mark("{");
        json.Key("name"), json.Text(name);
        json.Key("values"), json.List(effect.presetCells.subspan(first, count),
                                      [&](const auto& cell) { json.Value(cell.value.bits); });
        json.Mark("}");
        first += count;
    });
    json.Mark("}");
}

}  // namespace

const char* DescribeEffects() {
    static const std::string text = [] {
        JsonText json;
        json.List(velmora::effects::kAllEffects,
                  [&](const EffectTable* effect) { WriteEffect(json, *effect); });
        return json.Take();
    }();
    return text.c_str();
}
