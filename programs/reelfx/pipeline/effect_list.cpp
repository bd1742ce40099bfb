#include "programs/reelfx/pipeline/effect_list.h"

#include <cmath>
#include <cstdint>
#include <utility>

#include "programs/common/usage_error.h"
#include "programs/reelfx/common/failure.h"

namespace velmora::hosts {
namespace {

constexpr std::uint32_t kWhole = 1u << 16;

// Each byte of `picture` becomes (1 - share) * under + share * picture, rounded; whole shares are exact.
void Mix(const BgraPicture& under, BgraPicture& picture, double share) {
    const auto over = static_cast<std::uint32_t>(std::lround(share * kWhole));
    for (std::int32_t y = 0; y < picture.Height(); ++y) {
        const std::uint8_t* below = under.Row(y);
        std::uint8_t* row = picture.Row(y);
        for (std::int32_t i = 0; i < picture.Width() * 4; ++i) {
            row[i] =
                static_cast<std::uint8_t>((below[i] * (kWhole - over) + row[i] * over + kWhole / 2) >> 16);
        }
    }
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
    if (result.Width() != source.Width() || result.Height() != source.Height()) {
        result.Resize(source.Width(), source.Height());
    }
    BgraPicture* from = &source;
    for (Link& link : m_links) {
        if (from == &result) {
            std::swap(result, m_before);
            result.Resize(source.Width(), source.Height());
            from = &m_before;
        }
        link.choice->MoveTo(place, *link.session);
        if (!link.session->Render(from->Record(), result.Record(), place.seconds)) {
            throw Failure(kExitInternal, "a frame cannot be rendered");
        }
        if (const double share = link.choice->MixAt(place); share < 1.0) Mix(*from, result, share);
        from = &result;
    }
}

}  // namespace velmora::hosts
