// The ways to convert a frame to BGRA and back that conversion_bench compares.
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::bench {

struct Candidate {
    std::string name;
    std::function<void(const AVFrame&, hosts::BgraPicture&)> toBgra;
    std::function<void(const hosts::BgraPicture&, AVFrame&)> fromBgra;
};

// The library's scaler with these flags.
Candidate ScalerCandidate(const std::string& name, int flags);
// reelfx's own conversion, at the SIMD level that VELMORA_FORM selects.
Candidate OwnCandidate(const std::string& name);
// The zimg library at one of its levels (zimg_cpu_type_e); nothing if it was not there to build with.
std::vector<Candidate> ZimgCandidates();

}  // namespace velmora::bench
