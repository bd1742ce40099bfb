#include <dlfcn.h>

#include "faces/frei0r/host_time_unit.h"

namespace velmora::hosts::frei0r {

std::string ModuleAt(const void* address) {
    Dl_info info{};
    return dladdr(address, &info) != 0 && info.dli_fname != nullptr ? info.dli_fname : "";
}

}  // namespace velmora::hosts::frei0r
