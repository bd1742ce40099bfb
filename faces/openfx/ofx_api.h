// The C interface between an OpenFX host and an image effect plug-in, as far as our plug-ins and the host in reelcheck
// use it. It follows version 1.4 of the standard: image effect API 1, with version 1 of each suite.
//
// Names, member orders and property strings are the standard's. Handles are pointers to types that only the host knows.
// Strings are UTF-8; those that a host returns stay valid until the property changes. All functions are C functions.
#pragma once

#include <cstddef>

extern "C" {

using OfxStatus = int;
using OfxTime = double;  // in frames
using OfxPropertySetHandle = struct OfxPropertySetStruct*;
using OfxImageEffectHandle = struct OfxImageEffectStruct*;
using OfxImageClipHandle = struct OfxImageClipStruct*;
using OfxImageMemoryHandle = struct OfxImageMemoryStruct*;
using OfxParamSetHandle = struct OfxParamSetStruct*;
using OfxParamHandle = struct OfxParamStruct*;

// Pixels or canonical coordinates; x2 and y2 are exclusive. y counts upwards.
struct OfxRectI {
    int x1, y1, x2, y2;
};
struct OfxRectD {
    double x1, y1, x2, y2;
};

struct OfxHost {
    OfxPropertySetHandle host;
    // Null for a suite that the host lacks.
    const void* (*fetchSuite)(OfxPropertySetHandle host, const char* suiteName, int suiteVersion);
};

using OfxPluginEntryPoint = OfxStatus (*)(const char* action, const void* handle, OfxPropertySetHandle inArgs,
                                          OfxPropertySetHandle outArgs);

struct OfxPlugin {
    const char* pluginApi;
    int apiVersion;
    const char* pluginIdentifier;
    unsigned int pluginVersionMajor;
    unsigned int pluginVersionMinor;
    void (*setHost)(OfxHost* host);
    OfxPluginEntryPoint mainEntry;
};

struct OfxPropertySuiteV1 {
    OfxStatus (*propSetPointer)(OfxPropertySetHandle, const char* property, int index, void* value);
    OfxStatus (*propSetString)(OfxPropertySetHandle, const char* property, int index, const char* value);
    OfxStatus (*propSetDouble)(OfxPropertySetHandle, const char* property, int index, double value);
    OfxStatus (*propSetInt)(OfxPropertySetHandle, const char* property, int index, int value);
    OfxStatus (*propSetPointerN)(OfxPropertySetHandle, const char* property, int count, void* const* values);
    OfxStatus (*propSetStringN)(OfxPropertySetHandle, const char* property, int count,
                                const char* const* values);
    OfxStatus (*propSetDoubleN)(OfxPropertySetHandle, const char* property, int count, const double* values);
    OfxStatus (*propSetIntN)(OfxPropertySetHandle, const char* property, int count, const int* values);
    OfxStatus (*propGetPointer)(OfxPropertySetHandle, const char* property, int index, void** value);
    OfxStatus (*propGetString)(OfxPropertySetHandle, const char* property, int index, char** value);
    OfxStatus (*propGetDouble)(OfxPropertySetHandle, const char* property, int index, double* value);
    OfxStatus (*propGetInt)(OfxPropertySetHandle, const char* property, int index, int* value);
    OfxStatus (*propGetPointerN)(OfxPropertySetHandle, const char* property, int count, void** values);
    OfxStatus (*propGetStringN)(OfxPropertySetHandle, const char* property, int count, char** values);
    OfxStatus (*propGetDoubleN)(OfxPropertySetHandle, const char* property, int count, double* values);
    OfxStatus (*propGetIntN)(OfxPropertySetHandle, const char* property, int count, int* values);
    OfxStatus (*propReset)(OfxPropertySetHandle, const char* property);
    OfxStatus (*propGetDimension)(OfxPropertySetHandle, const char* property, int* count);
};
static_assert(sizeof(OfxPropertySuiteV1) == 18 * sizeof(void*));

struct OfxImageEffectSuiteV1 {
    OfxStatus (*getPropertySet)(OfxImageEffectHandle, OfxPropertySetHandle* properties);
    OfxStatus (*getParamSet)(OfxImageEffectHandle, OfxParamSetHandle* params);
    OfxStatus (*clipDefine)(OfxImageEffectHandle, const char* name, OfxPropertySetHandle* properties);
    // `properties` may be null.
    OfxStatus (*clipGetHandle)(OfxImageEffectHandle, const char* name, OfxImageClipHandle* clip,
                               OfxPropertySetHandle* properties);
    OfxStatus (*clipGetPropertySet)(OfxImageClipHandle, OfxPropertySetHandle* properties);
    // The caller gives the image back. A null region leaves its size to the host.
    OfxStatus (*clipGetImage)(OfxImageClipHandle, OfxTime time, const OfxRectD* region,
                              OfxPropertySetHandle* image);
    OfxStatus (*clipReleaseImage)(OfxPropertySetHandle image);
    OfxStatus (*clipGetRegionOfDefinition)(OfxImageClipHandle, OfxTime time, OfxRectD* bounds);
    // Not 0 when the render should end as soon as possible.
    int (*abort)(OfxImageEffectHandle);
    OfxStatus (*imageMemoryAlloc)(OfxImageEffectHandle, std::size_t bytes, OfxImageMemoryHandle* memory);
    OfxStatus (*imageMemoryFree)(OfxImageMemoryHandle);
    OfxStatus (*imageMemoryLock)(OfxImageMemoryHandle, void** data);
    OfxStatus (*imageMemoryUnlock)(OfxImageMemoryHandle);
};
static_assert(sizeof(OfxImageEffectSuiteV1) == 13 * sizeof(void*));

// The values of a parameter are variable arguments: double for Double, three doubles for RGB, int for Integer, Boolean
// and Choice; pointers to these when reading.
struct OfxParameterSuiteV1 {
    OfxStatus (*paramDefine)(OfxParamSetHandle, const char* type, const char* name,
                             OfxPropertySetHandle* properties);
    OfxStatus (*paramGetHandle)(OfxParamSetHandle, const char* name, OfxParamHandle* param,
                                OfxPropertySetHandle* properties);
    OfxStatus (*paramSetGetPropertySet)(OfxParamSetHandle, OfxPropertySetHandle* properties);
    OfxStatus (*paramGetPropertySet)(OfxParamHandle, OfxPropertySetHandle* properties);
    OfxStatus (*paramGetValue)(OfxParamHandle, ...);
    OfxStatus (*paramGetValueAtTime)(OfxParamHandle, OfxTime time, ...);
    OfxStatus (*paramGetDerivative)(OfxParamHandle, OfxTime time, ...);
    OfxStatus (*paramGetIntegral)(OfxParamHandle, OfxTime from, OfxTime to, ...);
    OfxStatus (*paramSetValue)(OfxParamHandle, ...);
    OfxStatus (*paramSetValueAtTime)(OfxParamHandle, OfxTime time, ...);
    OfxStatus (*paramGetNumKeys)(OfxParamHandle, unsigned int* count);
    OfxStatus (*paramGetKeyTime)(OfxParamHandle, unsigned int key, OfxTime* time);
    OfxStatus (*paramGetKeyIndex)(OfxParamHandle, OfxTime time, int direction, int* index);
    OfxStatus (*paramDeleteKey)(OfxParamHandle, OfxTime time);
    OfxStatus (*paramDeleteAllKeys)(OfxParamHandle);
    OfxStatus (*paramCopy)(OfxParamHandle to, OfxParamHandle from, OfxTime offset, const void* range);
    OfxStatus (*paramEditBegin)(OfxParamSetHandle, const char* name);
    OfxStatus (*paramEditEnd)(OfxParamSetHandle);
};
static_assert(sizeof(OfxParameterSuiteV1) == 18 * sizeof(void*));

struct OfxMemorySuiteV1 {
    OfxStatus (*memoryAlloc)(void* handle, std::size_t bytes, void** memory);  // a handle or null
    OfxStatus (*memoryFree)(void* memory);
};

}  // extern "C"

