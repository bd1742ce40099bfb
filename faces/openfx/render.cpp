#include <algorithm>
#include <cstring>
#include <limits>
#include <optional>
#include <string>

#include "faces/openfx/actions.h"
#include "faces/openfx/host_image.h"
#include "faces/openfx/pixel_rows.h"
#include "platform/float_guard.h"

namespace velmora::hosts::openfx {
namespace {

// Rows between two questions whether to go on.
constexpr int kRowsPerQuestion = 64;

// Ends a render that the host has given up. It counts as done.
void StopIfAborted(const Instance& instance) {
    if (instance.IsAborted()) throw ActionFailed{kOfxStatOK};
}

double TimeOf(const Properties& in) {
    const auto time = in.Double(kOfxPropTime);
    if (!time) throw ActionFailed{kOfxStatErrValue};
    return *time;
}

OfxRectI Intersection(const OfxRectI& a, const OfxRectI& b) {
    return {std::max(a.x1, b.x1), std::max(a.y1, b.y1), std::min(a.x2, b.x2), std::min(a.y2, b.y2)};
}

bool IsEmpty(const OfxRectI& r) {
    return r.x1 >= r.x2 || r.y1 >= r.y2;
}

// A buffer for rows of a picture, whole ones: from the top, without padding.
class Canvas {
  public:
    // The rows are those of `part`.
    Canvas(const Instance& instance, const OfxRectI& region, const OfxRectI& part, std::size_t pixelBytes)
        : m_region(region),
          m_top(part.y2),
          m_pixelBytes(pixelBytes),
          m_memory(instance.Host(), instance.Handle(),
                   RowBytes() * static_cast<std::size_t>(part.y2 - part.y1)) {}

    [[nodiscard]] int Width() const noexcept { return m_region.x2 - m_region.x1; }
    [[nodiscard]] int Height() const noexcept { return m_region.y2 - m_region.y1; }
    [[nodiscard]] std::size_t RowBytes() const noexcept {
        return static_cast<std::size_t>(Width()) * m_pixelBytes;
    }
    [[nodiscard]] std::byte* Pixel(int x, int y) const noexcept {
        return static_cast<std::byte*>(m_memory.Data()) +
               static_cast<std::size_t>(m_top - 1 - y) * RowBytes() +
               static_cast<std::size_t>(x - m_region.x1) * m_pixelBytes;
    }
    // Where the picture's first row is, or would be.
    [[nodiscard]] void* FirstRow() const noexcept {
        const auto above = static_cast<std::uintptr_t>(m_region.y2 - m_top) * RowBytes();
        return reinterpret_cast<void*>(reinterpret_cast<std::uintptr_t>(m_memory.Data()) - above);
    }

  private:
    const OfxRectI m_region;
    const int m_top;
    const std::size_t m_pixelBytes;
    const HostMemory m_memory;
};

class FrameRender {
  public:
    FrameRender(Instance& instance, OfxTime time, const OfxRectI& window, std::string_view field)
        : m_instance(instance),
          m_time(time),
          m_values(instance.ValuesAt(time)),
          m_source(instance.Host(), instance.Source(), time),
          m_output(instance.Host(), instance.Output(), time),
          m_region(m_source.Region()),
          m_window(Intersection(window, m_output.Bounds())),
          m_format(m_source.IsThere() ? m_source : m_output, m_values.space) {
        if (!m_output.IsThere()) throw ActionFailed{kOfxStatFailed};
        const bool isSame =
            m_source.Depth() == m_output.Depth() && m_source.Channels() == m_output.Channels();
        if ((m_source.IsThere() && !isSame) || m_output.Channels() < 3)
            throw ActionFailed{kOfxStatErrImageFormat};
        if (OfxImageClipHandle mask = instance.Mask()) m_mask.emplace(instance.Host(), mask, time);
        if (field == kOfxImageFieldLower) m_field = 0;
        if (field == kOfxImageFieldUpper) m_field = 1;
    }

