// Our OpenFX host: loads a bundle and drives its plug-ins.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "effects/effect_session.h"
#include "effects/effect_table.h"
#include "programs/reelcheck/openfx_objects.h"

namespace velmora::reelcheck {

// The host's structure as plug-ins get it.
[[nodiscard]] OfxHost* TheOfxHost();

// A loaded bundle; unloaded in the destructor.
class OpenfxModule {
  public:
    // A bundle's folder or the file in it; empty: the bundle beside this program. Throws CheckFailed when it cannot be
    // loaded or lacks an export.
    explicit OpenfxModule(const std::string& path);
    ~OpenfxModule();
    OpenfxModule(const OpenfxModule&) = delete;
    OpenfxModule& operator=(const OpenfxModule&) = delete;

    [[nodiscard]] int Count() const { return m_count(); }
    [[nodiscard]] OfxPlugin* Get(int index) const { return m_get(index); }

  private:
    void* m_module = nullptr;
    int (*m_count)() = nullptr;
    OfxPlugin* (*m_get)(int) = nullptr;
};

// The arguments of an action.
class Arguments {
  public:
    Arguments& Add(const char* name, std::vector<PropertyValue> values);
    [[nodiscard]] OfxPropertySetHandle Handle() { return m_set.Handle(); }
    [[nodiscard]] PropertySet& Set() { return m_set; }

  private:
    PropertySet m_set{PropertySet::Of::kArguments};
};

// One plug-in of a bundle: loaded and described in the constructor, unloaded in the destructor.
class OpenfxPlugin {
  public:
    OpenfxPlugin(const OpenfxModule& module, int index);
    ~OpenfxPlugin();
    OpenfxPlugin(const OpenfxPlugin&) = delete;
    OpenfxPlugin& operator=(const OpenfxPlugin&) = delete;

    OfxStatus Call(const char* action, const void* handle, Arguments* in = nullptr,
                   Arguments* out = nullptr) const;
    // Fails when the status is another.
    void Expect(OfxStatus expected, const char* action, const void* handle, Arguments* in = nullptr,
                Arguments* out = nullptr) const;
    [[nodiscard]] std::unique_ptr<HostEffect> DescribedIn(const char* context) const;
    [[nodiscard]] HostEffect& Descriptor() { return m_descriptor; }
    [[nodiscard]] const effects::EffectTable& Effect() const { return m_effect; }

  private:
    OfxPlugin* m_plugin;
    const effects::EffectTable& m_effect;
    HostEffect m_descriptor{false};
};

// An instance, created in the constructor and destroyed in the destructor. Source and output clip are connected, a mask
// only when one is shown.
class OpenfxInstance {
  public:
    explicit OpenfxInstance(const OpenfxPlugin& plugin, const char* context = kOfxImageEffectContextFilter,
                            double frameRate = 25.0);
    ~OpenfxInstance();  // NOLINT(bugprone-exception-escape): complaining may, without memory
    OpenfxInstance(const OpenfxInstance&) = delete;
    OpenfxInstance& operator=(const OpenfxInstance&) = delete;

    [[nodiscard]] HostEffect& Effect() { return m_effect; }
    [[nodiscard]] HostParam& Param(std::string_view name) const;
    [[nodiscard]] HostClip& Clip(std::string_view name) const;
    void ShowMask(HostPicture* mask) const;
    // Chooses a preset as a user does.
    void ChoosePreset(std::uint32_t preset);
    OfxStatus Change(const char* name, const char* reason);
    OfxStatus Render(double time, const OfxRectI& window, const char* field = kOfxImageFieldNone);
    // Renders the whole output and fails unless that succeeds.
    void RenderWhole(HostPicture& source, HostPicture& output, double time);
    [[nodiscard]] bool IsIdentity(double time);
    // What the plug-in answers for the source, in canonical coordinates: all of the picture, and what a part of the
    // result needs.
    [[nodiscard]] OfxRectD RegionOfDefinition(double time);
    [[nodiscard]] OfxRectD RegionOfInterest(double time, const OfxRectD& part);
    [[nodiscard]] const OpenfxPlugin& Plugin() const { return m_plugin; }

  private:
    const OpenfxPlugin& m_plugin;
    HostEffect m_effect{true};
};

// After a check: nothing is held, and nothing was complained of.
void RequireNothingHeld();

// What the linked core, which is what reelfx uses, makes of a picture: with a session's values, or those of a preset.
void RenderExpected(effects::EffectSession& session, double seconds, const HostPicture& source,
                    HostPicture& expected);
void RenderExpected(const effects::EffectTable& effect, std::uint32_t preset, std::uint32_t seed,
                    double seconds, const HostPicture& source, HostPicture& expected);

inline constexpr std::uint32_t kSeed = 7;
inline constexpr double kTime = 11.0;  // frames, at 25 a second
inline constexpr double kSeconds = kTime / 25.0;

// An instance with a busy preset and a seed.
class Busy {
  public:
    Busy(const OpenfxModule& module, int index, const char* context = kOfxImageEffectContextFilter)
        : plugin(module, index), instance(plugin, context) {
        instance.ChoosePreset(kPreset);
        instance.Param("seed").values[0] = kSeed;
    }
    static constexpr std::uint32_t kPreset = 2;

    OpenfxPlugin plugin;
    OpenfxInstance instance;
};

// Whether a part of two pictures is equal, and everything else in the first still has the fill byte.
[[nodiscard]] bool IsOnlyInside(const HostPicture& picture, const HostPicture& whole, const OfxRectI& part,
                                std::uint8_t fill, int field = -1);

inline OfxRectI Square(int x, int y, int width, int height) {
    return {x, y, x + width, y + height};
}

inline PictureShape Plain(int width, int height) {
    PictureShape shape;
    shape.bounds = Square(0, 0, width, height);
    return shape;
}

}  // namespace velmora::reelcheck