// Statuses.
enum : OfxStatus {
    kOfxStatOK = 0,
    kOfxStatFailed = 1,
    kOfxStatErrFatal = 2,
    kOfxStatErrUnknown = 3,
    kOfxStatErrMissingHostFeature = 4,
    kOfxStatErrUnsupported = 5,
    kOfxStatErrExists = 6,
    kOfxStatErrFormat = 7,
    kOfxStatErrMemory = 8,
    kOfxStatErrBadHandle = 9,
    kOfxStatErrBadIndex = 10,
    kOfxStatErrValue = 11,
    kOfxStatReplyYes = 12,
    kOfxStatReplyNo = 13,
    kOfxStatReplyDefault = 14,
    kOfxStatErrImageFormat = 1000,
};

// clang-format off

// Suites.
inline constexpr int kOfxImageEffectPluginApiVersion = 1;
inline constexpr char kOfxImageEffectPluginApi[] = "OfxImageEffectPluginAPI";
inline constexpr char kOfxPropertySuite[]        = "OfxPropertySuite";
inline constexpr char kOfxImageEffectSuite[]     = "OfxImageEffectSuite";
inline constexpr char kOfxParameterSuite[]       = "OfxParameterSuite";
inline constexpr char kOfxMemorySuite[]          = "OfxMemorySuite";

