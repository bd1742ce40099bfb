// A language module for tests: records its requests and behaves as the environment says.
//   VM_TEST_ACCEPT  the load request, from 1, that succeeds; others fail
//   VM_TEST_KEEP    set: the module asks to be kept

#include <windows.h>

#include <cstdlib>
#include <cstring>
#include <string>

#include "language/lang_parser.h"

namespace {

std::u16string g_log;  // one line per request

class Parser final : public velmora::LangXMLParser {
  public:
    velmora::Status VM_CALL QueryInterface(const velmora::Guid*, void**) override {
        return velmora::kStatusNoInterface;
    }
    std::uint32_t VM_CALL AddRef() override { return 2; }
    std::uint32_t VM_CALL Release() override {
        g_log += u"release\n";
        return 0;
    }
    std::int32_t VM_CALL Reserved3() override { return 0; }
    bool VM_CALL Load(const char16_t* path) override {
        g_log += std::u16string(u"load ") + path + u"\n";
        const char* accepted = std::getenv("VM_TEST_ACCEPT");
        return accepted != nullptr && ++m_requests == std::atoi(accepted);
    }
    std::int32_t VM_CALL LookUpText(const char* a, std::int32_t b, const char* c, const char16_t* d,
                                    char16_t* e, std::int32_t f, std::int32_t* g) override {
        const auto word = [](const void* pointer) {
            return static_cast<std::int32_t>(reinterpret_cast<std::intptr_t>(pointer));
        };
        return word(a) + 10 * b + 100 * word(c) + 1000 * word(d) + 10000 * word(e) + 100000 * f +
               1000000 * word(g);
    }
    std::int32_t VM_CALL GetText(const char* language, std::int32_t category, const char* key,
                                 char16_t* buffer, std::int32_t capacity) override {
        if (capacity < 2 || std::strcmp(language, "xx") != 0 || category != 4 || std::strcmp(key, "K") != 0)
            return 0;
        buffer[0] = u'!';
        buffer[1] = 0;
        return 1;
    }

  private:
    int m_requests = 0;
} g_parser;

}  // namespace

extern "C" {
velmora::LangXMLParser* VM_CALL GetLangXMLParser() {
    return &g_parser;
}
bool VM_CALL CanUnloadDLLNow() {
    return std::getenv("VM_TEST_KEEP") == nullptr;
}
const char16_t* VM_CALL TestLog() {
    return g_log.c_str();
}
}
