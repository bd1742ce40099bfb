// The one header a host needs to use "Velmora Reel Effects".
//
// A host loads VMReelEffects.dll, looks up the two exports declared at the end of this header, calls GetEffectsLibrary
// and works through the interfaces below. The header needs only <cstdint> and a C++17 compiler; it can be copied into a
// host's own sources and included before or after <windows.h>.
//
// Binary contract, on 32-bit Windows: little-endian; every operation is __stdcall with the object pointer as first
// stack argument; an interface's table holds its operations in the order of declaration; booleans are one byte (read
// the low byte of the result); no exception leaves an operation. A host may call with a stack aligned to only 4 bytes.
// Every call leaves the calling thread's floating-point state as it found it.
//
// Ownership: whoever gets a pointer to a reference-counted interface owns one reference and gives it back
// with Release. Texts are zero-terminated and stay owned by the library, for as long as it is loaded.
//
// Threads. Nothing is locked, and every operation runs on the thread that calls it. The brackets at each operation or
// interface say what is safe:
//   [any thread]      at any time, also while other calls run: counting references, constant tables and names
//   [one at a time]   on any thread, but not two such calls at once in the whole process: frames share one state. A frame
//                     that begins while another one is rendered gets other random damage
//   [user interface]  on the host's user-interface thread only: dialogs, translated texts, help
//
// Frames. The frame number is the clip time in seconds x 30, truncated. It alone identifies a frame: a call with the
// same number as the call before it, whatever the effect and the sizes, repeats that frame's random damage, so a host
// may render a frame again for another view; a call with a different number draws new damage. Above 30 frames a second,
// two frames of a clip can therefore show the same damage.
#pragma once

#include <cstdint>

#if defined(_WIN32) && (defined(__i386__) || defined(_M_IX86))
#define VM_CALL __stdcall
#else
#define VM_CALL
#endif

// The compiler's built-in offsetof; the standard one would need another header.
#define VM_OFFSET(record, field) __builtin_offsetof(record, field)

