// Arbitrary bytes as a language file: refused, or read so that the result is well-formed and can be looked up.

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <string>
#include <string_view>

#include "text/encodings.h"
#include "language/language_table.h"

namespace {

using velmora::language::LanguageTable;

void Require(bool holds) {
    if (!holds) std::abort();
}

void CheckCut(const char16_t* text, std::int32_t capacity) {
    const std::u16string_view whole(text);
    std::u16string buffer(static_cast<std::size_t>(capacity) + 1, u'\xCCCC');
    const std::int32_t length = velmora::CopyText(text, buffer.data(), capacity);
    Require(length >= 0 && length < capacity);
    const auto written = static_cast<std::size_t>(length);
    Require(whole.substr(0, written) == std::u16string_view(buffer.data(), written));
    Require(buffer[written] == 0 && buffer[static_cast<std::size_t>(capacity)] == u'\xCCCC');
    const bool endsInHalf = written > 0 && (buffer[written - 1] & 0xFC00) == 0xD800;
    Require(!endsInHalf);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view file(reinterpret_cast<const char*>(data), size);
    const std::optional<LanguageTable> table = LanguageTable::Read(file);
    if (!table) return 0;
    // The reader must not have accepted bytes that are not text.
    Require(file.find('\0') == std::string_view::npos);
    for (const char* language : {"en", "DE", "ja", "xx"}) {
        for (const std::int32_t category : {0, 4, 8}) {
            for (const char* key : {"OK", "Help", "Open Preset"}) {
                const char16_t* const text = table->Find(language, category, key);
                if (!text) continue;
                Require(table->Size() > 0 && *text != 0);
                for (const std::int32_t capacity : {1, 2, 3, 2048}) CheckCut(text, capacity);
            }
        }
    }
    return 0;
}
