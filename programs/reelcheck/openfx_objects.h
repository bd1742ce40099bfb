// What our OpenFX host keeps: property sets, parameters, clips, pictures and effects. Their addresses are the handles
// that plug-ins get. The host is strict: whatever a plug-in does that the standard does not allow is noted as a
// complaint, and a check fails if there is one.
#pragma once

#include <atomic>
#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <variant>
#include <vector>

#include "faces/openfx/ofx_api.h"
#include "programs/reelcheck/check.h"
#include "programs/reelcheck/system.h"

namespace velmora::reelcheck {

void Complain(const std::string& text);
// Fails with the complaints so far, if there are any, and forgets them.
void RequireNoComplaints();

// During its lifetime plug-ins are given handles that are none; their use is no complaint.
class FalseHandles {
  public:
    FalseHandles() noexcept;
    ~FalseHandles();
    FalseHandles(const FalseHandles&) = delete;
    FalseHandles& operator=(const FalseHandles&) = delete;
};

// An object that a handle may refer to.
class Handled {
  public:
    enum class Kind : std::uint8_t { kProperties, kParam, kParamSet, kClip, kEffect };

    Handled(const Handled&) = delete;
    Handled& operator=(const Handled&) = delete;

    // The object, if `handle` is that of a living one of this kind.
    template <typename Object>
    static Object* Of(const void* handle) {
        return IsLiving(handle, Object::kKind) ? static_cast<Object*>(const_cast<void*>(handle)) : nullptr;
    }

  protected:
    // The address is that of the object's first byte, so objects have no virtual functions.
    explicit Handled(Kind kind);
    ~Handled();

  private:
    static bool IsLiving(const void* handle, Kind kind);
};

using PropertyValue = std::variant<int, double, std::string, void*>;

class PropertySet : public Handled {
  public:
    static constexpr Kind kKind = Kind::kProperties;
    enum class Of : std::uint8_t {
        kHost,
        kDescriptor,
        kInstance,
        kClip,
        kImage,
        kParam,
        kParamSet,
        kArguments
    };

    // With the properties that such a set has, those without a default being empty.
    explicit PropertySet(Of what);

    struct Property {
        PropertyValue empty;  // its type
        int dimension;        // 0: any
        bool isReadOnly;
        std::vector<PropertyValue> values;
    };
    // Null for an unknown one.
    Property* Find(const char* name);
    void Put(const char* name, std::vector<PropertyValue> values);
    void Add(const char* name, int dimension, std::vector<PropertyValue> values);
    [[nodiscard]] const std::vector<PropertyValue>& Values(const char* name);
    [[nodiscard]] std::string Text(const char* name);
    [[nodiscard]] double Number(const char* name, std::size_t index = 0);
    [[nodiscard]] int Count(const char* name);

    [[nodiscard]] OfxPropertySetHandle Handle() { return reinterpret_cast<OfxPropertySetHandle>(this); }

  private:
    std::map<std::string, Property, std::less<>> m_properties;
};

class HostParam : public Handled {
  public:
    static constexpr Kind kKind = Kind::kParam;
    HostParam(std::string typeName, std::string ownName)
        : Handled(kKind), type(std::move(typeName)), name(std::move(ownName)) {}
    // With the default as its value.
    std::unique_ptr<HostParam> NewInstance();
    // How many numbers its value has.
    [[nodiscard]] int Dimension() const;
    [[nodiscard]] bool IsDouble() const;

    const std::string type, name;
    PropertySet properties{PropertySet::Of::kParam};
    double values[3] = {};
    double perFrame = 0.0;  // animation: added to each for every frame of time
    std::vector<double>
        keys;  // the animation's times, in order: it stands still before the first and after the last
};

class HostParamSet : public Handled {
  public:
    static constexpr Kind kKind = Kind::kParamSet;
    HostParamSet() : Handled(kKind) {}
    [[nodiscard]] HostParam* Find(std::string_view name) const;

