#include <windows.h>

#include <cstdio>
#include <vector>

#include "host_api.h"
using namespace velmora;

// Answers an effect's parameters: here from a built-in preset, in an editor from its own controls.
struct Host final : PlainHost {
    std::vector<PresetCell> cells;
    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override {
        if (index >= cells.size()) return false;
        *cell = {cells[index].value, 0, kind};
        return true;
    }
};

int main() {
    const HMODULE dll = LoadLibraryA("VMReelEffects.dll");
    void* const entry = dll ? reinterpret_cast<void*>(GetProcAddress(dll, "GetEffectsLibrary")) : nullptr;
    if (entry == nullptr) return std::puts("VMReelEffects.dll is missing"), 1;
    IEffectLibrary* const library = reinterpret_cast<GetEffectsLibraryFunction>(entry)();
    IVideoEffect* const effect = library->CreateEffect(kEffectFilmLook);
    Host host;
    PresetCell cell;
    for (std::uint32_t i = 0; effect->GetPresetValue(25, i, &cell); ++i) host.cells.push_back(cell);
    std::vector<std::uint32_t> pixels(640 * 360, 0xFF4080C0u);  // 0xAARRGGBB
    const FrameRecord frame = {pixels.data(), 640, 360, 640 * 4, 0, 0, 0};
    const TimingRecord timing = {0, 0, 1.5};  // seconds into the clip
    const bool done = effect->Process(&host, &frame, nullptr, &frame, &timing);
    std::printf("%s, %s: %08X\n", effect->GetName(), effect->GetPresetName(25), unsigned{pixels[0]});
    effect->Release();
    library->Release();
    return done ? 0 : 1;
}