// Actions.
inline constexpr char kOfxActionLoad[]                                = "OfxActionLoad";
inline constexpr char kOfxActionUnload[]                              = "OfxActionUnload";
inline constexpr char kOfxActionDescribe[]                            = "OfxActionDescribe";
inline constexpr char kOfxActionCreateInstance[]                      = "OfxActionCreateInstance";
inline constexpr char kOfxActionDestroyInstance[]                     = "OfxActionDestroyInstance";
inline constexpr char kOfxActionInstanceChanged[]                     = "OfxActionInstanceChanged";
inline constexpr char kOfxActionPurgeCaches[]                         = "OfxActionPurgeCaches";
inline constexpr char kOfxActionSyncPrivateData[]                     = "OfxActionSyncPrivateData";
inline constexpr char kOfxImageEffectActionDescribeInContext[]        = "OfxImageEffectActionDescribeInContext";
inline constexpr char kOfxImageEffectActionGetRegionOfDefinition[]    = "OfxImageEffectActionGetRegionOfDefinition";
inline constexpr char kOfxImageEffectActionGetRegionsOfInterest[]     = "OfxImageEffectActionGetRegionsOfInterest";
inline constexpr char kOfxImageEffectActionGetClipPreferences[]       = "OfxImageEffectActionGetClipPreferences";
inline constexpr char kOfxImageEffectActionIsIdentity[]               = "OfxImageEffectActionIsIdentity";
inline constexpr char kOfxImageEffectActionBeginSequenceRender[]      = "OfxImageEffectActionBeginSequenceRender";
inline constexpr char kOfxImageEffectActionRender[]                   = "OfxImageEffectActionRender";
inline constexpr char kOfxImageEffectActionEndSequenceRender[]        = "OfxImageEffectActionEndSequenceRender";

// Properties of every object, and arguments of actions.
inline constexpr char kOfxPropType[]              = "OfxPropType";
inline constexpr char kOfxPropName[]              = "OfxPropName";
inline constexpr char kOfxPropLabel[]             = "OfxPropLabel";
inline constexpr char kOfxPropTime[]              = "OfxPropTime";
inline constexpr char kOfxPropVersion[]           = "OfxPropVersion";
inline constexpr char kOfxPropVersionLabel[]      = "OfxPropVersionLabel";
inline constexpr char kOfxPropPluginDescription[] = "OfxPropPluginDescription";
inline constexpr char kOfxPropInstanceData[]      = "OfxPropInstanceData";
inline constexpr char kOfxPropChangeReason[]      = "OfxPropChangeReason";
inline constexpr char kOfxChangeUserEdited[]      = "OfxChangeUserEdited";
inline constexpr char kOfxChangePluginEdited[]    = "OfxChangePluginEdited";
inline constexpr char kOfxTypeParameter[]         = "OfxTypeParameter";
inline constexpr char kOfxTypeClip[]              = "OfxTypeClip";

