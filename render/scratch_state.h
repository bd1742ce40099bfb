#pragma once
namespace velmora::render {
class ScratchMemory {};
}  // namespace velmora::render
