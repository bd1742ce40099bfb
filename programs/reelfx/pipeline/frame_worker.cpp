#include "programs/reelfx/pipeline/frame_worker.h"

#include <cstring>
#include <utility>

#include "programs/reelfx/pictures/pictures.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {
namespace {

bool IsSame(const BgraPicture& a, const BgraPicture& b) {
    for (std::int32_t y = 0; y < a.Height(); ++y) {
        if (std::memcmp(a.Row(y), b.Row(y), a.RowBytes()) != 0) return false;
    }
    return true;
}

}  // namespace

FrameWorker::FrameWorker(EffectListSession session, const Job& job)
    : m_effects(std::move(session)), m_job(job) {
    if (!job.digests) m_source = BgraPicture(job.size.width, job.size.height, job.samples);
    if (job.isMatte) m_effects.KeepDamageOnly();
}

void FrameWorker::Work(PipelineItem& item) {
    if (m_job.digests) {
        m_source = m_job.digests->Take(m_job.size.width, m_job.size.height, m_job.samples);
        m_result = m_job.digests->Take(m_job.size.width, m_job.size.height, m_job.samples);
    }
    BgraPicture& result = Result(item);
    if (m_job.writer) Replace(item, result);
    if (!m_job.digests) return;
    // Pictures in line for their digests and those of workers at rest would otherwise add up.
    BgraPicture& stored = AsStored(result);
    item.picture = std::exchange(stored, BgraPicture());
    m_job.digests->GiveBack(&stored == &m_source ? m_result : m_source);
}

void FrameWorker::Replace(PipelineItem& item, const BgraPicture& result) {
    // An unchanged frame keeps its own samples, including those that the picture cannot hold.
    if (!m_job.isMatte && &result != &m_source && m_job.writer->TakesAsItIs(*item.frame) &&
        IsSame(m_source, result)) {
        return;
    }
    FramePtr frame = m_job.writer->NewResult(*item.frame);
    m_converter.FromPicture(result.View(), *frame);
    item.frame = std::move(frame);
}

BgraPicture& FrameWorker::Result(PipelineItem& item) {
    if (!m_job.isMatte) m_converter.ToPicture(*item.frame, m_source.View());
    if (!m_job.writer) item.frame.reset();  // the decoder can use its memory again
    if (!m_job.isMatte) return Apply(item);
    FillMatteGround(m_source);
    BgraPicture& result = Apply(item);
    ReadMatte(result);
    return result;
}

BgraPicture& FrameWorker::Apply(const PipelineItem& item) {
    BgraPicture* input = &m_source;
    if (!m_job.turn.IsNone()) {
        TurnPicture(m_source, m_job.turn, m_upright);
        input = &m_upright;
    }
    m_effects.Render(*input, m_result, {.frame = item.index, .seconds = item.seconds});
    if (m_job.turn.IsNone() || StaysUpright()) return m_result;
    TurnPicture(m_result, m_job.turn.Back(), m_source);
    return m_source;
}

bool FrameWorker::StaysUpright() const {
    return !m_job.turn.IsNone() && m_job.writer && m_job.writer->IsUpright();
}

BgraPicture& FrameWorker::AsStored(BgraPicture& result) {
    if (!StaysUpright()) return result;
    TurnPicture(result, m_job.turn.Back(), m_source);
    return m_source;
}

}  // namespace velmora::hosts