// Effects.
inline constexpr char kOfxImageEffectPropContext[]                       = "OfxImageEffectPropContext";
inline constexpr char kOfxImageEffectContextFilter[]                     = "OfxImageEffectContextFilter";
inline constexpr char kOfxImageEffectContextGeneral[]                    = "OfxImageEffectContextGeneral";
inline constexpr char kOfxImageEffectPluginPropGrouping[]                = "OfxImageEffectPluginPropGrouping";
inline constexpr char kOfxImageEffectPluginPropSingleInstance[]          = "OfxImageEffectPluginPropSingleInstance";
inline constexpr char kOfxImageEffectPluginPropHostFrameThreading[]      = "OfxImageEffectPluginPropHostFrameThreading";
inline constexpr char kOfxImageEffectPluginPropFieldRenderTwiceAlways[]  = "OfxImageEffectPluginPropFieldRenderTwiceAlways";
inline constexpr char kOfxImageEffectPluginRenderThreadSafety[]          = "OfxImageEffectPluginRenderThreadSafety";
inline constexpr char kOfxImageEffectRenderFullySafe[]                   = "OfxImageEffectRenderFullySafe";
inline constexpr char kOfxImageEffectPropSupportedContexts[]             = "OfxImageEffectPropSupportedContexts";
inline constexpr char kOfxImageEffectPropSupportedPixelDepths[]          = "OfxImageEffectPropSupportedPixelDepths";
inline constexpr char kOfxImageEffectPropSupportedComponents[]           = "OfxImageEffectPropSupportedComponents";
inline constexpr char kOfxImageEffectPropSupportsMultiResolution[]       = "OfxImageEffectPropSupportsMultiResolution";
inline constexpr char kOfxImageEffectPropSupportsTiles[]                 = "OfxImageEffectPropSupportsTiles";
inline constexpr char kOfxImageEffectPropTemporalClipAccess[]            = "OfxImageEffectPropTemporalClipAccess";
inline constexpr char kOfxImageEffectPropSupportsMultipleClipDepths[]    = "OfxImageEffectPropMultipleClipDepths";
inline constexpr char kOfxImageEffectPropSupportsMultipleClipPARs[]      = "OfxImageEffectPropSupportsMultipleClipPARs";
inline constexpr char kOfxImageEffectPropFrameRate[]                     = "OfxImageEffectPropFrameRate";
inline constexpr char kOfxImageEffectPropRenderScale[]                   = "OfxImageEffectPropRenderScale";
inline constexpr char kOfxImageEffectPropRenderWindow[]                  = "OfxImageEffectPropRenderWindow";
inline constexpr char kOfxImageEffectPropFieldToRender[]                 = "OfxImageEffectPropFieldToRender";
inline constexpr char kOfxImageEffectPropRegionOfDefinition[]            = "OfxImageEffectPropRegionOfDefinition";
inline constexpr char kOfxImageEffectPropRegionOfInterest[]              = "OfxImageEffectPropRegionOfInterest";
inline constexpr char kOfxImageEffectFrameVarying[]                      = "OfxImageEffectFrameVarying";

