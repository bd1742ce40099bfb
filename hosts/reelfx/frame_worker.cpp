#include "hosts/reelfx/frame_worker.h"

#include <cstring>

#include "hosts/common/digest.h"
#include "hosts/reelfx/failure.h"
#include "hosts/reelfx/picture_turn.h"

namespace velmora::hosts {
namespace {

bool IsSame(const BgraPicture& a, const BgraPicture& b) {
    for (std::int32_t y = 0; y < a.Height(); ++y) {
        if (std::memcmp(a.Row(y), b.Row(y), static_cast<std::size_t>(a.Width()) * 4) != 0) return false;
    }
    return true;
}

}  // namespace

FrameWorker::FrameWorker(std::unique_ptr<effects::EffectSession> session, const MediaWriter* writer,
                         FrameSize size, int quarterTurns, bool withDigest)
    : m_session(std::move(session)),
      m_writer(writer),
      m_quarterTurns(quarterTurns),
      m_withDigest(withDigest),
      m_source(size.width, size.height) {}

void FrameWorker::Work(PipelineItem& item) {
    m_converter.ToBgra(*item.frame, m_source);
    const BgraPicture& result = Apply(item.seconds);
    if (m_withDigest) {
        item.digest = FrameDigest(result.Row(0), result.Width(), result.Height(), result.Stride());
    }
    if (!m_writer) return;
    // An untouched frame keeps its own samples, also those that 8-bit RGB cannot hold: more than 8 bits, and
    // black below black.
    if (&result != &m_source && m_writer->TakesAsItIs(*item.frame) && IsSame(m_source, result)) return;
    FramePtr frame = m_writer->NewResult(*item.frame);
    m_converter.FromBgra(result, *frame);
    item.frame = std::move(frame);
}

BgraPicture& FrameWorker::Apply(double seconds) {
    BgraPicture* input = &m_source;
    if (m_quarterTurns != 0) {
        TurnPicture(m_source, m_quarterTurns, m_upright);
        input = &m_upright;
    }
    if (m_result.Width() != input->Width() || m_result.Height() != input->Height()) {
        m_result.Resize(input->Width(), input->Height());
    }
    if (!m_session->Render(input->Record(), m_result.Record(), seconds)) {
        throw Failure(kExitInternal, "a frame cannot be rendered");
    }
    if (m_quarterTurns == 0) return m_result;
    TurnPicture(m_result, 4 - m_quarterTurns, m_source);
    return m_source;
}

}  // namespace velmora::hosts
