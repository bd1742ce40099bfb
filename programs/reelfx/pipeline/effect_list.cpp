#include "programs/reelfx/pipeline/effect_list.h"

#include <cmath>
#include <cstdint>
#include <type_traits>
#include <utility>

#include "text/number_text.h"
#include "programs/reelfx/common/failure.h"

namespace velmora::hosts {
namespace {

constexpr std::uint32_t kWhole = 1u << 16;

// Each sample becomes (1 - share) * under + share * picture.
template <typename Sample>
void MixRow(const std::uint8_t* under, std::uint8_t* picture, std::size_t bytes, double share) {
    const auto* below = reinterpret_cast<const Sample*>(under);
    auto* row = reinterpret_cast<Sample*>(picture);
    const double half = std::is_integral_v<Sample> ? 0.5 : 0.0;
    for (std::size_t i = 0; i < bytes / sizeof(Sample); ++i)
        row[i] =
            static_cast<Sample>(below[i] + (double{static_cast<float>(row[i])} - below[i]) * share + half);
}

// Bytes are rounded; whole shares are exact.
void Mix(const BgraPicture& under, BgraPicture& picture, double share) {
    const auto over = static_cast<std::uint32_t>(std::lround(share * kWhole));
    for (std::int32_t y = 0; y < picture.Height(); ++y) {
        if (picture.Samples() != SampleType::kBytes) {
            const auto mix = picture.Samples() == SampleType::kWords ? MixRow<std::uint16_t> : MixRow<float>;
            mix(under.Row(y), picture.Row(y), picture.RowBytes(), share);
            continue;
        }
        const std::uint8_t* below = under.Row(y);
        std::uint8_t* row = picture.Row(y);
        for (std::int32_t i = 0; i < picture.Width() * 4; ++i) {
            row[i] =
                static_cast<std::uint8_t>((below[i] * (kWhole - over) + row[i] * over + kWhole / 2) >> 16);
        }
    }
}

bool RenderOne(effects::EffectSession& session, BgraPicture& from, BgraPicture& to, double seconds) {
    if (from.Samples() == SampleType::kBytes) return session.Render(from.Record(), to.Record(), seconds);
    const bool isFloat = from.Samples() == SampleType::kFloats;
    const render::DeepFormat format = {
        isFloat ? render::DeepSamples::kFloat : render::DeepSamples::kUnsigned16, 4, false};
    const auto frame = render::DeepFrame::Whole(from.Width(), from.Height(), format, from.Deep(), to.Deep());
    return session.RenderDeep(frame, seconds);
}

}  // namespace

EffectList::EffectList(const std::vector<EffectOptions>& options)
    : m_choices(options.begin(), options.end()) {
    if (m_choices.size() > 1 && IsSequence()) {
        throw UsageError("--random-state is for one effect, not for a list with --then");
    }
}

std::string EffectList::Title() const {
    std::string title;
    for (const EffectChoice& choice : m_choices) title += (title.empty() ? "" : " + ") + choice.Title();
    return title;
}

EffectListSession EffectList::NewSession() const {
    return EffectListSession(m_choices);
}

EffectListSession::EffectListSession(const std::vector<EffectChoice>& choices) {
    for (const EffectChoice& choice : choices) m_links.push_back({&choice, choice.NewSession()});
}

void EffectListSession::KeepDamageOnly() {
    for (Link& link : m_links) link.session->KeepDamageOnly();
}

void EffectListSession::Render(BgraPicture& source, BgraPicture& result, const ClipPlace& place) {
    if (result.Width() != source.Width() || result.Height() != source.Height() ||
        result.Samples() != source.Samples()) {
        result.ResizeLike(source, source.Width(), source.Height());
    }
    BgraPicture* from = &source;
    for (Link& link : m_links) {
        if (from == &result) {
            std::swap(result, m_before);
            result.ResizeLike(source, source.Width(), source.Height());
            from = &m_before;
        }
        link.choice->MoveTo(place, *link.session);
        if (!RenderOne(*link.session, *from, result, place.seconds)) {
            throw Failure(kExitInternal, "a frame cannot be rendered");
        }
        if (const double share = link.choice->MixAt(place); share < 1.0) Mix(*from, result, share);
        from = &result;
    }
}

}  // namespace velmora::hosts
