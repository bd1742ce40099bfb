// Renders a picture through every preset of the OpenFX bundle:   bundle_frames BUNDLE FOLDER WIDTH HEIGHT
//
// The folder has the picture as "source-8", "source-16" and "source-float": rows from the top of red, green, blue and
// straight alpha. The frames 0 and 1 of a clip of 25 frames a second, with the seed 7, are written beside it, as
// "<effect>-<preset>-<depth>-<frame>" with the effect's and the preset's index; those of a fade as "fade-<depth>-<frame>".

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>

#include "programs/reelcheck/check.h"
#include "programs/reelcheck/openfx_host.h"

namespace velmora::reelcheck {
namespace {

struct Depth {
    const char* name;
    const char* kind;
};
constexpr Depth kDepths[] = {
    {"8", kOfxBitDepthByte}, {"16", kOfxBitDepthShort}, {"float", kOfxBitDepthFloat}};
constexpr int kFrames = 2;

void Read(const std::filesystem::path& file, const HostPicture& picture) {
    std::ifstream in(file, std::ios::binary);
    const auto bytes = std::streamsize{picture.shape.Width()} * picture.PixelBytes();
    for (int y = picture.shape.Height() - 1; y >= 0; --y) {
        in.read(reinterpret_cast<char*>(picture.Pixel(0, y)), bytes);
    }
    Require(static_cast<bool>(in), "the source is too short");
}

void Write(const HostPicture& picture, const std::filesystem::path& file) {
    std::ofstream out(file, std::ios::binary);
    const auto bytes = std::streamsize{picture.shape.Width()} * picture.PixelBytes();
    for (int y = picture.shape.Height() - 1; y >= 0; --y) {
        out.write(reinterpret_cast<const char*>(picture.Pixel(0, y)), bytes);
    }
    Require(static_cast<bool>(out), "a frame cannot be written");
}

void RenderFrames(OpenfxInstance& instance, HostPicture& source, const std::filesystem::path& folder,
                  const std::string& name) {
    for (int frame = 0; frame < kFrames; ++frame) {
        HostPicture output(source.shape);
        instance.RenderWhole(source, output, frame);
        Write(output, folder / (name + "-" + std::to_string(frame)));
    }
}

void Run(const std::string& bundle, const std::filesystem::path& folder, int width, int height) {
    const OpenfxModule module(bundle);
    for (const Depth& depth : kDepths) {
        PictureShape shape = Plain(width, height);
        shape.depth = depth.kind;
        HostPicture source(shape);
        Read(folder / (std::string("source-") + depth.name), source);
        for (int effect = 0; effect < module.Count(); ++effect) {
            const OpenfxPlugin plugin(module, effect);
            OpenfxInstance instance(plugin);
            instance.Param("seed").values[0] = kSeed;
            for (std::uint32_t preset = 0; preset < plugin.Effect().presetNames.size(); ++preset) {
                instance.ChoosePreset(preset);
                RenderFrames(instance, source, folder, Text("%d-%u-%s", effect, preset, depth.name));
            }
            if (plugin.Effect().name != std::string("Film Damage")) continue;
            HostParam& wear = instance.Param("wear");
            wear.values[0] = 10.0, wear.perFrame = 25.0, wear.keys = {0.0, 2.0};
            RenderFrames(instance, source, folder, Text("fade-%s", depth.name));
        }
    }
    RequireNothingHeld();
}

}  // namespace
}  // namespace velmora::reelcheck

int main(int count, char** words) {
    if (count != 5) return 2;
    try {
        velmora::reelcheck::Run(words[1], words[2], std::atoi(words[3]), std::atoi(words[4]));
    } catch (const std::exception& failure) {
        std::fprintf(stderr, "bundle_frames: %s\n", failure.what());
        return 1;
    }
    return 0;
}
