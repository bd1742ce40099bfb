#include "tests/faces/obs/obs_host.h"

#include <condition_variable>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <new>
#include <stdexcept>

namespace {

std::atomic<long> graphicsAllocations = 0;
thread_local bool isGraphicsThread = false;

}  // namespace

#ifndef VELMORA_SANITIZE
// Those of the module are bound to these too.
void* operator new(std::size_t size) {
    if (isGraphicsThread) ++graphicsAllocations;
    if (void* memory = std::malloc(size == 0 ? 1 : size)) return memory;
    throw std::bad_alloc();
}
void operator delete(void* memory) noexcept {
    std::free(memory);
}
void operator delete(void* memory, std::size_t) noexcept {
    std::free(memory);
}
#endif

namespace velmora::test {
namespace {

std::mutex canvasMutex;
std::condition_variable canvasArrived;
std::vector<Picture> canvases;
int canvasesWanted = 0;

void KeepCanvas(void*, video_data* frame) {
    const std::scoped_lock lock(canvasMutex);
    if (canvasesWanted == 0) return;
    --canvasesWanted;
    Picture canvas{kCanvasWidth, kCanvasHeight, std::vector<std::uint32_t>(kCanvasWidth * kCanvasHeight)};
    for (std::uint32_t y = 0; y < kCanvasHeight; ++y) {
        std::memcpy(&canvas.pixels[y * kCanvasWidth], frame->data[0] + y * frame->linesize[0],
                    kCanvasWidth * 4);
    }
    canvases.push_back(std::move(canvas));
    canvasArrived.notify_one();
}

void DrawFilm(void*, gs_effect_t* effect) {
    const Picture picture = FilmPicture();
    const auto* pixels = reinterpret_cast<const std::uint8_t*>(picture.pixels.data());
    gs_texture_t* texture = gs_texture_create(picture.width, picture.height, GS_BGRA, 1, &pixels, 0);
    gs_effect_set_texture(gs_effect_get_param_by_name(effect, "image"), texture);
    gs_draw_sprite(texture, 0, picture.width, picture.height);
    gs_texture_destroy(texture);
}

// libobs copies the record.
void RegisterSources() {
    static int data = 0;
    obs_source_info film{};
    film.id = "test_film";
    film.type = OBS_SOURCE_TYPE_INPUT;
    film.output_flags = OBS_SOURCE_VIDEO | OBS_SOURCE_CONTROLLABLE_MEDIA;
    film.get_name = [](void*) { return "Film"; };
    film.create = [](obs_data_t*, obs_source_t*) -> void* { return &data; };
    film.destroy = [](void*) {};
    film.get_width = [](void*) { return TheFilm().width.load(); };
    film.get_height = [](void*) { return TheFilm().height.load(); };
    film.media_get_time = [](void*) { return TheFilm().position.load(); };
    film.video_render = DrawFilm;
    obs_register_source(&film);
    obs_source_info camera{};
    camera.id = "test_camera";
    camera.type = OBS_SOURCE_TYPE_INPUT;
    camera.output_flags = OBS_SOURCE_ASYNC_VIDEO;
    camera.get_name = [](void*) { return "Camera"; };
    camera.create = film.create;
    camera.destroy = film.destroy;
    obs_register_source(&camera);
}

void LoadModule() {
    obs_module_t* module = nullptr;
    const std::string folder = VELMORA_OBS_DIST;
    const std::string file = folder + "/bin/64bit/velmora-reel-effects-obs.so";
    if (obs_open_module(&module, file.c_str(), (folder + "/data").c_str()) != MODULE_SUCCESS ||
        !obs_init_module(module)) {
        throw std::runtime_error("OBS refuses " + file);
    }
}

}  // namespace

Film& TheFilm() {
    static Film film;
    return film;
}

Picture FilmPicture() {
    Picture picture{TheFilm().width, TheFilm().height, {}};
    for (std::uint32_t y = 0; y < picture.height; ++y) {
        for (std::uint32_t x = 0; x < picture.width; ++x) {
            const std::uint32_t red = x * 255 / picture.width, green = y * 255 / picture.height;
            const std::uint32_t blue = (x * 7 + y * 13) % 256;
            picture.pixels.push_back(TheFilm().alpha << 24 | red << 16 | green << 8 | blue);
        }
    }
    return picture;
}

void StartObs() {
    base_set_log_handler(
        [](int level, const char* format, va_list words, void*) {
            if (level <= LOG_WARNING) std::vfprintf(stderr, (std::string(format) + "\n").c_str(), words);
        },
        nullptr);
    if (!obs_startup("de-DE", nullptr, nullptr)) throw std::runtime_error("libobs does not start");
    obs_video_info video{};
    video.graphics_module = "libobs-opengl.so.1";
    video.fps_num = kCanvasRate;
    video.fps_den = 1;
    video.base_width = video.output_width = kCanvasWidth;
    video.base_height = video.output_height = kCanvasHeight;
    video.output_format = VIDEO_FORMAT_BGRA;
    if (obs_reset_video(&video) != OBS_VIDEO_SUCCESS) throw std::runtime_error("libobs cannot draw");
    const obs_audio_info audio = {48000, SPEAKERS_STEREO};  // scenes mix sound
    if (!obs_reset_audio(&audio)) throw std::runtime_error("libobs cannot mix");
    obs_set_ui_task_handler([](obs_task_t task, void* param, bool) { task(param); });
    obs_add_main_render_callback([](void*, std::uint32_t, std::uint32_t) { isGraphicsThread = true; },
                                 nullptr);
    obs_add_raw_video_callback(nullptr, KeepCanvas, nullptr);
    RegisterSources();
    LoadModule();
}

void EndObs() {
    obs_remove_raw_video_callback(KeepCanvas, nullptr);
    obs_shutdown();
}

std::vector<Picture> Canvases(int count) {
    std::unique_lock lock(canvasMutex);
    canvases.clear();
    canvasesWanted = count;
    canvasArrived.wait(lock, [&] { return canvases.size() == static_cast<std::size_t>(count); });
    return std::move(canvases);
}

Picture CanvasAfter(int frames) {
    return Canvases(frames).back();
}

long GraphicsAllocations() {
    return graphicsAllocations;
}

void OutputFrame(obs_source_t* camera, video_format format) {
    const Picture picture = FilmPicture();
    const std::uint32_t width = picture.width, height = picture.height;
    std::vector<std::uint8_t> planes[3];
    for (auto& plane : planes) plane.assign(std::size_t{width} * height * 4, 128);
    obs_source_frame frame{};
    frame.width = width;
    frame.height = height;
    frame.format = format;
    frame.full_range = true;
    const bool isPacked = format == VIDEO_FORMAT_YUY2 || format == VIDEO_FORMAT_UYVY;
    const bool is32Bit =
        format == VIDEO_FORMAT_BGRA || format == VIDEO_FORMAT_BGRX || format == VIDEO_FORMAT_RGBA;
    // Luma is the picture's green, chroma its neutral 128.
    for (std::size_t i = 0; i < picture.pixels.size(); ++i) {
        const auto luma = static_cast<std::uint8_t>(picture.pixels[i] >> 8);
        if (is32Bit) {
            std::memcpy(&planes[0][i * 4], &picture.pixels[i], 4);
        } else if (isPacked) {
            planes[0][i * 2 + (format == VIDEO_FORMAT_UYVY ? 1 : 0)] = luma;
        } else {
            planes[0][i] = luma;
        }
    }
    for (int i = 0; i < 3; ++i) frame.data[i] = planes[i].data();
    frame.linesize[0] = width * (is32Bit ? 4 : isPacked ? 2 : 1);
    frame.linesize[1] = format == VIDEO_FORMAT_NV12 ? width : width / 2;
    frame.linesize[2] = width / 2;
    video_format_get_parameters(VIDEO_CS_709, VIDEO_RANGE_FULL, frame.color_matrix, frame.color_range_min,
                                frame.color_range_max);
    static std::uint64_t timestamp = 1;
    frame.timestamp = timestamp += 1'000'000;
    obs_source_output_video(camera, &frame);
}

}  // namespace velmora::test
