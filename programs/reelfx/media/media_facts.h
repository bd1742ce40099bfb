// What a clip is, in words and numbers for people and programs.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "programs/reelfx/conversion/picture_view.h"
#include "programs/reelfx/media/media_reader.h"

namespace velmora::hosts {

struct OtherStreamFacts {
    std::string kind;      // "audio", "subtitle", "data", ...
    std::string codec;     // by the media library's name
    int channels = 0;      // of sound
    int sampleRate = 0;    // of sound, Hz
    std::string language;  // as the container has it, often empty
};

struct MediaFacts {
    std::string container;
    std::string codec;
    std::string pixelFormat;
    int bits = 8;  // of a sample
    FrameSize size;
    FrameSize shownSize;      // turned upright; pixels are counted, not their shape
    int turn = 0;             // degrees clockwise that make the picture upright
    bool isMirrored = false;  // left and right, before it is turned
    std::string pixelShape;   // "4:3"; "1:1" where the container does not say
    FrameRate rate;
    bool isUnevenRate = false;  // frames do not follow at a constant rate
    std::int64_t frames = 0;    // 0: not known
    double seconds = 0.0;       // 0: not known
    bool isInterlaced = false;
    std::string matrix, range, primaries, transfer;  // "unknown" where the clip does not say
    std::string assumedMatrix;                       // what is taken for the matrix
    std::vector<OtherStreamFacts> others;
};

MediaFacts FactsOf(const MediaReader& reader);

// "1920x1080, 29.97 fps, 41 frames, 1.37 s, h264 yuv420p"
std::string ShortText(const MediaFacts& facts);

// What rendering does with the clip beyond the plain case, a sentence each.
std::vector<std::string> NotesOn(const MediaFacts& facts);

// What effects work on by themselves: bytes, or floats for a clip of more than 8 bits, which keep all that it has.
SampleType SamplesFor(const MediaFacts& facts);
// "8 bits", "16 bits", "float"
std::string DepthText(SampleType samples);

// "29.97", "25"
std::string RateText(FrameRate rate);

}  // namespace velmora::hosts
