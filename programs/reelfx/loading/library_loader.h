// Loads FFmpeg's libraries when the first of their functions is called. Mapping and relocating them takes 30 ms, three
// times what `reelfx list` takes without them.
//
// The functions that reelfx calls stand in a table that write_entries.py makes, with an entry for each: a function of the
// same name that jumps to the address found here. The first call loads all libraries, from whatever thread it comes. If
// that fails, the program says so and ends with kExitInternal: functions of C cannot report it otherwise.
#pragma once

namespace velmora::hosts {

struct LibraryFunction {
    const char* library;  // as the dynamic loader names it, such as "libavutil.so.57"
    const char* name;
};

}  // namespace velmora::hosts

extern "C" {

// In the generated file: the functions, and the address of each, null before the libraries are loaded.
extern const velmora::hosts::LibraryFunction velmora_functions[];
extern const unsigned velmora_function_count;
extern void* velmora_addresses[];

// Called by velmora_load_libraries, which keeps the arguments of the call that came first.
void velmora_find_functions();
}
