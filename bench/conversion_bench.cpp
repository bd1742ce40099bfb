// What the ways to convert frames to BGRA and back lose against double precision, and what they cost. Prints Markdown
// tables; with --cases also one row for each kind of frame. Fails if reelfx's conversion loses more than the library's
// scaler with every accuracy flag does, for any kind of frame, on average or at worst.

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <random>
#include <stdexcept>

#include "bench/conversion.h"
#include "effects/render_session.h"

namespace velmora::bench {
namespace {

using hosts::BgraPicture;

constexpr int kAccurate =
    SWS_BICUBIC | SWS_FULL_CHR_H_INT | SWS_FULL_CHR_H_INP | SWS_ACCURATE_RND | SWS_BITEXACT;

struct FrameCase {
    const char* name;
    AVPixelFormat format;
    AVColorSpace space;
    AVColorRange range;
    AVChromaLocation chroma;
    YcbcrCoding coding;
};

std::vector<FrameCase> FrameCases() {
    struct Format {
        const char* name;
        AVPixelFormat format;
        int depth, heightShift;
    };
    struct Matrix {
        const char* name;
        AVColorSpace space;
        double red, blue;
    };
    std::vector<FrameCase> cases;
    for (const Format& format : {Format{"4:2:0, 8 bits", AV_PIX_FMT_YUV420P, 8, 1},
                                 {"4:2:2, 8 bits", AV_PIX_FMT_YUV422P, 8, 0},
                                 {"4:2:0, 10 bits", AV_PIX_FMT_YUV420P10, 10, 1},
                                 {"4:2:2, 10 bits", AV_PIX_FMT_YUV422P10, 10, 0}}) {
        for (const Matrix& matrix : {Matrix{"601", AVCOL_SPC_SMPTE170M, 0.299, 0.114},
                                     {"709", AVCOL_SPC_BT709, 0.2126, 0.0722},
                                     {"2020", AVCOL_SPC_BT2020_NCL, 0.2627, 0.0593}}) {
            for (const bool isFull : {false, true}) {
                for (const bool isCentre : {false, true}) {
                    static char names[64][64];
                    char* const name = names[cases.size()];
                    std::snprintf(name, sizeof names[0], "%s, %s, %s, %s", format.name, matrix.name,
                                  isFull ? "full" : "limited", isCentre ? "centre" : "left");
                    cases.push_back({name,
                                     format.format,
                                     matrix.space,
                                     isFull ? AVCOL_RANGE_JPEG : AVCOL_RANGE_MPEG,
                                     isCentre ? AVCHROMA_LOC_CENTER : AVCHROMA_LOC_LEFT,
                                     {format.depth, 1, format.heightShift, matrix.red, matrix.blue, isFull,
                                      isCentre ? 0.5 : 0.0, format.heightShift / 2.0}});
                }
            }
        }
    }
    return cases;
}

// Waves, edges and grain in colours that RGB has.
Planes TestPicture(int width, int height) {
    Planes rgb = {Plane(width, height), Plane(width, height), Plane(width, height)};
    std::mt19937 random(7);
    for (std::size_t c = 0; c < 3; ++c) {
        const double turn = static_cast<double>(c);
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) {
                const double wave = std::sin(x * 0.11 + turn) * std::cos(y * 0.07 - 2.0 * turn);
                const double edge = ((x / 23 + y / 17) % 3 == static_cast<int>(c)) ? 0.2 : -0.1;
                const double grain = static_cast<double>(random() % 1000) / 1000.0 - 0.5;
                rgb[c].At(x, y) = std::clamp(0.5 + 0.28 * wave + edge + 0.1 * grain, 0.0, 1.0);
            }
        }
    }
    return rgb;
}

hosts::FramePtr FrameOf(const FrameCase& kind, int width, int height) {
    hosts::FramePtr frame = hosts::NewFrame();
    frame->width = width;
    frame->height = height;
    frame->format = kind.format;
    frame->colorspace = kind.space;
    frame->color_range = kind.range;
    frame->chroma_location = kind.chroma;
    if (av_frame_get_buffer(frame.get(), 0) < 0) throw std::bad_alloc();
    return frame;
}

