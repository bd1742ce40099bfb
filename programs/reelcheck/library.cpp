#include "programs/reelcheck/library.h"

#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {
namespace {

template <typename Interface>
Reference<Interface> Existing(Interface* object, const char* what) {
    if (object == nullptr) Fail(std::string("the library gives no ") + what);
    return Reference<Interface>::Adopt(object);
}

}  // namespace

Reference<IEffectLibrary> Library::Open() const {
    return Existing(getEffectsLibrary(), "library object");
}

Reference<IVideoEffect> OpenLibrary::Effect(std::uint32_t index) const {
    return Existing(m_object->CreateEffect(index), "effect");
}

Reference<IFrameProcessor> OpenLibrary::Processor() const {
    return Existing(m_object->CreateFrameProcessor(), "frame processor");
}

Reference<IPresetSaver> OpenLibrary::Saver() const {
    return Existing(m_object->CreatePresetSaver(), "preset saver");
}

}  // namespace velmora::reelcheck
