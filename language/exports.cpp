// The exports of the language module. Their names come undecorated from VMLang.def on Windows.

#include "language/lang_parser.h"
#include "language/parser.h"

#if defined(_WIN32)
#define VM_LANGUAGE_EXPORT
#else
#define VM_LANGUAGE_EXPORT __attribute__((visibility("default")))
#endif

extern "C" {

VM_LANGUAGE_EXPORT velmora::LangXMLParser* VM_CALL GetLangXMLParser() {
    return velmora::language::CreateParser();
}

VM_LANGUAGE_EXPORT bool VM_CALL CanUnloadDLLNow() {
    return velmora::language::NoParserIsAlive();
}

}  // extern "C"
