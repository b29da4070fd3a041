// What the instruction set a file is compiled for does in one vector instruction. The
// kernels choose between equally exact formulations by these capabilities, never by the
// name of an instruction set; each kernel variant file sees its own values (private to
// the library).
#ifndef VRKFRAMEWORK_BASIC_CORE_KERNELS_CAPABILITIES_H
#define VRKFRAMEWORK_BASIC_CORE_KERNELS_CAPABILITIES_H

namespace kora::kubo::detail {

/// The width of the vectors, in bits. Also a macro, for the code that spells such vectors
/// out.
#if defined(__AVX512F__)
#define KUBO_DETAIL_VECTOR_BITS 512
#elif defined(__AVX2__)
#define KUBO_DETAIL_VECTOR_BITS 256
#else
#define KUBO_DETAIL_VECTOR_BITS 128
#endif
constexpr unsigned int kVectorBits = KUBO_DETAIL_VECTOR_BITS;

/// Conversions between floating lanes and unsigned 32-bit or any 64-bit integer lanes, and
/// min and max of unsigned and 64-bit lanes: there the plain conversions vectorise.
constexpr bool kWideIntegerConversions =
#if defined(__AVX512F__) && defined(__AVX512DQ__) && defined(__AVX512VL__)
    true;
#else
    false;
#endif

/// Multiplication of 64-bit lanes.
constexpr bool kVector64BitMultiply =
#if defined(__AVX512DQ__) && defined(__AVX512VL__)
    true;
#else
    false;
#endif

/// Comparisons that write a mask register (one bit a lane) rather than a vector of lanes,
/// for byte lanes too. Also a macro, for the code that spells such instructions out.
#if defined(__AVX512F__) && defined(__AVX512BW__) && defined(__AVX512VL__)
#define KUBO_DETAIL_MASK_REGISTERS 1
#else
#define KUBO_DETAIL_MASK_REGISTERS 0
#endif
constexpr bool kCompareIntoMaskRegisters = KUBO_DETAIL_MASK_REGISTERS;

/// Byte shuffles within the 128-bit halves of 256-bit vectors, and packing of their lanes.
/// Also a macro, for the code that spells such instructions out.
#if defined(__AVX2__)
#define KUBO_DETAIL_WIDE_BYTE_SHUFFLES 1
#else
#define KUBO_DETAIL_WIDE_BYTE_SHUFFLES 0
#endif

/// The width, in bytes, of the widest store that bypasses the caches (a non-temporal
/// store), 0 where there is none. Also a macro, for the code that spells such stores out.
#if defined(__AVX512F__)
#define KUBO_DETAIL_STREAMING_STORE_BYTES 64
#elif defined(__AVX__)
#define KUBO_DETAIL_STREAMING_STORE_BYTES 32
#elif defined(__SSE2__)
#define KUBO_DETAIL_STREAMING_STORE_BYTES 16
#else
#define KUBO_DETAIL_STREAMING_STORE_BYTES 0
#endif

/// Rounding of floating lanes toward zero, to whole values.
constexpr bool kVectorRounding =
#if defined(__SSE4_1__) || defined(__ARM_NEON)
    true;
#else
    false;
#endif

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_CORE_KERNELS_CAPABILITIES_H
