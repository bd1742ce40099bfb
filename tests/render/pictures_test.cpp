#include "render/pictures.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <numeric>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

namespace velmora::render {
namespace {

int At(const GreyPicture& picture, int x, int y) {
    return picture.pixels[y * picture.rowStep + x];
}

// A wear picture as deviations from its mean, wrapping vertically as its strips do in a frame.
class Texture {
  public:
    explicit Texture(const GreyPicture& picture) : m_width(picture.width), m_height(picture.height) {
        for (int y = 0; y < m_height; ++y) {
            for (int x = 0; x < m_width; ++x) m_values.push_back(At(picture, x, y) / 255.0);
        }
        m_mean = std::accumulate(m_values.begin(), m_values.end(), 0.0) / Count();
        for (double& value : m_values) value -= m_mean;
        m_deviation = std::sqrt(MeanOf([](double v) { return v * v; }));
    }

    int Width() const { return m_width; }
    int Height() const { return m_height; }
    double Mean() const { return m_mean; }
    double Deviation() const { return m_deviation; }
    double Moment(int power) const {
        return MeanOf([&](double v) { return std::pow(v / m_deviation, power); });
    }
    double ShareAbove(double level) const {
        return MeanOf([&](double v) { return v + m_mean > level ? 1.0 : 0.0; });
    }
    double ValueAt(int x, int y) const { return m_values[IndexOf(x, (y + m_height) % m_height)]; }
    void Add(int x, int y, double amount) { m_values[IndexOf(x, y % m_height)] += amount; }

    // The correlation of pixels (dx, dy) apart; dx stays inside a strip.
    double Correlation(int dx, int dy) const {
        double sum = 0;
        const int first = std::max(0, -dx), last = std::min(m_width, m_width - dx);
        for (int y = 0; y < m_height; ++y) {
            for (int x = first; x < last; ++x) sum += ValueAt(x, y) * ValueAt(x + dx, y + dy);
        }
        return sum / (m_height * (last - first)) / (m_deviation * m_deviation);
    }
    // Beyond 4 pixels grain is independent; a lattice or an edge repeats.
    double GreatestFarCorrelation() const {
        double greatest = 0;
        for (int dy = 0; dy <= std::min(60, m_height / 2); ++dy) {
            for (int dx = -m_width / 2; dx <= m_width / 2; ++dx) {
                if (dx * dx + dy * dy > 16) greatest = std::max(greatest, std::abs(Correlation(dx, dy)));
            }
        }
        return greatest;
    }
    // How far the brightest or darkest square of `size` pixels is from the mean of all such squares, in standard
    // deviations.
    double GreatestFigure(int size) const {
        std::vector<double> means;
        for (int y = 0; y < m_height; ++y) {
            for (int x = 0; x + size <= m_width; ++x) {
                double sum = 0;
                for (int i = 0; i < size * size; ++i) sum += ValueAt(x + i % size, y + i / size);
                means.push_back(sum);
            }
        }
        double squares = 0, most = 0;
        for (double mean : means) {
            squares += mean * mean;
            most = std::max(most, std::abs(mean));
        }
        return most / std::sqrt(squares / static_cast<double>(means.size()));
    }
    // The contrast between neighbouring columns where two strips with independent start rows meet, as a multiple of the
    // contrast inside a strip.
    double SeamContrast() const {
        double inside = 0, seam = 0;
        for (int y = 0; y < m_height; ++y) {
            for (int x = 1; x < m_width; ++x) inside += std::abs(ValueAt(x, y) - ValueAt(x - 1, y));
            for (int other = 0; other < m_height; other += 7) {
                seam += std::abs(ValueAt(m_width - 1, y) - ValueAt(0, other));
            }
        }
        return seam / ((m_height + 6) / 7) / (inside / (m_width - 1));
    }
    double RowContrast(int y) const {
        double sum = 0;
        for (int x = 0; x < m_width; ++x) sum += std::abs(ValueAt(x, y) - ValueAt(x, y - 1));
        return sum;
    }
    // The contrast between the first and last row, in standard deviations of the contrasts between rows inside.
    double WrapContrast() const {
        double sum = 0, squares = 0;
        for (int y = 1; y < m_height; ++y) {
            sum += RowContrast(y);
            squares += RowContrast(y) * RowContrast(y);
        }
        const double mean = sum / (m_height - 1);
        return (RowContrast(0) - mean) / std::sqrt(squares / (m_height - 1) - mean * mean);
    }

