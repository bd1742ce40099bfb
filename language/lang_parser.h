// The binary interface of VMLang.dll, the module that translates the texts shown to the user. Both the library, which
// loads the module, and the module itself use this header; the rules of api/host_api.h hold here too.
#pragma once

#include <cstdint>

#include "api/host_api.h"

namespace velmora {

// Holds the texts of one language file. Answers to IUnknown only. One thread at a time; references may be counted on
// any thread.
class LangXMLParser : public com::IUnknown {
  public:
    // Not used; always 0.
    virtual std::int32_t VM_CALL Reserved3() = 0;

    // Reads a language file (format: see the head of VMReelEffectsLang.xml), replacing the texts held so far. False
    // when `path` is null, when the file cannot be read, is larger than 4 MiB or broken anywhere, or when there is not
    // enough memory: the texts of the last file that was read, if any, then stay.
    virtual bool VM_CALL Load(const char16_t* path) = 0;

    // GetText with a fallback. When there is no such text, `fallback` (zero-terminated, may be null) is written by the
    // same rules; without a fallback, an empty text. Sets `found` (may be null) to 1 when there is such a text,
    // otherwise to 0. Returns the characters written, without the terminator.
    virtual std::int32_t VM_CALL LookUpText(const char* languageCode, std::int32_t category, const char* key,
                                            const char16_t* fallback, char16_t* buffer, std::int32_t capacity,
                                            std::int32_t* found) = 0;

    // Writes the text of a key into `buffer`, which holds `capacity` 16-bit characters: always terminated, and
    // truncated where the buffer is too small, but never inside a surrogate pair. Returns the characters written,
    // without the terminator; when there is no such text, writes an empty text and returns 0. A null buffer or a
    // capacity below 1 returns 0 and nothing is written. `languageCode` is two letters in either case; there is no text
    // for a null language or key.
    virtual std::int32_t VM_CALL GetText(const char* languageCode, std::int32_t category, const char* key,
                                         char16_t* buffer, std::int32_t capacity) = 0;

  protected:
    ~LangXMLParser() = default;
};

// Exports of VMLang.dll, undecorated names.

// "GetLangXMLParser": a new parser without texts, with one reference that belongs to the caller; null when there is not
// enough memory.
using GetLangXMLParserFunction = LangXMLParser*(VM_CALL*)();
// "CanUnloadDLLNow" (CanUnloadDLLNowFunction in api/host_api.h): true when no parser is alive.

}  // namespace velmora
