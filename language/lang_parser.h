// The binary boundary of VMLang.dll, the module that translates the texts shown to the user. It is used by
// the library (which loads the module) and by the module; the rules of api/host_api.h hold here too.
#pragma once

#include <cstdint>

#include "api/host_api.h"

namespace velmora {

// Holds the texts of one language file. Answers to IUnknown only. One thread at a time; the references may be
// counted on any thread.
class LangXMLParser : public com::IUnknown {
  public:
    // Not used; always 0.
    virtual std::int32_t VM_CALL Reserved3() = 0;

    // Reads a language file, whose form is told at the head of VMReelEffectsLang.xml, in place of the texts
    // held so far. False when `path` is null, when the file cannot be read, is larger than 4 MiB or broken
    // anywhere, or when memory is short: the texts are then those of the last file that was read, if any.
    virtual bool VM_CALL Load(const char16_t* path) = 0;

    // GetText with a fallback. When there is no such text `fallback` (zero-terminated, may be null) is written by the same
    // rules; without a fallback an empty text is. `found` (may be null) is set to 1 when there is such a text, else to 0.
    // Returns the characters written, without the terminator.
    virtual std::int32_t VM_CALL LookUpText(const char* languageCode, std::int32_t category, const char* key,
                                            const char16_t* fallback, char16_t* buffer, std::int32_t capacity,
                                            std::int32_t* found) = 0;

    // Writes the text of a key into `buffer`, which holds `capacity` 16-bit characters: always terminated,
    // and cut where the buffer is too small, never inside a surrogate pair. Returns the characters written,
    // without the terminator; 0, and an empty text, when there is none. A null buffer or a capacity below 1
    // gives 0 and nothing is touched. `languageCode` is two letters, small or capital; a null language or
    // key has no text.
    virtual std::int32_t VM_CALL GetText(const char* languageCode, std::int32_t category, const char* key,
                                         char16_t* buffer, std::int32_t capacity) = 0;

  protected:
    ~LangXMLParser() = default;
};

// Exports of VMLang.dll, undecorated names.

// "GetLangXMLParser": a new parser without texts, with one reference that belongs to the caller; null when
// memory is short.
using GetLangXMLParserFunction = LangXMLParser*(VM_CALL*)();
// "CanUnloadDLLNow" (CanUnloadDLLNowFunction in api/host_api.h): true when no parser is alive.

}  // namespace velmora
