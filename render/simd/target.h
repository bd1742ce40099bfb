// Which SIMD levels this build has, and how the file of a level is compiled for its instructions.
//
// Such a file includes all its other headers first. Only functions in an unnamed namespace go between VM_BEGIN_TARGET
// and VM_END_TARGET: the linker could pick the copy of a header's inline function compiled there for the whole program,
// which would then crash on processors without the instructions.
#pragma once

#if defined(__i386__) || defined(__x86_64__)
#define VM_IS_X86 1
#include <immintrin.h>
#else
#define VM_IS_X86 0
// The WebAssembly compiler maps these levels onto its own vectors if enabled.
#if defined(__SSSE3__)
#include <tmmintrin.h>
#elif defined(__SSE2__)
#include <emmintrin.h>
#endif
#endif

#if VM_IS_X86 || defined(__SSE2__)
#define VM_HAS_SSE2 1
#else
#define VM_HAS_SSE2 0
#endif
#if VM_IS_X86 || defined(__SSSE3__)
#define VM_HAS_SSSE3 1
#else
#define VM_HAS_SSSE3 0
#endif
#define VM_HAS_AVX2 VM_IS_X86
#define VM_HAS_AVX512 VM_IS_X86

#define VM_PRAGMA(text) _Pragma(#text)
// For functions that keep their state in registers only if inlined.
#define VM_ALWAYS_INLINE __attribute__((always_inline)) inline
// For functions that would otherwise be copied into many loops.
#define VM_NOINLINE __attribute__((noinline))
// For a loop whose steps depend on each other, so that unrolling only costs registers.
#if defined(__clang__)
#define VM_DO_NOT_UNROLL VM_PRAGMA(clang loop unroll(disable))
#else
#define VM_DO_NOT_UNROLL VM_PRAGMA(GCC unroll 1)
#endif

#if !VM_IS_X86
#define VM_BEGIN_TARGET(instructions)
#define VM_END_TARGET
#elif defined(__clang__)
#define VM_BEGIN_TARGET(instructions) \
    VM_PRAGMA(clang attribute push(__attribute__((target(instructions))), apply_to = function))
#define VM_END_TARGET VM_PRAGMA(clang attribute pop)
#else
// To the end of the file, where templates of the level are instantiated. Those of the standard library are not
// affected: a template is compiled for the target in effect where it was defined.
#define VM_BEGIN_TARGET(instructions) VM_PRAGMA(GCC target(instructions))
#define VM_END_TARGET
#endif
