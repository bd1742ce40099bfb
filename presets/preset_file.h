// Preset files: the settings of one effect as a small XML document.
//
//     <?xml version="1.0" standalone="no" ?>
//     <!-- Effect's Preset File -->
//     <Preset Name="Mine" LibraryName="Velmora Reel Effects" EffectName="Film Look">
//         <parameter type="2" value="0.250000" />
//     </Preset>
//
// One "parameter" for each value cell, in the effect's parameter order. Its attributes by type:
//
//     type               attributes   value cell
//     0                  x, y         two numbers: the value word, then the second word
//     1 menu, 3 colour   value        signed integer
//     2 slider           value        number
//     4 check box        value        0 or 1
//     any other          none         carries over, as below
//
// The document is 8-bit text in the system code page of the machine that wrote it; names are kept byte for
// byte. Numbers are written with a point and six digits whatever the host's locale.
//
// File names are 8-bit text in the system code page on Windows, bytes as they are (UTF-8) elsewhere.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "api/host_api.h"

namespace velmora {

inline constexpr std::size_t kPresetFileLimit = 16u << 20;  // bytes; a longer file is not read

// Writes the record, with CR LF line ends on Windows. True when the whole file is on the disk. An existing
// file stays as it was after a failure, unless its folder takes no new files: then it is written in place.
// Names end at their zero or with their field; a count outside 0..100 counts as the nearer end.
[[nodiscard]] bool WritePreset(const char* fileName, const PresetRecord* record) noexcept;

// Fills the record from a file. True when it could be parsed as a whole, has a "Preset" element and yielded at
// least one value. Lax where files that people changed need it: after the first "parameter" every element is
// read as one; a missing or unreadable value takes the place of the previous element's, a missing type is
// 0, elements behind the hundredth are dropped, names are cut at 259 bytes, and a number that is infinite or
// not a number is read as such.
// After a failure the record is untouched, or, when the file has a "Preset" without values, holds its names
// and a count of 0. A file over the limits of size, depth, attributes and nodes (presets/xml_limits.h) is a
// failure, as is a null record.
[[nodiscard]] bool ReadPreset(const char* fileName, PresetRecord* record) noexcept;

// ReadPreset for a text at hand.
[[nodiscard]] bool ParsePreset(const char* text, std::size_t length, PresetRecord* record) noexcept;

// Whether a preset belongs to an effect (compatibility.cpp).
//
// True when the record's library and effect names are these, byte for byte, and its first values have the
// kinds of the effect's parameters, in their order. More values than parameters are accepted, fewer are not.
[[nodiscard]] bool IsCompatible(const char* libraryName, const char* effectName,
                                std::span<const std::uint32_t> kinds, const PresetRecord* record) noexcept;

// The same for effect `effectIndex` of a library. Without a library every preset with values fits; an effect
// that is not there, or a null record, fits nothing.
[[nodiscard]] bool IsCompatible(IEffectLibrary* library, std::uint32_t effectIndex,
                                const PresetRecord* record) noexcept;

}  // namespace velmora
