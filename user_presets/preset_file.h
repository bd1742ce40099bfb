// Preset files: the settings of one effect as a small XML document. The built-in presets are in effects/film_*.cpp.
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
// The document is 8-bit text in the system code page of the machine that wrote it; names are kept byte for byte.
// Numbers are written with a decimal point and six digits whatever the host's locale.
//
// File names are 8-bit text in the system code page on Windows, bytes as they are (UTF-8) elsewhere.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "api/host_api.h"

namespace velmora {

inline constexpr std::size_t kPresetFileLimit = 16u << 20;  // bytes; a longer file is not read

// Writes the record, with CR LF line ends on Windows. True when the whole file is on the disk. After a failure an
// existing file is unchanged, unless its folder accepts no new files: then it is written in place. Names end at their
// zero or at the end of the field; a count outside 0..100 is clamped.
[[nodiscard]] bool WritePreset(const char* fileName, const PresetRecord* record) noexcept;

// Fills the record from a file. True when the whole file could be parsed, has a "Preset" element and yielded at least
// one value. Tolerant of hand-edited files: after the first "parameter" every element is read as one; a missing or
// unreadable value is replaced by the previous element's, a missing type is 0, elements after the hundredth are
// dropped, names are cut at 259 bytes, and infinities and NaN are read as such.
// After a failure the record is untouched or, when the file has a "Preset" without values, holds its names and a count
// of 0. A file over the limits of size, depth, attributes and nodes (user_presets/file_access.h) is a failure, as is a null
// record.
[[nodiscard]] bool ReadPreset(const char* fileName, PresetRecord* record) noexcept;

// ReadPreset for a text in memory.
[[nodiscard]] bool ParsePreset(const char* text, std::size_t length, PresetRecord* record) noexcept;

// Whether a preset belongs to an effect (compatibility.cpp).
//
// True when the record's library and effect names are these, byte for byte, and its first values have the kinds of the
// effect's parameters, in their order. More values than parameters are accepted, fewer are not.
[[nodiscard]] bool IsCompatible(const char* libraryName, const char* effectName,
                                std::span<const std::uint32_t> kinds, const PresetRecord* record) noexcept;

// The same for effect `effectIndex` of a library. Without a library every preset with values matches; an effect that
// does not exist, or a null record, matches nothing.
[[nodiscard]] bool IsCompatible(IEffectLibrary* library, std::uint32_t effectIndex,
                                const PresetRecord* record) noexcept;

}  // namespace velmora