  private:
    std::size_t IndexOf(int x, int y) const {
        return static_cast<std::size_t>(y) * static_cast<std::size_t>(m_width) + static_cast<std::size_t>(x);
    }
    double Count() const { return static_cast<double>(m_values.size()); }
    template <typename Function>
    double MeanOf(Function&& function) const {
        double sum = 0;
        for (double value : m_values) sum += function(value);
        return sum / Count();
    }

    int m_width, m_height;
    std::vector<double> m_values;
    double m_mean = 0, m_deviation = 0;
};

struct WearCase {
    const char* name;
    int menuValue, width, height;
    // The grain's strength, and its size as the correlation of neighbours.
    double leastMean, mostMean, leastDeviation, mostDeviation, leastClump, mostClump;
};

// Means are low, about 1.7 standard deviations above 0: higher means would fog deep black, lower ones would clip the
// grain.
constexpr WearCase kWearCases[] = {
    {"Wavy", 2000, 50, 300, .12, .16, .07, .10, .35, .49},
    {"Blotchy", 2001, 50, 300, .18, .22, .10, .13, .46, .62},   // clumps
    {"Grainy", 2002, 50, 300, .19, .24, .12, .15, .25, .39},    // the strongest
    {"Fine", 2003, 50, 300, .12, .16, .07, .10, .02, .16},      // the finest
    {"Splotchy", 2004, 25, 150, .15, .19, .08, .11, .49, .63},  // on a mottle
    {"Lite", 2005, 64, 64, .05, .09, .03, .055, .20, .34},      // the weakest
    {"Crackly", 2006, 64, 64, .14, .19, .085, .115, .13, .27},
};
static_assert(std::size(kWearCases) == kWearPictureCount);

// Lists the features that make a texture's repetition visible when a frame shows it a hundred times; empty if none.
//
// Grain of a few hundred to a few thousand independent clumps shows correlations and squares of up to 4.5 standard
// deviations by chance. For clumps of this size a correlation's standard deviation is about 2.2 / sqrt(pixels).
std::string Flaw(const Texture& texture) {
    const double chance = 2.2 / std::sqrt(texture.Width() * texture.Height());
    std::ostringstream flaw;
    const auto expect = [&](const char* what, double value, double least, double most) {
        if (!(value >= least && value <= most)) {
            flaw << what << ' ' << value << ", not " << least << " to " << most << "; ";
        }
    };
    expect("skewness", texture.Moment(3), -0.1, 0.9);  // almost Gaussian, the upper tail light
    expect("kurtosis", texture.Moment(4), 2.3, 4.2);
    expect("share above half", texture.ShareAbove(0.5), 0, 0.04);  // nothing is worn through
    expect("far correlation", texture.GreatestFarCorrelation(), 0, 4.5 * chance);
    for (int size : {3, 7}) expect("figure", texture.GreatestFigure(size), 0, 4.6);
    // Across a seam of independent grain the contrast is sqrt(1 / (1 - correlation of neighbours)) times as high; up to
    // 1.5 times is not visible.
    expect("seam of strips", texture.SeamContrast(), 0.7, 1.55);
    expect("seam of rows", texture.WrapContrast(), -3, 3);
    return flaw.str();
}

TEST(WearPictures, AreGrainOfTheirCharacter) {
    for (const WearCase& wanted : kWearCases) {
        SCOPED_TRACE(wanted.name);
        const GreyPicture& picture = WearPicture(wanted.menuValue);
        ASSERT_EQ(picture.width, wanted.width);
        ASSERT_EQ(picture.height, wanted.height);
        ASSERT_EQ(picture.rowStep, wanted.width);
        const Texture texture(picture);
        const double clump = (texture.Correlation(1, 0) + texture.Correlation(0, 1)) / 2;
        EXPECT_TRUE(texture.Mean() >= wanted.leastMean && texture.Mean() <= wanted.mostMean)
            << texture.Mean();
        EXPECT_TRUE(texture.Deviation() >= wanted.leastDeviation &&
                    texture.Deviation() <= wanted.mostDeviation)
            << texture.Deviation();
        EXPECT_TRUE(clump >= wanted.leastClump && clump <= wanted.mostClump) << clump;
        EXPECT_EQ(Flaw(texture), "");
    }
}

// Faults that an artist could introduce into any of the pictures.
TEST(WearPictures, AreRefusedWithAFigureAnEdgeOrALattice) {
    for (const WearCase& drawn : kWearCases) {
        SCOPED_TRACE(drawn.name);
        const Texture good(WearPicture(drawn.menuValue));
        const double d = good.Deviation();
        Texture stain = good, edge = good, lattice = good;
        for (int i = 0; i < 49; ++i) stain.Add(9 + i % 7, 40 + i / 7, 3 * d);
        for (int y = 0; y < good.Height() / 2; ++y) {
            for (int x = 0; x < good.Width(); ++x) edge.Add(x, y, d);
        }
        for (int y = 0; y < good.Height(); ++y) {
            for (int x = 0; x < good.Width(); ++x) lattice.Add(x, y, x % 8 == 0 || y % 8 == 0 ? d : 0);
        }
        EXPECT_NE(Flaw(stain), "");
        EXPECT_NE(Flaw(edge), "");
        EXPECT_NE(Flaw(lattice), "");
    }
}

TEST(WearPictures, UnknownValueGivesTheFirst) {
    for (int value : {0, -1, 1999, 2000 + kWearPictureCount, 2099}) {
        EXPECT_EQ(&WearPicture(value), &WearPicture(2000)) << value;
    }
}

struct SpotCase {
    int width;
    int height;
    int key;
};

constexpr SpotCase kSpotCases[kSpotCount] = {
    {9, 13, 93},  {9, 18, 93}, {11, 13, 102}, {9, 11, 94}, {8, 7, 103},   {5, 10, 110},
    {13, 14, 95}, {6, 9, 90},  {8, 12, 111},  {7, 8, 110}, {13, 11, 118},
};

TEST(SpotPictures, LieOnTheirKeyWithoutARectangle) {
    for (int index = 0; index < kSpotCount; ++index) {
        SCOPED_TRACE(index);
        const SpotCase& wanted = kSpotCases[index];
        const GreyPicture& spot = SpotPicture(index);
        ASSERT_EQ(spot.width, wanted.width);
        ASSERT_EQ(spot.height, wanted.height);
        ASSERT_EQ(spot.rowStep, wanted.width);
        ASSERT_EQ(spot.pixels[0], wanted.key);
        for (int y = 0; y < spot.height; ++y) {
            for (int x = 0; x < spot.width; ++x) {
                const bool onBorder = x == 0 || y == 0 || x == spot.width - 1 || y == spot.height - 1;
                if (onBorder) {
                    EXPECT_EQ(At(spot, x, y), wanted.key) << x << ", " << y;
                }
            }
        }
    }
}

// Mostly specks of a few pixels with very different contrasts: a set of equal marks would be recognised at once.
TEST(SpotPictures, AreMostlySmallAndOfUnequalContrast) {
    int dark = 0, bright = 0, small = 0, faint = 0, strong = 0;
    for (int index = 0; index < kSpotCount; ++index) {
        const GreyPicture& spot = SpotPicture(index);
        const int key = spot.pixels[0];
        double most = 0, direction = 0;
        int covered = 0;
        for (int i = 0; i < spot.width * spot.height; ++i) {
            const int difference = spot.pixels[i] - key;
            const double contrast = difference / double(difference < 0 ? key : 255 - key);
            covered += std::abs(contrast) > 0.15;
            most = std::max(most, std::abs(contrast));
            direction += contrast;
        }
        SCOPED_TRACE(index);
        EXPECT_GE(covered, 1);
        EXPECT_GE(most, 0.25) << "hardly seen";
        small += covered <= 16;
        faint += most < 0.55;
        strong += most > 0.75;
        (direction < 0 ? dark : bright) += 1;
    }
    EXPECT_GE(small, 7);
    EXPECT_GE(faint, 2);
    EXPECT_GE(strong, 3);
    EXPECT_GT(dark, 2 * bright);  // dirt on the print is dark, dust that lay on the negative bright
    EXPECT_GE(bright, 2);
}

}  // namespace
}  // namespace velmora::render