namespace velmora {

// The version of this header and its library. The DLL's version resource has the same numbers.
inline constexpr std::int32_t kReelEffectsMajor = 1;
inline constexpr std::int32_t kReelEffectsMinor = 0;
inline constexpr char kReelEffectsVersion[] = "1.0";

// What GetLibraryName returns and what preset files contain.
inline constexpr char kLibraryName[] = "Velmora Reel Effects";

// ---------------------------------------------------------------------------------------------------------
// Identifiers and results

// 16 bytes, compared as raw bytes.
struct Guid {
    std::uint32_t data1;
    std::uint16_t data2;
    std::uint16_t data3;
    std::uint8_t data4[8];
};
static_assert(sizeof(Guid) == 16);

using Status = std::int32_t;
inline constexpr Status kStatusOk = 0;
inline constexpr Status kStatusNoInterface = static_cast<Status>(0x80004002u);
inline constexpr Status kStatusFailure = static_cast<Status>(0x80004005u);

inline constexpr Guid kIidUnknown = {
    0x00000000, 0x0000, 0x0000, {0xC0, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x46}};
inline constexpr Guid kIidEffectLibrary = {
    0x9B8D0B5F, 0x065A, 0x46B1, {0x88, 0x9C, 0xF0, 0x57, 0x93, 0x4C, 0xE8, 0xA4}};
inline constexpr Guid kIidMultiLingual = {
    0xF6E85D4E, 0xDC38, 0x476C, {0xAC, 0x59, 0xEB, 0x50, 0x0B, 0xA9, 0x3C, 0xDC}};
inline constexpr Guid kIidVideoEffect = {
    0x0BCF7FCD, 0x6BE5, 0x4A40, {0x9A, 0x49, 0xA6, 0x8D, 0x6B, 0xF6, 0x60, 0x26}};
inline constexpr Guid kIidVideoHost = {
    0x4ABCB36F, 0x7FDC, 0x43E6, {0xB4, 0x5D, 0xFA, 0xD4, 0xD7, 0xAA, 0x80, 0xDD}};
inline constexpr Guid kIidPresetSaver = {
    0x44CD1462, 0x6E3D, 0x438E, {0x9B, 0x72, 0x8C, 0x53, 0x3A, 0xA8, 0xFD, 0x8C}};

// ---------------------------------------------------------------------------------------------------------
// Records

// One 32-bit word that holds a value in the format of its kind.
union ValueWord {
    float number;          // slider: normalised to 0..1
    std::uint32_t colour;  // colour: 0x00BBGGRR, red in the lowest byte
    std::uint32_t count;   // menu: number of items
    std::int32_t item;     // menu: item index, from 0
    std::uint8_t flag;     // check box: 0 or 1; group marker: 0 begin, 1 end. The other bytes are ignored
    std::uint32_t bits;
};
static_assert(sizeof(ValueWord) == 4);

enum ParamKind : std::uint32_t {
    kKindNone = 0,
    kKindMenu = 1,
    kKindSlider = 2,
    kKindColour = 3,
    kKindCheckBox = 4,
    kKindGroup = 5,  // a marker without a value: a frame is drawn round the parameters between two of them
};

inline constexpr std::int32_t kMenuItemCapacity = 10;
inline constexpr std::int32_t kMenuTextWidth = 20;
inline constexpr std::int32_t kParamNameWidth = 40;

// Describes parameter k of an effect. Zero the descriptor first: an effect writes only the fields of the parameter's
// kind and leaves the others as the caller passed them. A text that fills its whole field has no terminator.
struct ParamDescriptor {
    ValueWord defaultValue;
    std::uint32_t second;  // not written
    std::uint32_t kind;    // ParamKind
    ValueWord minimum;     // slider: lowest shown value; menu: item count; group: flag 0 begin, 1 end
    union {
        struct {
            ValueWord maximum;  // highest shown value: the host shows minimum + value * (maximum - minimum)
            std::uint32_t afterMaximum;
        } slider;
        char itemTexts[kMenuItemCapacity][kMenuTextWidth];
    };
    char name[kParamNameWidth];
    std::int32_t x, y, width, height;  // layout, in the host's dialog units
    std::uint32_t visible;
};
static_assert(sizeof(ParamDescriptor) == 276);
static_assert(VM_OFFSET(ParamDescriptor, defaultValue) == 0);
static_assert(VM_OFFSET(ParamDescriptor, second) == 4);
static_assert(VM_OFFSET(ParamDescriptor, kind) == 8);
static_assert(VM_OFFSET(ParamDescriptor, minimum) == 12);
static_assert(VM_OFFSET(ParamDescriptor, slider) == 16);
static_assert(VM_OFFSET(ParamDescriptor, itemTexts) == 16);
static_assert(VM_OFFSET(ParamDescriptor, name) == 216);
static_assert(VM_OFFSET(ParamDescriptor, x) == 256);
static_assert(VM_OFFSET(ParamDescriptor, y) == 260);
static_assert(VM_OFFSET(ParamDescriptor, width) == 264);
static_assert(VM_OFFSET(ParamDescriptor, height) == 268);
static_assert(VM_OFFSET(ParamDescriptor, visible) == 272);

// A parameter's value as exchanged during rendering and in presets that a user saves.
struct ValueCell {
    ValueWord value;
    std::uint32_t second;
    std::uint32_t kind;  // ParamKind
};
static_assert(sizeof(ValueCell) == 12);
static_assert(VM_OFFSET(ValueCell, value) == 0);
static_assert(VM_OFFSET(ValueCell, second) == 4);
static_assert(VM_OFFSET(ValueCell, kind) == 8);

// A parameter's value in a built-in preset. The second word is 0.
struct PresetCell {
    ValueWord value;
    std::uint32_t second;
};
static_assert(sizeof(PresetCell) == 8);
static_assert(VM_OFFSET(PresetCell, second) == 4);

// A picture in the host's memory: 32-bit pixels, bytes blue, green, red, alpha. The processed region is width x height
// pixels with its top left corner at (xOrigin, yOrigin) of the buffer; the buffer is xOrigin + width pixels wide and
// yOrigin + height rows high.
struct FrameRecord {
    void* pixels;            // first byte of the first stored row
    std::int32_t width;      // of the region, in pixels, at least 1
    std::int32_t height;     // of the region, in rows, at least 1
    std::int32_t rowStep;    // bytes from one row to the next; negative: the buffer is stored bottom-up
    std::uint32_t reserved;  // not read
    std::int32_t xOrigin;    // at least 0
    std::int32_t yOrigin;    // at least 0
};
#if defined(_WIN32) && (defined(__i386__) || defined(_M_IX86))
static_assert(sizeof(FrameRecord) == 28);
static_assert(VM_OFFSET(FrameRecord, width) == 4);
static_assert(VM_OFFSET(FrameRecord, height) == 8);
static_assert(VM_OFFSET(FrameRecord, rowStep) == 12);
static_assert(VM_OFFSET(FrameRecord, reserved) == 16);
static_assert(VM_OFFSET(FrameRecord, xOrigin) == 20);
static_assert(VM_OFFSET(FrameRecord, yOrigin) == 24);
#endif

// The host's timing of a frame. Only the frame time is read.
struct TimingRecord {
    double first;
    double second;
    double frameTime;  // seconds from the start of the clip; NaN counts as 0
};
static_assert(sizeof(TimingRecord) == 24);
static_assert(VM_OFFSET(TimingRecord, frameTime) == 16);

inline constexpr std::int32_t kPresetNameWidth = 260;
inline constexpr std::int32_t kPresetCellCapacity = 100;

// The settings of an effect, as saved to and loaded from a preset file. Names are 8-bit text in the system code page,
// zero-terminated.
struct PresetRecord {
    char name[kPresetNameWidth];
    char libraryName[kPresetNameWidth];
    char effectName[kPresetNameWidth];
    ValueCell values[kPresetCellCapacity];  // in the effect's parameter order
    std::int32_t count;                     // cells in use, 0..100
};
static_assert(sizeof(PresetRecord) == 1984);
static_assert(VM_OFFSET(PresetRecord, libraryName) == 260);
static_assert(VM_OFFSET(PresetRecord, effectName) == 520);
static_assert(VM_OFFSET(PresetRecord, values) == 780);
static_assert(VM_OFFSET(PresetRecord, count) == 1980);

// ---------------------------------------------------------------------------------------------------------
// Interfaces. None has a destructor in its table, because compilers lay destructors out differently. The protected ones
// below only keep a host from deleting an object that it must release.

// In its own namespace, so that `using namespace velmora` alongside <windows.h> leaves only one IUnknown, the system's.
// Both have the same table and the same identifier.
namespace com {

class IUnknown {
  public:
    // Looks up this object's interface `iid`. Stores it in *out with one more reference and returns kStatusOk;
    // otherwise stores null and returns kStatusNoInterface. A null `out` is kStatusFailure.
    virtual Status VM_CALL QueryInterface(const Guid* iid, void** out) = 0;
    // Adds a reference and returns the new count. [any thread]
    virtual std::uint32_t VM_CALL AddRef() = 0;
    // Gives a reference back and returns the remaining count; at 0 the object is gone. [any thread]
    virtual std::uint32_t VM_CALL Release() = 0;

