// The effects as the page in the browser calls them: plain functions of a WebAssembly module. Texts are UTF-8 with a
// terminating zero; pixels are rows without padding, four bytes each. One module runs in one thread.
#pragma once

#include <cstdint>

namespace velmora::effects {
class EffectSession;
}

#define VM_PAGE extern "C" __attribute__((visibility("default"), used))

// The five effects as JSON, in the library's order:
//   [{"name", "params": [...], "presets": [{"name", "values"}]}]
// A parameter: "name", "kind" ("slider", "menu", "colour", "check", "group") and, by kind, "minimum", "maximum",
// "items", "isEnd". Values and "default" are value words as unsigned numbers, one a parameter, groups included. The
// text stays valid and unchanged.
VM_PAGE const char* DescribeEffects();

// A session of the effect with the parameters' defaults and seed 0; null past the last effect or without
// memory.
VM_PAGE velmora::effects::EffectSession* NewSession(std::uint32_t effect);
// Takes null too.
VM_PAGE void DeleteSession(velmora::effects::EffectSession* session);
// `bits`: the value word (api/host_api.h), a slider's as the bits of its number. Nothing past the last parameter.
VM_PAGE void SetValue(velmora::effects::EffectSession* session, std::uint32_t parameter, std::uint32_t bits);
VM_PAGE void SetSeed(velmora::effects::EffectSession* session, std::uint32_t seed);

// Memory for pixels; null when it is short. FreePixels takes null too.
VM_PAGE std::uint8_t* NewPixels(std::uint32_t bytes);
VM_PAGE void FreePixels(const std::uint8_t* pixels);
// Swaps the red and the blue byte of so many pixels: a canvas has red first, the effects blue.
VM_PAGE void SwapRedAndBlue(std::uint8_t* pixels, std::uint32_t count);
// Red, green, blue, alpha to the planes that encoders take: Y, then Cb and Cr of half the width and height, rounded up.
// BT.709 with 16..235 and 16..240.
VM_PAGE void ToPlanes(const std::uint8_t* pixels, std::uint8_t* planes, std::int32_t width,
                      std::int32_t height);
// Renders the frame at a clip time from `source`, blue first, to `target`, red first; they must not overlap. The frame
// number is seconds * 30, truncated. False, with nothing written, when the size is not renderable.
VM_PAGE bool RenderFrame(velmora::effects::EffectSession* session, std::uint8_t* source, std::uint8_t* target,
                         std::int32_t width, std::int32_t height, double seconds);