    void Run() {
        if (IsEmpty(m_window)) return;
        if (IsEmpty(Inside())) return Clear(m_window);
        const auto session = m_instance.Session(m_values);
        if (!session->NeedsWholePicture()) {
            const Canvas part(m_instance, m_region, Inside(), m_format.WorkBytes());
            return Run(*session, Inside(), part, part);
        }
        const Canvas source(m_instance, m_region, m_region, m_format.WorkBytes());
        const Canvas result(m_instance, m_region, m_region, m_format.WorkBytes());
        Run(*session, m_region, source, result);
    }

  private:
    void Run(effects::EffectSession& session, const OfxRectI& needed, const Canvas& source,
             const Canvas& result) const {
        Load(needed, source);
        StopIfAborted(m_instance);
        Render(session, source, result);
        StopIfAborted(m_instance);
        Store(result);
    }

    // What the host does not give of the picture, and what is not needed of a row, is black.
    void Load(const OfxRectI& needed, const Canvas& source) const {
        const OfxRectI there = Intersection(needed, m_source.Bounds());
        const bool isWhole = there.x1 == m_region.x1 && there.x2 == m_region.x2;
        for (int y = needed.y1; y < needed.y2; ++y) {
            if (y % kRowsPerQuestion == 0) StopIfAborted(m_instance);
            const bool isThere = y >= there.y1 && y < there.y2 && there.x1 < there.x2;
            if (!isThere || !isWhole) std::memset(source.Pixel(m_region.x1, y), 0, source.RowBytes());
            if (!isThere) continue;
            LoadRow(m_format, m_source.Pixel(there.x1, y), source.Pixel(there.x1, y), there.x2 - there.x1);
        }
    }

    // The part of the picture that is written.
    [[nodiscard]] OfxRectI Inside() const {
        return Intersection(m_window, Intersection(m_region, m_source.Bounds()));
    }

    void Render(effects::EffectSession& session, const Canvas& source, const Canvas& result) const {
        const OfxRectI inside = Inside();
        const render::Rectangle window = {m_region.y2 - inside.y2, m_region.y2 - inside.y1,
                                          inside.x1 - m_region.x1, inside.x2 - m_region.x1};
        const double seconds = m_instance.ClipSeconds(m_time, m_values.startFrame);
        const auto step = static_cast<std::int32_t>(source.RowBytes());
        bool isRendered = false;
        if (m_format.work == WorkKind::kBytes) {
            const FrameRecord from = {source.FirstRow(), source.Width(), source.Height(), step, 0, 0, 0};
            const FrameRecord to = {result.FirstRow(), result.Width(), result.Height(), step, 0, 0, 0};
            isRendered = session.Render(from, to, seconds, {window.top, window.bottom});
        } else {
            const render::DeepFormat format = {m_format.work == WorkKind::kShorts
                                                   ? render::DeepSamples::kUnsigned16
                                                   : render::DeepSamples::kFloat,
                                               m_format.channels, m_format.isDividedByRenderer};
            isRendered = session.RenderDeep({source.Width(),
                                             source.Height(),
                                             format,
                                             {source.FirstRow(), step},
                                             {result.FirstRow(), step},
                                             window},
                                            seconds);
        }
        if (!isRendered) throw ActionFailed{kOfxStatFailed};
    }

    void Store(const Canvas& result) const {
        const OfxRectI inside = Inside();
        const int count = inside.x2 - inside.x1;
        const HostMemory shares(m_instance.Host(), m_instance.Handle(),
                                static_cast<std::size_t>(count) * sizeof(float));
        auto* const share = static_cast<float*>(shares.Data());
        for (int y = m_window.y1; y < m_window.y2; ++y) {
            if (y % kRowsPerQuestion == 0) StopIfAborted(m_instance);
            const bool isInside = y >= inside.y1 && y < inside.y2;
            if (!isInside || count < m_window.x2 - m_window.x1) Clear({m_window.x1, y, m_window.x2, y + 1});
            if (!isInside || !IsWritten(y)) continue;
            StoreRow(m_format, result.Pixel(inside.x1, y), m_source.Pixel(inside.x1, y),
                     FillShares(share, inside.x1, count, y) ? share : nullptr, m_output.Pixel(inside.x1, y),
                     count);
        }
    }