  protected:
    ~IUnknown() = default;
};

}  // namespace com

// What an effect asks the host while it renders, on the thread that called Process. Implemented by the host (PlainHost
// below is a start). Not used after Process, except for identifiers that the effect itself does not know (see
// IVideoEffect).
class IVideoHost : public com::IUnknown {
  public:
    // Writes the value of the effect's parameter `index` into cell->value, in the format of `kind` (ParamKind), and
    // `kind` into cell->kind. Returns true if there is such a parameter. After false, the effect uses what the cell holds,
    // which is 0 unless the host has changed it.
    virtual bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) = 0;
    // The next four are not called while rendering. An effect implements them as a host of its own renderer: it forwards the
    // first two to the attached host, returns false from the third and does nothing in the fourth.
    virtual bool VM_CALL HostOperation4(std::intptr_t a, std::intptr_t b, std::intptr_t c) = 0;
    virtual std::uint32_t VM_CALL HostOperation5(std::intptr_t a, std::intptr_t b) = 0;
    virtual bool VM_CALL HostOperation6(std::intptr_t a, std::intptr_t b) = 0;
    virtual void VM_CALL HostOperation7(std::intptr_t a, std::intptr_t b) = 0;

  protected:
    ~IVideoHost() = default;
};

// The effects, as CreateEffect numbers them.
enum EffectIndex : std::uint32_t {
    kEffectFilmCamera = 0,
    kEffectFilmLook = 1,
    kEffectFilmDamage = 2,
    kEffectFilmExpress = 3,
    kEffectFilmPro = 4,
    kEffectCount = 5,
};

