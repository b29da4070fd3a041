// How the mask kernels are compiled: their hot loops twice on x86-64 with GCC, and their
// symbols kept inside the library.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_VECTORCLONES_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_VECTORCLONES_H

// The kernels are not exported: a program that compiles its own copies (the tests do) keeps
// them apart from the library's, which also keeps each copy's choice of loops.
#if defined(__GNUC__) && defined(__ELF__)
#define KUBO_INTERNAL __attribute__((visibility("hidden")))
#else
#define KUBO_INTERNAL
#endif

// The baseline x86-64 instruction set has no byte shuffle, so pixels of three 8-, 16- or
// 32-bit samples do not vectorise there, and its 16-byte vectors halve what x86-64-v3 (AVX2)
// does per instruction. A loop marked with KUBO_VECTOR_CLONES is compiled for both and the
// loader picks the one the processor runs. KUBO_BASELINE_ONLY turns this off, so the tests
// can run the baseline loops on any machine while the library runs the other.
#if defined(__GNUC__) && !defined(__clang__) && defined(__x86_64__) && defined(__ELF__) && \
    !defined(KUBO_BASELINE_ONLY)
#define KUBO_VECTOR_CLONES __attribute__((target_clones("default", "arch=x86-64-v3")))
// GCC exports the dispatcher of a cloned template whatever its visibility; internal linkage
// keeps it private. Within the library one file instantiates the kernels.
#define KUBO_CLONED_TEMPLATE static KUBO_VECTOR_CLONES
#else
#define KUBO_VECTOR_CLONES
#define KUBO_CLONED_TEMPLATE KUBO_INTERNAL
#endif

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_VECTORCLONES_H