// Clips and images. The region of interest of a clip is an argument whose name ends with the clip's.
inline constexpr char kOfxImageEffectOutputClipName[]          = "Output";
inline constexpr char kOfxImageEffectSimpleSourceClipName[]    = "Source";
inline constexpr char kOfxImageClipPropOptional[]              = "OfxImageClipPropOptional";
inline constexpr char kOfxImageClipPropIsMask[]                = "OfxImageClipPropIsMask";
inline constexpr char kOfxImageClipPropConnected[]             = "OfxImageClipPropConnected";
inline constexpr char kOfxImageClipPropFieldExtraction[]       = "OfxImageClipPropFieldExtraction";
inline constexpr char kOfxImageClipPropRoI_[]                  = "OfxImageClipPropRoI_";
inline constexpr char kOfxImageEffectPropPixelDepth[]          = "OfxImageEffectPropPixelDepth";
inline constexpr char kOfxBitDepthByte[]                       = "OfxBitDepthByte";
inline constexpr char kOfxBitDepthShort[]                      = "OfxBitDepthShort";
inline constexpr char kOfxBitDepthFloat[]                      = "OfxBitDepthFloat";
inline constexpr char kOfxImageEffectPropComponents[]          = "OfxImageEffectPropComponents";
inline constexpr char kOfxImageComponentRGBA[]                 = "OfxImageComponentRGBA";
inline constexpr char kOfxImageComponentRGB[]                  = "OfxImageComponentRGB";
inline constexpr char kOfxImageComponentAlpha[]                = "OfxImageComponentAlpha";
inline constexpr char kOfxImageEffectPropPreMultiplication[]   = "OfxImageEffectPropPreMultiplication";
inline constexpr char kOfxImageOpaque[]                        = "OfxImageOpaque";
inline constexpr char kOfxImagePreMultiplied[]                 = "OfxImageAlphaPremultiplied";
inline constexpr char kOfxImageUnPreMultiplied[]               = "OfxImageAlphaUnPremultiplied";
inline constexpr char kOfxImagePropData[]                      = "OfxImagePropData";
inline constexpr char kOfxImagePropBounds[]                    = "OfxImagePropBounds";
inline constexpr char kOfxImagePropRegionOfDefinition[]        = "OfxImagePropRegionOfDefinition";
inline constexpr char kOfxImagePropRowBytes[]                  = "OfxImagePropRowBytes";
inline constexpr char kOfxImageFieldNone[]                     = "OfxFieldNone";
inline constexpr char kOfxImageFieldBoth[]                     = "OfxFieldBoth";
inline constexpr char kOfxImageFieldLower[]                    = "OfxFieldLower";  // rows 0, 2, 4...
inline constexpr char kOfxImageFieldUpper[]                    = "OfxFieldUpper";  // rows 1, 3, 5...
inline constexpr char kOfxImageFieldDoubled[]                  = "OfxFieldDoubled";

// Parameters.
inline constexpr char kOfxParamTypeInteger[]          = "OfxParamTypeInteger";
inline constexpr char kOfxParamTypeDouble[]           = "OfxParamTypeDouble";
inline constexpr char kOfxParamTypeBoolean[]          = "OfxParamTypeBoolean";
inline constexpr char kOfxParamTypeChoice[]           = "OfxParamTypeChoice";
inline constexpr char kOfxParamTypeRGB[]              = "OfxParamTypeRGB";
inline constexpr char kOfxParamTypeGroup[]            = "OfxParamTypeGroup";
inline constexpr char kOfxParamTypePage[]             = "OfxParamTypePage";
inline constexpr char kOfxParamTypePushButton[]       = "OfxParamTypePushButton";
inline constexpr char kOfxParamPropType[]             = "OfxParamPropType";
inline constexpr char kOfxParamPropDefault[]          = "OfxParamPropDefault";
inline constexpr char kOfxParamPropMin[]              = "OfxParamPropMin";
inline constexpr char kOfxParamPropMax[]              = "OfxParamPropMax";
inline constexpr char kOfxParamPropDisplayMin[]       = "OfxParamPropDisplayMin";
inline constexpr char kOfxParamPropDisplayMax[]       = "OfxParamPropDisplayMax";
inline constexpr char kOfxParamPropIncrement[]        = "OfxParamPropIncrement";
inline constexpr char kOfxParamPropDigits[]           = "OfxParamPropDigits";
inline constexpr char kOfxParamPropHint[]             = "OfxParamPropHint";
inline constexpr char kOfxParamPropParent[]           = "OfxParamPropParent";
inline constexpr char kOfxParamPropPageChild[]        = "OfxParamPropPageChild";
inline constexpr char kOfxParamPropChoiceOption[]     = "OfxParamPropChoiceOption";
inline constexpr char kOfxParamPropAnimates[]         = "OfxParamPropAnimates";
inline constexpr char kOfxParamPropEvaluateOnChange[] = "OfxParamPropEvaluateOnChange";
inline constexpr char kOfxPluginPropParamPageOrder[]  = "OfxPluginPropParamPageOrder";

// clang-format on