// One effect. QueryInterface answers to IUnknown, IVideoEffect and IVideoHost; other identifiers are passed on to the
// host of the last Process call, so that host must stay alive for as long as such queries are made.
class IVideoEffect : public com::IUnknown {
  public:
    // The name that users see, for example "Film Look". [any thread]
    virtual const char* VM_CALL GetName() = 0;
    // Always 1. [any thread]
    virtual std::int32_t VM_CALL GetKind() = 0;
    // Fills the descriptor of parameter `index`, from 0; false past the last one (nothing is written). [any thread]
    virtual bool VM_CALL GetParamInfo(std::uint32_t index, ParamDescriptor* descriptor) = 0;
    // Renders one frame: reads the parameters from `host` (null: every value reads as 0), processes the smaller of the
    // two regions of `source` and writes it to `destination`. Nothing outside that rectangle of the destination is
    // written, and the source is never written; both may be the same memory. `hostArgument` is not read. Returns false,
    // with nothing written, when either frame or `timing` is missing or a frame is invalid. [one at a time]
    virtual bool VM_CALL Process(IVideoHost* host, const FrameRecord* source, void* hostArgument,
                                 const FrameRecord* destination, const TimingRecord* timing) = 0;
    // The name of built-in preset `index`, from 0; null past the last one. [any thread]
    virtual const char* VM_CALL GetPresetName(std::uint32_t index) = 0;
    // Copies the value that a built-in preset gives a parameter. False when an index is past its end or
    // `cell` is null. [any thread]
    virtual bool VM_CALL GetPresetValue(std::uint32_t preset, std::uint32_t parameter, PresetCell* cell) = 0;

  protected:
    ~IVideoEffect() = default;
};

// Converts between packed YCbCr 4:2:2 (bytes Y0 Cb Y1 Cr for each pair of pixels, also for a single last pixel) and
// 32-bit frames, over the smaller of the two sizes, with the frame rules of IVideoEffect::Process. Answers to IUnknown
// only. Converters are independent of each other and of effects; each serves one thread at a time.
class IFrameProcessor : public com::IUnknown {
  public:
    virtual bool VM_CALL Reserved3(const FrameRecord* source, const FrameRecord* destination,
                                   std::uint8_t value) = 0;  // always false
    virtual bool VM_CALL Reserved4(const FrameRecord* source, const FrameRecord* destination,
                                   std::uint8_t value) = 0;  // always false
    virtual bool VM_CALL Reserved5(const FrameRecord* source, const FrameRecord* destination,
                                   std::uint8_t value) = 0;  // always false
    // 4:2:2 to 32-bit; `alpha` is stored in every pixel. False when a frame is missing or invalid, or when there is not
    // enough memory.
    virtual bool VM_CALL ConvertYcbcrToBgra(const FrameRecord* source, const FrameRecord* destination,
                                            std::uint8_t alpha) = 0;
    // 32-bit to 4:2:2; the byte is not read.
    virtual bool VM_CALL ConvertBgraToYcbcr(const FrameRecord* source, const FrameRecord* destination,
                                            std::uint8_t unused) = 0;

  protected:
    ~IFrameProcessor() = default;
};

class IEffectLibrary;

// Lets the user load and save the settings of one effect through the system's file dialogs. [user interface]
class IPresetSaver : public com::IUnknown {
  public:
    // `owner` is the dialog's owner window; `library` may be null; `effectIndex` as for CreateEffect; `languageCode` is
    // null (plain dialogs) or a two-letter code (translated dialogs). Returns 0 when done or cancelled, 1 after a
    // failure, 2 when the preset read does not belong to this effect (do not apply it). The user has already seen a
    // message for 1 and 2. A null `record` is a failure.
    virtual std::int32_t VM_CALL LoadPreset(void* owner, IEffectLibrary* library, std::uint32_t effectIndex,
                                            PresetRecord* record, const char* languageCode) = 0;
    // As above; returns 0 or 1. Stores the names of the library and the effect in the record; record->name is the
    // host's.
    virtual std::int32_t VM_CALL SavePreset(void* owner, IEffectLibrary* library, std::uint32_t effectIndex,
                                            PresetRecord* record, const char* languageCode) = 0;

  protected:
    ~IPresetSaver() = default;
};

// Translated texts. Available through the library's QueryInterface once a language file is loaded; shares the library's
// reference count. [user interface]
class IMultiLingual : public com::IUnknown {
  public:
    // Like GetText, but writes `fallback` (may be null) when there is no such text. Sets `found` (may be null) to 1
    // when there is one, otherwise to 0. The arguments are passed to the language module unchanged.
    virtual std::int32_t VM_CALL LookUpText(const char* languageCode, std::int32_t category, const char* key,
                                            const char16_t* fallback, char16_t* buffer, std::int32_t capacity,
                                            std::int32_t* found) = 0;
    // Writes the text for a key in a language (two letters) into `buffer` of `capacity` 16-bit characters, truncated to
    // fit and terminated. Returns the characters written, 0 when there is no such text.
    virtual std::int32_t VM_CALL GetText(const char* languageCode, std::int32_t category, const char* key,
                                         char16_t* buffer, std::int32_t capacity) = 0;

