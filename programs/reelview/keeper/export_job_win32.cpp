#include <exception>
#include <new>

#include "programs/reelview/keeper/export_job_win32.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

std::unique_ptr<FrameSink> SinkFor(const ExportOrder& order, const ClipFacts& facts) {
    switch (order.kind) {
        case ClipKind::kAviPlain:
        case ClipKind::kAviCodec:
            return MakeAviSink(order.file, facts, order.codec);
        case ClipKind::kPngSequence:
            return MakePngSink(order.file, facts);
        case ClipKind::kY4m:
            break;
    }
    return MakeY4mSink(order.file, facts);
}

ExportResult RunAll(Engine& engine, const ExportOrder& order, const std::atomic<bool>& isCancelled,
                    const std::function<void(std::int64_t)>& progress) {
    const ClipFacts& facts = engine.Facts();
    const std::unique_ptr<FrameSink> sink = SinkFor(order, facts);
    for (std::int64_t frame = 0; frame < facts.frames; ++frame) {
        if (isCancelled) return {ExportEnd::kCancelled, {}};
        const SharedPicture source = engine.Frame(frame);
        const double seconds = facts.rate.SecondsAt(frame);
        sink->Write(*engine.Render(order.effect, order.values, *source, seconds).picture);
        progress(frame + 1);
    }
    sink->Finish();
    return {};
}

}  // namespace

ExportResult RunExport(Engine& engine, const ExportOrder& order, const std::atomic<bool>& isCancelled,
                       const std::function<void(std::int64_t)>& progress) {
    try {
        return RunAll(engine, order, isCancelled, progress);
    } catch (const SourceError& error) {
        return {ExportEnd::kFailed, error.what()};
    } catch (const EngineError& error) {
        return {ExportEnd::kFailed, error.what()};
    } catch (const std::bad_alloc&) {
        return {ExportEnd::kFailed, text::kNoMemory};
    } catch (const std::exception&) {
        return {ExportEnd::kFailed, text::kCannotWrite};
    }
}

}  // namespace velmora::reelview
