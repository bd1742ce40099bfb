// The header as a Windows host includes it, beside the system's own IUnknown. Compiling is the test.
#if defined(__MINGW32__)
#include <windows.h>
#include <unknwn.h>
#else
struct IUnknown;
#endif

#include "api/host_api.h"

using namespace velmora;

struct Host final : PlainHost {
    bool VM_CALL GetParamValue(std::uint32_t, ValueCell* cell, std::uint32_t kind) override {
        *cell = {{}, 0, kind};
        return true;
    }
};

bool Use(::IUnknown* theSystems, IEffectLibrary& library);
bool Use(::IUnknown* theSystems, IEffectLibrary& library) {
    IUnknown* const same = theSystems;  // unambiguous, although both names are visible
    com::IUnknown& ours = library;
    Host host;
    const TimingRecord timing = {};
    const FrameRecord frame = {};
    IVideoEffect* const effect = library.CreateEffect(kEffectFilmPro);
    return same != nullptr && ours.AddRef() != 0 && effect->Process(&host, &frame, nullptr, &frame, &timing);
}
static_assert(kReelEffectsMajor == 1 && sizeof(void*) == 4 && sizeof(FrameRecord) == 28);