  protected:
    ~IMultiLingual() = default;
};

// The process-wide settings, options dialog and help. Not reference-counted; valid while the library is
// loaded. [user interface]
class IShellServices {
  public:
    // Called by the library itself when it is created; false when already started. `dialogs` is non-zero
    // when the library shows dialogs of its own.
    virtual bool VM_CALL Start(void* moduleHandle, com::IUnknown* textSource, const char* helpFileName,
                               std::int32_t dialogs) = 0;
    // The user's preference: circular knobs are turned by dragging up and down.
    virtual bool VM_CALL KnobsDragVertical() = 0;
    // Shows the options dialog modally. 1: the user chose OK; 0: cancelled.
    virtual std::int32_t VM_CALL ShowOptions(void* owner) = 0;
    virtual void VM_CALL ShutDown() = 0;
    // Opens the help at a numbered topic: in the system's viewer if `externalViewer` is non-zero, otherwise in a window of
    // this process. Non-zero if it was opened.
    virtual std::int32_t VM_CALL ShowHelp(void* owner, std::int32_t topic, std::int32_t externalViewer) = 0;

  protected:
    ~IShellServices() = default;
};

class IEffectLibrary : public com::IUnknown {
  public:
    // kLibraryName. [any thread]
    virtual const char* VM_CALL GetLibraryName() = 0;
    // A new effect with one reference; `index` is an EffectIndex. Null past the last one or when there is not enough
    // memory. It may outlive the library object. [any thread]
    virtual IVideoEffect* VM_CALL CreateEffect(std::uint32_t index) = 0;
    // Opens the help file at a topic in the system's viewer; non-zero if it was opened. [user interface]
    virtual std::int32_t VM_CALL ShowHelp(void* owner, std::int32_t topic) = 0;
    // Not reference-counted. [any thread]
    virtual IShellServices* VM_CALL GetShellServices() = 0;
    // A new object with one reference, or null when there is not enough memory. [any thread]
    virtual IFrameProcessor* VM_CALL CreateFrameProcessor() = 0;
    // A new object with one reference, or null when there is not enough memory. [any thread]
    virtual IPresetSaver* VM_CALL CreatePresetSaver() = 0;

  protected:
    ~IEffectLibrary() = default;
};

// ---------------------------------------------------------------------------------------------------------
// Base classes for what a host implements. They refuse everything; a host overrides what it supports.

// An object that lives as long as its owner: it ignores reference counting and answers to no identifier.
template <class Interface>
class Uncounted : public Interface {
  public:
    Status VM_CALL QueryInterface(const Guid*, void** out) override {
        if (out == nullptr) return kStatusFailure;
        *out = nullptr;
        return kStatusNoInterface;
    }
    std::uint32_t VM_CALL AddRef() override { return 1; }
    std::uint32_t VM_CALL Release() override { return 1; }

  protected:
    ~Uncounted() = default;
};

// A host without any values: override GetParamValue.
class PlainHost : public Uncounted<IVideoHost> {
  public:
    bool VM_CALL GetParamValue(std::uint32_t, ValueCell*, std::uint32_t) override { return false; }
    bool VM_CALL HostOperation4(std::intptr_t, std::intptr_t, std::intptr_t) override { return false; }
    std::uint32_t VM_CALL HostOperation5(std::intptr_t, std::intptr_t) override { return 0; }
    bool VM_CALL HostOperation6(std::intptr_t, std::intptr_t) override { return false; }
    void VM_CALL HostOperation7(std::intptr_t, std::intptr_t) override {}

  protected:
    ~PlainHost() = default;
};

// ---------------------------------------------------------------------------------------------------------
// Exports of VMReelEffects.dll, undecorated names.

// "GetEffectsLibrary": a new library object with one reference that belongs to the caller; null when there is not
// enough memory. Loads the translated texts. [user interface], and no frame may be rendering at the time.
using GetEffectsLibraryFunction = IEffectLibrary*(VM_CALL*)();
// "CanUnloadDLLNow": true when no library object is alive. Effects are not counted: release them first. [any thread]
using CanUnloadDLLNowFunction = bool(VM_CALL*)();

}  // namespace velmora

#undef VM_OFFSET
