// The checks, grouped by source file. AllChecks() gives each its name and level.
#pragma once

#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {

// checks_boundary.cpp
void CheckExports(CheckContext& context);
void CheckReferences(CheckContext& context);
void CheckNullArguments(CheckContext& context);
void CheckOutliving(CheckContext& context);
void CheckThreads(CheckContext& context);
void CheckFramesAtOnce(CheckContext& context);

// checks_tables.cpp
void CheckDescriptions(CheckContext& context);
void CheckPresets(CheckContext& context);

// checks_frames.cpp
void CheckFirstFrames(CheckContext& context);
void CheckSmallSizes(CheckContext& context);
void CheckRefusedFrames(CheckContext& context);
void CheckLayouts(CheckContext& context);
void CheckInPlace(CheckContext& context);
void CheckOverlaps(CheckContext& context);
void CheckRandomShapes(CheckContext& context);
void CheckVideoSizes(CheckContext& context);
void CheckLargestSizes(CheckContext& context);

// checks_converter.cpp
void CheckConverter(CheckContext& context);
void CheckConverterShapes(CheckContext& context);

// checks_values.cpp
void CheckClamping(CheckContext& context);
void CheckTimes(CheckContext& context);
void CheckMenus(CheckContext& context);
void CheckHostileValues(CheckContext& context);
void CheckAlternating(CheckContext& context);
void CheckReplay(CheckContext& context);

// checks_allocation.cpp
void CheckLoading(CheckContext& context);
void CheckLoadFailures(CheckContext& context);
void CheckCreateFailures(CheckContext& context);
void CheckTableAllocations(CheckContext& context);
void CheckFrameAllocations(CheckContext& context);
void CheckFrameFailures(CheckContext& context);
void CheckEndurance(CheckContext& context);

// checks_dialogs.cpp
void CheckPresetFiles(CheckContext& context);
void CheckPresetFailures(CheckContext& context);
void CheckDialogFailures(CheckContext& context);
void CheckSystemDialogs(CheckContext& context);

// checks_processor.cpp
void CheckProcessorState(CheckContext& context);
void CheckStack(CheckContext& context);

// checks_openfx_tables.cpp
void CheckOpenfxExports(CheckContext& context);
void CheckOpenfxDescriptions(CheckContext& context);
void CheckOpenfxMissingSuites(CheckContext& context);
void CheckOpenfxWrongHandles(CheckContext& context);
void CheckOpenfxLoading(CheckContext& context);

// checks_openfx_frames.cpp
void CheckOpenfxFirstFrames(CheckContext& context);
void CheckOpenfxSpaces(CheckContext& context);
void CheckOpenfxLayouts(CheckContext& context);
void CheckOpenfxParts(CheckContext& context);
void CheckOpenfxRefused(CheckContext& context);
void CheckOpenfxFields(CheckContext& context);
void CheckOpenfxMask(CheckContext& context);
void CheckOpenfxAbsent(CheckContext& context);

// checks_openfx_tiles.cpp
void CheckOpenfxTiles(CheckContext& context);
void CheckOpenfxScales(CheckContext& context);
void CheckOpenfxTimes(CheckContext& context);
void CheckOpenfxAnimation(CheckContext& context);

// checks_openfx_instances.cpp
void CheckOpenfxPresets(CheckContext& context);
void CheckOpenfxIdentity(CheckContext& context);
void CheckOpenfxAbort(CheckContext& context);
void CheckOpenfxMemory(CheckContext& context);
void CheckOpenfxThreads(CheckContext& context);
void CheckOpenfxHostileValues(CheckContext& context);

}  // namespace velmora::reelcheck
