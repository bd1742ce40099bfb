#include "programs/reelview/panel/knob.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace velmora::reelview {
namespace {

struct Point {
    double x, y;
};

// Clockwise from straight up, like KnobAngle.
Point OnCircle(double degrees, double radius) {
    const double radians = degrees * std::numbers::pi / 180.0;
    return {std::sin(radians) * radius, -std::cos(radians) * radius};
}

// The coverage of a pixel by a shape whose edge is `distance` away, positive outside.
double Coverage(double distance) {
    return std::clamp(0.5 - distance, 0.0, 1.0);
}

double DistanceToSegment(Point p, Point a, Point b) {
    const Point line{b.x - a.x, b.y - a.y};
    const double length = line.x * line.x + line.y * line.y;
    const double along =
        length > 0.0 ? std::clamp(((p.x - a.x) * line.x + (p.y - a.y) * line.y) / length, 0.0, 1.0) : 0.0;
    return std::hypot(p.x - a.x - along * line.x, p.y - a.y - along * line.y);
}

// Distance from the centre line of an arc with round ends.
double DistanceToArc(Point p, double radius, double from, double to) {
    const double degrees = std::atan2(p.x, -p.y) * 180.0 / std::numbers::pi;
    if (degrees >= from && degrees <= to) return std::abs(std::hypot(p.x, p.y) - radius);
    const Point start = OnCircle(from, radius), end = OnCircle(to, radius);
    return std::min(std::hypot(p.x - start.x, p.y - start.y), std::hypot(p.x - end.x, p.y - end.y));
}

struct Colour {
    double red, green, blue;

    explicit Colour(std::uint32_t word)
        : red((word >> 16) & 0xFF), green((word >> 8) & 0xFF), blue(word & 0xFF) {}
    void Blend(std::uint32_t word, double share) {
        const Colour over(word);
        red += (over.red - red) * share;
        green += (over.green - green) * share;
        blue += (over.blue - blue) * share;
    }
};

class KnobPainter {
  public:
    KnobPainter(std::int32_t side, const KnobLook& look, const KnobColours& colours)
        : m_look(look), m_colours(colours), m_outer(side / 2.0 - 1.5), m_width(std::max(side * 0.06, 2.0)) {
        m_angle = KnobAngle(look.value);
        m_arcStart = std::min(m_angle, KnobAngle(look.origin));
        m_arcEnd = std::max(m_angle, KnobAngle(look.origin));
        m_track = m_outer - m_width / 2.0 - 1.5;
        m_body = m_track - m_width * 1.35;
        m_pointerStart = OnCircle(m_angle, m_body * 0.35);
        m_pointerEnd = OnCircle(m_angle, m_body * 0.8);
    }

    [[nodiscard]] Colour At(Point p) const {
        Colour colour(m_colours.background);
        const double radius = std::hypot(p.x, p.y);
        const double strength = m_look.isEnabled ? 1.0 : 0.4;
        const double half = m_width / 2.0;
        colour.Blend(m_colours.track, strength * Coverage(DistanceToArc(p, m_track, -135.0, 135.0) - half));
        if (m_arcEnd - m_arcStart > 0.5) {
            colour.Blend(m_colours.value,
                         strength * Coverage(DistanceToArc(p, m_track, m_arcStart, m_arcEnd) - half));
        }
        colour.Blend(m_colours.rim, strength * Coverage(radius - m_body));
        colour.Blend(m_colours.body, strength * Coverage(radius - m_body + std::max(m_width * 0.3, 1.0)));
        const double pointer =
            DistanceToSegment(p, m_pointerStart, m_pointerEnd) - std::max(m_width * 0.42, 1.2);
        colour.Blend(m_colours.pointer, strength * Coverage(pointer));
        if (m_look.hasFocus) {
            const double ring = std::abs(radius - m_body - m_width * 0.1) - std::max(m_width * 0.3, 1.0);
            colour.Blend(m_colours.focus, Coverage(ring));
        }
        return colour;
    }

  private:
    const KnobLook& m_look;
    const KnobColours& m_colours;
    double m_outer, m_width, m_track = 0.0, m_body = 0.0, m_angle = 0.0, m_arcStart = 0.0, m_arcEnd = 0.0;
    Point m_pointerStart{}, m_pointerEnd{};
};

std::uint8_t Byte(double channel) {
    return static_cast<std::uint8_t>(std::clamp(channel + 0.5, 0.0, 255.0));
}

}  // namespace

Picture DrawKnob(std::int32_t side, const KnobLook& look, const KnobColours& colours) {
    Picture picture;
    picture.size = {side, side};
    picture.pixels.resize(Picture::BytesOf(picture.size));
    const KnobPainter painter(side, look, colours);
    std::uint8_t* out = picture.pixels.data();
    for (std::int32_t y = 0; y < side; ++y) {
        for (std::int32_t x = 0; x < side; ++x, out += 4) {
            const Colour colour = painter.At({x + 0.5 - side / 2.0, y + 0.5 - side / 2.0});
            out[0] = Byte(colour.blue);
            out[1] = Byte(colour.green);
            out[2] = Byte(colour.red);
            out[3] = 255;
        }
    }
    return picture;
}

}  // namespace velmora::reelview