template <class Visit>
void EachCode(const FrameCase& kind, AVFrame& frame, Planes& planes, const Visit& visit) {
    for (std::size_t i = 0; i < 3; ++i) {
        for (int y = 0; y < planes[i].height; ++y) {
            std::uint8_t* const row = frame.data[i] + std::ptrdiff_t{y} * frame.linesize[i];
            for (int x = 0; x < planes[i].width; ++x) {
                if (kind.coding.depth == 8)
                    visit(row[x], planes[i].At(x, y));
                else
                    visit(reinterpret_cast<std::uint16_t*>(row)[x], planes[i].At(x, y));
            }
        }
    }
}

// The planes' codes, rounded, into the frame and back into the planes.
void Store(const FrameCase& kind, Planes& planes, AVFrame& frame) {
    const double highest = std::pow(2.0, kind.coding.depth) - 1.0;
    EachCode(kind, frame, planes, [&](auto& code, double& exact) {
        exact = std::clamp(std::floor(exact + 0.5), 0.0, highest);
        code = static_cast<std::remove_reference_t<decltype(code)>>(exact);
    });
}

class Error {
  public:
    void Add(double difference) {
        m_sum += std::abs(difference);
        m_worst = std::max(m_worst, std::abs(difference));
        ++m_count;
    }
    void Add(const Error& other) {
        m_sum += other.m_sum;
        m_count += other.m_count;
        m_worst = std::max(m_worst, other.m_worst);
    }
    [[nodiscard]] double Mean() const { return m_sum / static_cast<double>(m_count); }
    [[nodiscard]] double Worst() const { return m_worst; }

  private:
    double m_sum = 0.0, m_worst = 0.0;
    std::int64_t m_count = 0;
};

struct Errors {
    Error to, from, round;  // in 1/255; in code numbers
};

Errors Measure(const Candidate& candidate, const FrameCase& kind, const Planes& rgb) {
    const int width = rgb[0].width, height = rgb[0].height;
    Errors errors;
    Planes codes = ExactCodes(kind.coding, rgb);
    const hosts::FramePtr frame = FrameOf(kind, width, height);
    Store(kind, codes, *frame);
    BgraPicture picture(width, height);
    candidate.toBgra(*frame, picture);
    Planes exact = ExactRgb(kind.coding, codes);
    for (std::size_t c = 0; c < 3; ++c) {
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) {
                double& value = exact[c].At(x, y);
                value = std::clamp(value, 0.0, 1.0);
                errors.to.Add(picture.Row(y)[4 * x + 2 - static_cast<int>(c)] - value * 255.0);
            }
        }
    }
    const hosts::FramePtr back = FrameOf(kind, width, height);
    candidate.fromBgra(picture, *back);
    Planes there = ExactCodes(kind.coding, exact);
    EachCode(kind, *back, there, [&](auto code, double& value) { errors.round.Add(code - value); });

    // The same picture for every candidate.
    for (std::size_t c = 0; c < 3; ++c) {
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) {
                const double byte = std::floor(exact[c].At(x, y) * 255.0 + 0.5);
                picture.Row(y)[4 * x + 2 - static_cast<int>(c)] = static_cast<std::uint8_t>(byte);
                exact[c].At(x, y) = byte / 255.0;
            }
        }
    }
    candidate.fromBgra(picture, *back);
    Planes wanted = ExactCodes(kind.coding, exact);
    const double highest = std::pow(2.0, kind.coding.depth) - 1.0;
    EachCode(kind, *back, wanted,
             [&](auto code, double& value) { errors.from.Add(code - std::clamp(value, 0.0, highest)); });
    return errors;
}

// Processor time of the fastest run.
template <class Work>
double Milliseconds(const Work& work) {
    double best = 1e9;
    for (int i = 0; i < 12; ++i) {
        timespec start{}, end{};
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &start);
        work();
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &end);
        best = std::min(best, static_cast<double>(end.tv_sec - start.tv_sec) * 1e3 +
                                  static_cast<double>(end.tv_nsec - start.tv_nsec) * 1e-6);
    }
    return best;
}

struct Result {
    std::string name;
    std::vector<Errors> cases;
    Errors all;
    double to, from;
};

