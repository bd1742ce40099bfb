// The effects that every frame goes through, in order: each with its settings, its fades and its share of the mix. A
// frame's result depends only on the frame, its place in the clip and the seeds.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "effects/effect_session.h"
#include "programs/reelfx/common/effect_choice.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

class EffectListSession;

class EffectList {
  public:
    // At least one effect. Throws as EffectChoice does, and UsageError for a continuous random sequence in a list of
    // several effects.
    explicit EffectList(const std::vector<EffectOptions>& options);
    explicit EffectList(const EffectChoice& choice) : m_choices{choice} {}

    [[nodiscard]] const std::vector<EffectChoice>& Choices() const { return m_choices; }
    // Frames must come in order and to one session only.
    [[nodiscard]] bool IsSequence() const { return m_choices.front().IsSequence(); }
    // "Film Look: Sepia + Film Damage".
    [[nodiscard]] std::string Title() const;

    // Each thread needs its own. The list must outlive it.
    [[nodiscard]] EffectListSession NewSession() const;

  private:
    std::vector<EffectChoice> m_choices;
};

class EffectListSession {
  public:
    explicit EffectListSession(const std::vector<EffectChoice>& choices);

    // From now on only the damage of the effects is drawn, unmoved and with its own colours.
    void KeepDamageOnly();

    // Applies the list to `source`; `result` gets its size. They are different pictures. Throws Failure
    // (kExitInternal).
    void Render(BgraPicture& source, BgraPicture& result, const ClipPlace& place);

  private:
    struct Link {
        const EffectChoice* choice;
        std::unique_ptr<effects::EffectSession> session;
    };

    std::vector<Link> m_links;
    BgraPicture m_before;  // what a later effect of the list starts from, if it needs it unchanged
};

}  // namespace velmora::hosts
