// A program in OBS' place: libobs with a small canvas, the module under test, and two sources that show a known picture.
#pragma once

#include <obs.h>

#include <atomic>
#include <cstdint>
#include <string>
#include <vector>

namespace velmora::test {

struct Picture {
    std::uint32_t width = 0, height = 0;
    std::vector<std::uint32_t> pixels;  // blue, green, red, alpha

    bool operator==(const Picture&) const = default;
};

inline constexpr std::uint32_t kCanvasWidth = 160, kCanvasHeight = 96, kCanvasRate = 30;

// What the source "test_film" shows. It plays a film: its position is what a test sets.
struct Film {
    std::atomic<std::uint32_t> width = kCanvasWidth, height = kCanvasHeight;
    std::atomic<std::uint32_t> alpha = 0xFF;
    std::atomic<std::int64_t> position = 0;  // ms
};
Film& TheFilm();
[[nodiscard]] Picture FilmPicture();

// Starts and ends libobs; called once each.
void StartObs();
void EndObs();

// The canvas after `frames` more frames.
[[nodiscard]] Picture CanvasAfter(int frames);
// Consecutive canvases.
[[nodiscard]] std::vector<Picture> Canvases(int count);
// How often C++ code has allocated on the graphics thread so far.
[[nodiscard]] long GraphicsAllocations();

// Hands the source "test_camera" a frame of the film's picture in one of OBS' formats, made by simple arithmetic.
void OutputFrame(obs_source_t* camera, video_format format);

// Releases what it owns. Sources are also removed from the canvas by their users.
template <class Object, void (*kRelease)(Object*)>
struct ObsDeleter {
    void operator()(Object* object) const noexcept { kRelease(object); }
};

}  // namespace velmora::test
