// Arbitrary bytes as a picture file: its orientation is one that there is, and reading it ends.

#include <cstddef>
#include <cstdint>
#include <sstream>
#include <string>

#include "programs/reelview/source/clip_source.h"
#include "tests/fuzz/fuzz_input.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::istringstream file(std::string(reinterpret_cast<const char*>(data), size));
    const int orientation = velmora::reelview::StoredOrientation(file);
    velmora::fuzz::Require(orientation >= 1 && orientation <= 8);
    return 0;
}
