#include "programs/reelcheck/checks.h"

namespace velmora::reelcheck {
namespace {

// clang-format off
constexpr Check kChecks[] = {
#ifdef REELCHECK_LIBRARY
    {"exports",           1, CheckExports,        "the two exports, and when the library may be unloaded"},
    {"references",        1, CheckReferences,     "counts and interfaces of every object"},
    {"descriptions",      1, CheckDescriptions,   "every parameter of every effect describes itself within its record"},
    {"presets",           1, CheckPresets,        "every preset has a name and a valid value for every parameter"},
    {"first-frames",      1, CheckFirstFrames,    "every effect renders a frame"},
    {"small-sizes",       2, CheckSmallSizes,     "frames from 1x1 up, between inaccessible pages, with read-only sources"},
    {"null-arguments",    2, CheckNullArguments,  "null wherever a pointer is passed"},
    {"refused-frames",    2, CheckRefusedFrames,  "invalid frames are refused; nothing is written, and the host is not asked"},
    {"layouts",           3, CheckLayouts,        "unusual steps, origins, bottom-up: the same picture"},
    {"in-place",          3, CheckInPlace,        "source and destination in the same memory: the same picture"},
    {"clamping",          3, CheckClamping,       "values outside their range count as its ends, NaN as 0"},
    {"times",             3, CheckTimes,          "any time: negative, huge, NaN"},
    {"replay",            3, CheckReplay,         "a frame that is repeated at once has the same bytes"},
    {"converter",         3, CheckConverter,      "4:2:2 to 32-bit and back, small sizes between inaccessible pages"},
    {"overlaps",          4, CheckOverlaps,       "frames that share some of their memory: as if the source were copied first"},
    {"menus",             4, CheckMenus,          "any menu index"},
    {"hostile-values",    4, CheckHostileValues,  "random bits for every parameter"},
    {"alternating",       4, CheckAlternating,    "alternating effects and sizes do not affect each other"},
    {"processor-state",   4, CheckProcessorState, "x87, vector control and direction flag in any state; the state is kept"},
    {"stack",             4, CheckStack,          "a stack that is only aligned to 4 bytes"},
    {"outliving",         4, CheckOutliving,      "objects still work when the library object is gone"},
    {"loading",           4, CheckLoading,         "200 rounds of loading and unloading: no handle, module or memory is lost"},
    {"preset-files",      5, CheckPresetFiles,     "every preset to a file and back, cancelled dialogs, a folder that cannot be written"},
    {"table-allocations", 5, CheckTableAllocations,"describing allocates nothing"},
    {"frame-allocations", 5, CheckFrameAllocations,"rendering reuses its buffers"},
    {"load-failures",     5, CheckLoadFailures,    "each allocation while loading fails once"},
    {"create-failures",   5, CheckCreateFailures,  "each allocation while creating an object fails once"},
    {"frame-failures",    5, CheckFrameFailures,   "each allocation while rendering a frame fails once"},
    {"preset-failures",   5, CheckPresetFailures,  "each allocation while saving and loading a preset fails once"},
    {"threads",           6, CheckThreads,        "reference counts on several threads at once, frames on one thread after another"},
    {"frames-at-once",    6, CheckFramesAtOnce,   "frames on several threads at once, against the contract: no crash, no mixed settings"},
    {"random-shapes",     6, CheckRandomShapes,   "random sizes, origins, steps, values and times together"},
    {"converter-shapes",  6, CheckConverterShapes,"random shapes for the converter"},
    {"dialog-failures",   6, CheckDialogFailures,  "each allocation while showing options and help fails once"},
    {"video-sizes",       7, CheckVideoSizes,     "every preset at common video sizes"},
    {"system-dialogs",    8, CheckSystemDialogs,   "the system's own dialogs, cancelled"},
    {"endurance",         8, CheckEndurance,       "thousands of frames with changing presets: nothing grows"},
    {"largest-sizes",     9, CheckLargestSizes,   "every effect at up to 8192x4320"},
#endif
#ifdef REELCHECK_OPENFX
    {"openfx-exports",        1, CheckOpenfxExports,       "the OpenFX bundle's two exports, and its list of plug-ins"},
    {"openfx-descriptions",   1, CheckOpenfxDescriptions,  "every plug-in describes itself in every context, as the effects' tables say"},
    {"openfx-first-frames",   1, CheckOpenfxFirstFrames,   "every preset of every plug-in, in 8 bits, 16 bits and float, with and without alpha: the picture of reelfx"},
    {"openfx-missing-suites", 2, CheckOpenfxMissingSuites, "no host, no suites, suites without functions: refused in every action"},
    {"openfx-wrong-handles",  2, CheckOpenfxWrongHandles,  "invalid handles, handles of other objects, actions without arguments, unknown actions"},
    {"openfx-refused",        2, CheckOpenfxRefused,       "invalid pictures are refused; nothing is written or kept"},
    {"openfx-layouts",        3, CheckOpenfxLayouts,       "sizes from 1x1 up, between inaccessible pages, any origin, row bytes of both signs, render windows: the same picture"},
    {"openfx-parts",          3, CheckOpenfxParts,         "sources smaller than their region, outputs larger than it"},
    {"openfx-spaces",         3, CheckOpenfxSpaces,        "display, light and raw values, premultiplied or not, in every depth"},
    {"openfx-presets",        3, CheckOpenfxPresets,       "a preset sets every parameter in one step; the button draws a seed"},
    {"openfx-identity",       3, CheckOpenfxIdentity,      "neutral values and a mix of 0 leave the source unchanged; which frames vary"},
    {"openfx-mask",           3, CheckOpenfxMask,          "mix and mask, 8-bit and float, also smaller than the picture"},
    {"openfx-absent",         3, CheckOpenfxAbsent,        "a source or a mask that has no picture at a time"},
    {"openfx-fields",         3, CheckOpenfxFields,        "one field: only its rows are written"},
    {"openfx-tiles",          3, CheckOpenfxTiles,         "every preset by a tile, of the source too where a stage does not need all of it"},
    {"openfx-scales",         3, CheckOpenfxScales,        "render scales and pixels that are not square: regions in canonical coordinates"},
    {"openfx-times",          3, CheckOpenfxTimes,         "start frames and frame rates: the clip's frame"},
    {"openfx-animation",      3, CheckOpenfxAnimation,     "animated values: the frames of the same fade in reelfx"},
    {"openfx-abort",          4, CheckOpenfxAbort,         "the host stops the render at every query: nothing is kept, and the next frame is right"},
    {"openfx-memory",         4, CheckOpenfxMemory,        "each block of the host's memory fails once; a host without memory"},
    {"openfx-threads",        4, CheckOpenfxThreads,       "frames of one instance on several threads at once: the same bytes"},
    {"openfx-hostile-values", 4, CheckOpenfxHostileValues, "extreme values for every parameter, time and rate"},
    {"openfx-loading",        4, CheckOpenfxLoading,       "100 rounds of loading and unloading, also without describing: no handle, module or memory is lost"},
#endif
};
// clang-format on

}  // namespace

std::span<const Check> AllChecks() {
    return kChecks;
}

}  // namespace velmora::reelcheck
