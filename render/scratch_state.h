#pragma once
namespace velmora::render {
class ScratchMemory {};
}
