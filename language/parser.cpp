// The object behind LangXMLParser, and the exports of the language module; VMLang.def gives them undecorated names on
// Windows.

#include <atomic>
#include <filesystem>
#include <fstream>
#include <ios>
#include <new>
#include <optional>
#include <string>
#include <utility>

#include "api/com_object.h"
#include "text/encodings.h"
#include "language/lang_parser.h"
#include "language/language_table.h"

namespace velmora::language {
namespace {

// Live parsers in this module: a host must not free the module while there are any.
std::atomic<std::int32_t> liveParsers{0};

// The file's bytes; nothing when it cannot be read. Reads at most one byte more than the largest size allowed, so that
// an endless file is refused like one that is too large.
std::optional<std::string> ReadBytes(const std::filesystem::path& path) {
    std::ifstream stream(path, std::ios::binary);
    if (!stream) return std::nullopt;
    std::string bytes;
    constexpr std::size_t kStep = 64 * 1024;
    while (stream && bytes.size() <= kLargestFile) {
        const std::size_t before = bytes.size();
        bytes.resize(before + kStep);
        stream.read(bytes.data() + before, kStep);
        bytes.resize(before + static_cast<std::size_t>(stream.gcount()));
    }
    if (stream.bad()) return std::nullopt;
    return bytes;
}

class Parser final : public LangXMLParser {
  public:
    Parser() { ++liveParsers; }
    Parser(const Parser&) = delete;
    Parser& operator=(const Parser&) = delete;

    Status VM_CALL QueryInterface(const Guid* iid, void** out) override {
        const Status status = FindInterface({{&kIidUnknown, static_cast<LangXMLParser*>(this)}}, iid, out);
        if (status == kStatusOk) m_references.Add();
        return status;
    }

    std::uint32_t VM_CALL AddRef() override { return m_references.Add(); }

    std::uint32_t VM_CALL Release() override {
        const std::uint32_t left = m_references.Drop();
        if (left == 0) delete this;
        return left;
    }

    std::int32_t VM_CALL Reserved3() override { return 0; }

    bool VM_CALL Load(const char16_t* path) override {
        if (!path) return false;
        try {
            const std::optional<std::string> bytes = ReadBytes(path);
            if (!bytes) return false;
            std::optional<LanguageTable> table = LanguageTable::Read(*bytes);
            if (!table) return false;
            m_table = std::move(*table);
            return true;
        } catch (...) {
            return false;  // not enough memory, or the path is not well-formed UTF-16
        }
    }

    std::int32_t VM_CALL LookUpText(const char* languageCode, std::int32_t category, const char* key,
                                    const char16_t* fallback, char16_t* buffer, std::int32_t capacity,
                                    std::int32_t* found) override {
        const char16_t* const text = m_table.Find(languageCode, category, key);
        if (found != nullptr) *found = text != nullptr ? 1 : 0;
        return CopyText(text != nullptr ? text : fallback, buffer, capacity);
    }

    std::int32_t VM_CALL GetText(const char* languageCode, std::int32_t category, const char* key,
                                 char16_t* buffer, std::int32_t capacity) override {
        return CopyText(m_table.Find(languageCode, category, key), buffer, capacity);
    }

  private:
    ~Parser() { --liveParsers; }

    ReferenceCount m_references;
    LanguageTable m_table;
};

}  // namespace

}  // namespace velmora::language

#if defined(_WIN32)
#define VM_LANGUAGE_EXPORT
#else
#define VM_LANGUAGE_EXPORT __attribute__((visibility("default")))
#endif

extern "C" {

VM_LANGUAGE_EXPORT velmora::LangXMLParser* VM_CALL GetLangXMLParser() {
    return new (std::nothrow) velmora::language::Parser;
}

VM_LANGUAGE_EXPORT bool VM_CALL CanUnloadDLLNow() {
    return velmora::language::liveParsers == 0;
}

}  // extern "C"
