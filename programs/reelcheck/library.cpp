#include "programs/reelcheck/library.h"

#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {
namespace {

template <typename Interface>
Owned<Interface> Existing(Interface* object, const char* what) {
    if (object == nullptr) Fail(std::string("the library gives no ") + what);
    return Owned<Interface>(object);
}

}  // namespace

Owned<IEffectLibrary> Library::Open() const {
    return Existing(getEffectsLibrary(), "library object");
}

Owned<IVideoEffect> OpenLibrary::Effect(std::uint32_t index) const {
    return Existing(m_object->CreateEffect(index), "effect");
}

Owned<IFrameProcessor> OpenLibrary::Processor() const {
    return Existing(m_object->CreateFrameProcessor(), "frame processor");
}

Owned<IPresetSaver> OpenLibrary::Saver() const {
    return Existing(m_object->CreatePresetSaver(), "preset saver");
}

}  // namespace velmora::reelcheck