    std::vector<std::unique_ptr<HostParam>> params;
    PropertySet properties{PropertySet::Of::kParamSet};
    bool isDescriptor = true;
    int openEdits = 0, closedEdits = 0, setsOutside = 0, setsInside = 0;
    bool refusesEdits = false;
};

enum class PictureField : std::uint8_t { kNone, kLower, kUpper };

// Where a picture lies and how its pixels are stored.
struct PictureShape {
    OfxRectI bounds{0, 0, 16, 12};
    OfxRectI region{};  // all zero: the bounds
    const char* depth = kOfxBitDepthByte;
    const char* components = kOfxImageComponentRGBA;
    bool isPremultiplied = false;
    int padding = 0;         // bytes between rows
    bool isTopDown = false;  // negative row bytes
    Edge edge = Edge::kBack;

    [[nodiscard]] int Width() const { return bounds.x2 - bounds.x1; }
    [[nodiscard]] int Height() const { return bounds.y2 - bounds.y1; }
    [[nodiscard]] int Channels() const;
    [[nodiscard]] int SampleBytes() const;
    [[nodiscard]] OfxRectI Region() const;
};

class HostPicture {
  public:
    explicit HostPicture(const PictureShape& own);
    // Smooth parts, edges, noise, black and white; some of it transparent if there is alpha. Deep pictures are 8-bit
    // ones with finer steps, float ones also go beyond 0 and 1 if `isWide`.
    void Paint(Dice& dice, bool isWide = false);
    void Fill(std::uint8_t byte) const;
    [[nodiscard]] std::uint8_t* Pixel(int x, int y) const;  // within the bounds
    [[nodiscard]] int PixelBytes() const { return shape.Channels() * shape.SampleBytes(); }
    // A sample as 0..1.
    [[nodiscard]] double Sample(int x, int y, int channel) const;
    void SetSample(int x, int y, int channel, double value);
    // The same pixels as in another picture of the same bounds.
    [[nodiscard]] bool IsSameAs(const HostPicture& other) const;

    const PictureShape shape;
    const int rowBytes;  // signed, as the plug-in gets it
    GuardedMemory memory;
};

class HostClip : public Handled {
  public:
    static constexpr Kind kKind = Kind::kClip;
    explicit HostClip(std::string ownName) : Handled(kKind), name(std::move(ownName)) {}

    // By time; a picture at time NaN stands for all others. Not owned.
    void Show(HostPicture* picture) { m_always = picture; }
    void ShowAt(double time, HostPicture* picture) { m_pictures[time] = picture; }
    [[nodiscard]] HostPicture* At(double time) const;

    const std::string name;
    PropertySet properties{PropertySet::Of::kClip};

  private:
    HostPicture* m_always = nullptr;
    std::map<double, HostPicture*> m_pictures;
};

// A descriptor or an instance.
class HostEffect : public Handled {
  public:
    static constexpr Kind kKind = Kind::kEffect;
    explicit HostEffect(bool isInstance);
    [[nodiscard]] HostClip* Find(std::string_view name) const;
    [[nodiscard]] OfxImageEffectHandle Handle() { return reinterpret_cast<OfxImageEffectHandle>(this); }

    PropertySet properties;
    HostParamSet params;
    std::vector<std::unique_ptr<HostClip>> clips;
    std::atomic<int> questions{0};  // how often the plug-in asked whether to go on
    std::atomic<int> abortAt{0};    // the question from which on the answer is to stop; 0: never
};

// What the host offers and counts.
struct HostState {
    std::string missingSuite;    // none of that name
    bool hasEmptySuite = false;  // that suite is there, but its functions are not
    std::atomic<int> images{0};  // fetched and not given back
    std::atomic<int> blocks{0};  // of memory, allocated and not freed
    std::atomic<int> allocations{0};
    std::atomic<int> failingAllocation{0};  // counted from 1; 0: none
    double canonicalWidth = 1.0,
           canonicalHeight = 1.0;  // of a pixel, by the render scale and the pixels' shape
};
[[nodiscard]] HostState& State();

// The suites (openfx_property_suite.cpp, openfx_param_suite.cpp, openfx_effect_suite.cpp).
extern const OfxPropertySuiteV1 kHostProperties;
extern const OfxParameterSuiteV1 kHostParameters;
extern const OfxImageEffectSuiteV1 kHostEffects;
extern const OfxMemorySuiteV1 kHostMemory;

}  // namespace velmora::reelcheck