    [[nodiscard]] bool IsWritten(int y) const { return m_field < 0 || (y & 1) == m_field; }

    void Clear(const OfxRectI& part) const {
        const std::size_t bytes = static_cast<std::size_t>(part.x2 - part.x1) * m_format.HostBytes();
        for (int y = part.y1; y < part.y2; ++y) {
            if (IsWritten(y)) std::memset(m_output.Pixel(part.x1, y), 0, bytes);
        }
    }

    // The result's share of each pixel of a row; false when it is all of it.
    bool FillShares(float* share, int x, int count, int y) const {
        const auto mix = static_cast<float>(m_values.mix);
        if (!m_mask) {
            if (m_values.mix >= 1.0) return false;
            std::fill_n(share, count, mix);
            return true;
        }
        // Outside its bounds a mask hides the effect, and so does a mask without an image at this time.
        const OfxRectI& bounds = m_mask->Bounds();
        std::fill_n(share, count, 0.0f);
        const int from = std::max(x, bounds.x1), end = std::min(x + count, bounds.x2);
        if (y < bounds.y1 || y >= bounds.y2 || from >= end) return true;
        AlphaRow(*m_mask, m_mask->Pixel(from, y), mix, share + (from - x), end - from);
        return true;
    }

    Instance& m_instance;
    const OfxTime m_time;
    const FrameValues m_values;
    const HostImage m_source, m_output;
    std::optional<HostImage> m_mask;
    const OfxRectI m_region;  // the picture
    const OfxRectI m_window;  // the part that is written
    const PixelFormat m_format;
    int m_field = -1;  // 0: even rows, 1: odd rows
};

// The source's region; nothing when it has no image at that time.
std::optional<OfxRectD> SourceRegion(const Instance& instance, double time) {
    OfxRectD region;
    const OfxStatus status =
        instance.Host().effect->clipGetRegionOfDefinition(instance.Source(), time, &region);
    if (status == kOfxStatFailed) return std::nullopt;
    Require(status);
    return region;
}

}  // namespace

OfxStatus AnswerRegionOfDefinition(const Instance& instance, const Properties& in, const Properties& out) {
    // Else a mask would add its own.
    const auto region = SourceRegion(instance, TimeOf(in));
    if (!region) return kOfxStatReplyDefault;
    out.Set(kOfxImageEffectPropRegionOfDefinition, *region);
    return kOfxStatOK;
}

OfxStatus AnswerRegionsOfInterest(Instance& instance, const Properties& in, const Properties& out) {
    const double time = TimeOf(in);
    // A pixel of the other stages needs the same pixel of the source, which is the host's usual answer.
    if (!instance.Session(instance.ValuesAt(time))->NeedsWholePicture()) return kOfxStatReplyDefault;
    const auto region = SourceRegion(instance, time);
    if (!region) return kOfxStatReplyDefault;
    out.Set((std::string(kOfxImageClipPropRoI_) + kOfxImageEffectSimpleSourceClipName).c_str(), *region);
    return kOfxStatOK;
}

OfxStatus AnswerIsIdentity(Instance& instance, const Properties& in, const Properties& out) {
    const double time = TimeOf(in);
    const FrameValues values = instance.ValuesAt(time);
    if (values.mix > 0.0 && !instance.Session(values)->IsNeutral()) return kOfxStatReplyDefault;
    out.Set(kOfxPropName, kOfxImageEffectSimpleSourceClipName);
    out.Set(kOfxPropTime, time);
    return kOfxStatOK;
}

OfxStatus RenderFrame(Instance& instance, const Properties& in) {
    const FloatGuard guard;
    const double time = TimeOf(in);
    const auto window = in.Rectangle(kOfxImageEffectPropRenderWindow);
    if (!window) throw ActionFailed{kOfxStatErrValue};
    StopIfAborted(instance);
    FrameRender(instance, time, *window, in.Text(kOfxImageEffectPropFieldToRender)).Run();
    return kOfxStatOK;
}

}  // namespace velmora::hosts::openfx
