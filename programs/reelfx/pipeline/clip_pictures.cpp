#include "programs/reelfx/pipeline/clip_pictures.h"

#include <algorithm>
#include <utility>

#include "text/number_text.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/media/pixel_converter.h"

namespace velmora::hosts {
namespace {

// Commands that write stills write only at the very end.
void FailIfInterrupted() {
    if (Interrupts() > 0) throw Failure(kExitInterrupted, "interrupted; nothing was written");
}

SectionOptions SectionOf(const InputOptions& input, const FramePlace& place, std::int64_t count) {
    SectionOptions section;
    section.firstFrame = place.frame.value_or(0);
    section.start = place.start;
    if (place.frame || place.start || !CanBeReadTwice(input.path)) return section;
    section.frameTimes = MediaReader::TimesOf(input);
    const auto frames = static_cast<std::int64_t>(section.frameTimes.pts.size());
    section.firstFrame = std::max<std::int64_t>(0, (frames - count) / 2);
    return section;
}

}  // namespace

ClipPictures::ClipPictures(const InputOptions& input, const FramePlace& place, std::int64_t count)
    : m_place(SectionOf(input, place, count)), m_reader(input), m_section(m_reader, Resolved(input)) {}

const SectionOptions& ClipPictures::Resolved(const InputOptions& input) {
    ResolveStart(input, m_reader, m_place);
    return m_place;
}

std::optional<ClipPicture> ClipPictures::Next() {
    PipelineItemPtr item;
    do {
        item = m_section.Next();
        FailIfInterrupted();
    } while (item && !item->frame);
    if (!item && !m_hasBegun) FailWithoutFrame();
    if (!item) return std::nullopt;
    m_hasBegun = true;
    if (m_reader.IsCutOff(*item->frame)) throw Failure(kExitInput, m_reader.Name() + ": ends inside a frame");
    const AVFrame& first = m_reader.FirstFrame();
    BgraPicture lying(first.width, first.height);
    PixelConverter().ToBgra(*item->frame, lying);
    ClipPicture result = {.picture = {}, .seconds = item->seconds, .index = item->index};
    TurnPicture(lying, m_reader.Turn(), result.picture);
    return result;
}

void ClipPictures::FailWithoutFrame() const {
    std::string what = m_reader.BreakOff();
    if (what.empty() && m_place.start) what = "has no frame at " + NumberText(*m_place.start) + " s or later";
    if (what.empty()) {
        what = "has no frame " + std::to_string(m_place.firstFrame) + "; it has " +
               std::to_string(m_section.FramesCounted());
    }
    throw Failure(kExitInput, m_reader.Name() + ": " + what);
}

BgraPicture Rendered(EffectListSession& effects, ClipPicture& source) {
    FailIfInterrupted();
    BgraPicture result;
    effects.Render(source.picture, result, {.frame = source.index, .seconds = source.seconds});
    return result;
}

}  // namespace velmora::hosts
