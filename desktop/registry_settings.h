// The library's settings in the registry: texts under "Software\Velmora\<section>". The current user's key is
// read first, then the machine's; writing goes to the user's. Windows only.
#pragma once

#include <optional>
#include <string>

namespace velmora::support {

// The text of a setting; nothing when neither key holds a text of at most 1024 bytes that may be read.
[[nodiscard]] std::optional<std::string> ReadSetting(const char* section, const char* name);

// Stores a text with its terminator and makes the key when it is missing; false when the registry refuses.
bool WriteSetting(const char* section, const char* name, const char* text);

}  // namespace velmora::support
