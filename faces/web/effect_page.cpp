#include "faces/web/effect_page.h"

#include <cstring>
#include <new>

#include "effects/effect_session.h"

using velmora::effects::EffectSession;

namespace {

velmora::FrameRecord RecordOf(std::uint8_t* pixels, std::int32_t width, std::int32_t height) {
    return {pixels, width, height, width * 4, 0, 0, 0};
}

}  // namespace

EffectSession* NewSession(std::uint32_t effect) {
    if (effect >= velmora::effects::kAllEffects.size()) return nullptr;
    return EffectSession::Create(*velmora::effects::kAllEffects[effect]).release();
}

void DeleteSession(EffectSession* session) {
    delete session;
}

void SetValue(EffectSession* session, std::uint32_t parameter, std::uint32_t bits) {
    session->SetValue(parameter, {.bits = bits});
}

void SetSeed(EffectSession* session, std::uint32_t seed) {
    session->PinRandom(seed);
}

std::uint8_t* NewPixels(std::uint32_t bytes) {
    return new (std::nothrow) std::uint8_t[bytes];
}

void FreePixels(const std::uint8_t* pixels) {
    delete[] pixels;
}

void SwapRedAndBlue(std::uint8_t* pixels, std::uint32_t count) {
    for (std::uint32_t i = 0; i < count; ++i, pixels += 4) {
        std::uint32_t word = 0;
        std::memcpy(&word, pixels, sizeof word);
        word = (word & 0xFF00FF00u) | ((word >> 16) & 0xFFu) | ((word & 0xFFu) << 16);
        std::memcpy(pixels, &word, sizeof word);
    }
}

bool RenderFrame(EffectSession* session, std::uint8_t* source, std::uint8_t* target, std::int32_t width,
                 std::int32_t height, double seconds) {
    const velmora::FrameRecord from = RecordOf(source, width, height), to = RecordOf(target, width, height);
    if (!session->Render(from, to, seconds)) return false;
    SwapRedAndBlue(target, static_cast<std::uint32_t>(width) * static_cast<std::uint32_t>(height));
    return true;
}