Result Examine(const Candidate& candidate, const std::vector<FrameCase>& kinds, const Planes& rgb) {
    Result result = {.name = candidate.name, .cases = {}, .all = {}, .to = 0.0, .from = 0.0};
    for (const FrameCase& kind : kinds) {
        const Errors errors = Measure(candidate, kind, rgb);
        result.all.to.Add(errors.to);
        result.all.from.Add(errors.from);
        result.all.round.Add(errors.round);
        result.cases.push_back(errors);
    }
    const FrameCase& common = kinds[4];
    const hosts::FramePtr frame = FrameOf(common, 1920, 1080);
    Planes codes = {Plane(1920, 1080), Plane(960, 540), Plane(960, 540)};
    std::mt19937 random(11);
    for (Plane& plane : codes) {
        for (double& sample : plane.samples) sample = 60.0 + static_cast<double>(random() % 100);
    }
    Store(common, codes, *frame);
    BgraPicture picture(1920, 1080);
    result.to = Milliseconds([&] { candidate.toBgra(*frame, picture); });
    result.from = Milliseconds([&] { candidate.fromBgra(picture, *frame); });
    return result;
}

void PrintErrors(const Errors& errors) {
    for (const Error* error : {&errors.to, &errors.from, &errors.round}) {
        std::printf(" %.4f | %.3f |", error->Mean(), error->Worst());
    }
}

bool IsNoWorse(const Error& own, const Error& other) {
    constexpr double kNoise = 1e-6;
    return own.Mean() <= other.Mean() + kNoise && own.Worst() <= other.Worst() + kNoise;
}

std::vector<Candidate> Candidates() {
    std::vector<Candidate> candidates = {ScalerCandidate("scaler, every accuracy flag", kAccurate),
                                         ScalerCandidate("scaler, bicubic", SWS_BICUBIC),
                                         ScalerCandidate("scaler, bilinear", SWS_BILINEAR)};
    for (Candidate& candidate : ZimgCandidates()) candidates.push_back(std::move(candidate));
    return candidates;
}

int Run(bool withCases) {
    const std::vector<FrameCase> kinds = FrameCases();
    const Planes rgb = TestPicture(322, 182);
    std::vector<Result> results;
    for (const Candidate& candidate : Candidates()) results.push_back(Examine(candidate, kinds, rgb));
    for (const char* level : {"plain", "avx2", "avx512"}) {
        setenv(kSimdVariable, level, 1);
        results.push_back(Examine(OwnCandidate(std::string("reelfx, ") + level), kinds, rgb));
    }
    std::printf(
        "| conversion | to BGRA, mean | at worst | from BGRA, mean | at worst | both ways, mean | at worst | "
        "to, ms | "
        "from, ms |\n|---|---|---|---|---|---|---|---|---|\n");
    for (const Result& result : results) {
        std::printf("| %s |", result.name.c_str());
        PrintErrors(result.all);
        std::printf(" %.2f | %.2f |\n", result.to, result.from);
    }
    // For a single kind of frame, chance decides how the bytes in between are rounded.
    bool isFine = IsNoWorse(results.back().all.round, results.front().all.round);
    for (std::size_t i = 0; i < kinds.size(); ++i) {
        const Errors &before = results.front().cases[i], &own = results.back().cases[i];
        const bool isNoWorse = IsNoWorse(own.to, before.to) && IsNoWorse(own.from, before.from);
        isFine = isFine && isNoWorse;
        if (!withCases && isNoWorse) continue;
        std::printf("\n%s%s\n| scaler |", kinds[i].name, isNoWorse ? "" : ": reelfx loses more");
        PrintErrors(before);
        std::printf("\n| reelfx |");
        PrintErrors(own);
    }
    std::printf("\n%s\n", isFine ? "For every kind of frame reelfx loses no more than the scaler." : "");
    return isFine ? 0 : 1;
}

}  // namespace
}  // namespace velmora::bench

int main(int count, char** arguments) {
    try {
        return velmora::bench::Run(count > 1 && std::strcmp(arguments[1], "--cases") == 0);
    } catch (const std::exception& error) {
        std::fprintf(stderr, "conversion_bench: %s\n", error.what());
        return 1;
    }
}
