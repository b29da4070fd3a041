// Asks the promote factory for the converter between two arbitrary descriptors and runs it
// on arbitrary bit patterns: the factory must create exactly the converters its rules
// give (or fail as documented), whole-sample converters must follow the per-value rule in
// every complex layout, packed converters the bit layout of the stream, and none may
// write past its output.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <iterator>  // std::size
#include <limits>
#include <memory>
#include <random>
#include <type_traits>
#include <typeinfo>
#include <vector>

#include "fuzzinput.h"
#include "support/datatypes.h"
#include "support/promotereference.h"
#include "vrkframework/basic/core/typeconv/ipromote.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/promotefactory.h"
#include "vrkframework/platform/exception.h"

using kora::kubo::DataType;
using kora::kubo::PromoteFactory;
using kubo_fuzz::Check;

namespace {

constexpr unsigned char kSentinel = 0xA5;
constexpr std::size_t kGuard = 24;

// The ten component types in search order, as the descriptors they match.
const DataType kComponents[] = {
    DataType::Type8S,  DataType::Type8U,  DataType::Type16S, DataType::Type16U, DataType::Type32S,
    DataType::Type32U, DataType::Type32R, DataType::Type64R, DataType::Type64S, DataType::Type64U};

// Descriptors that are neither predefined nor plain packed integers.
const DataType kOdd[] = {
    DataType(),                                // all zero
    DataType(24, true, false, 24, 0, false),   // whole bytes, no component type
    DataType(40, false, false, 40, 0, false),  // whole bytes, wider than any component
    DataType(32, true, true, 24, 8, false),    // 32R but for its mantissa
    DataType(8, false, false, 7, 0, false),    // 8U but for its mantissa
    DataType(32, false, true, 23, 8, false),   // unsigned floating
    DataType(128, true, true, 128, 0, false),  // what PromoteType gives for {64R, 64S}
    DataType(12, true, true, 8, 3, false),     // packed floating
    DataType(33, false, false, 33, 0, false),  // packed, wider than 31 bits
    DataType(5, true, false, 5, 0, true),      // packed complex
};

constexpr unsigned int kPredefinedCount =
    sizeof kubo_test::kPredefinedTypes / sizeof kubo_test::kPredefinedTypes[0];
constexpr unsigned int kOddCount = sizeof kOdd / sizeof kOdd[0];

DataType PickType(kubo_fuzz::FuzzInput& input) {
    const unsigned int pick = input.Take(kPredefinedCount + 62 + kOddCount);
    if (pick < kPredefinedCount) {
        return kubo_test::kPredefinedTypes[pick];
    }
    if (pick < kPredefinedCount + 62) {
        const unsigned int bits = 1 + (pick - kPredefinedCount) / 2;
        return DataType(bits, pick % 2 == 0, false, bits, 0, false);
    }
    return kOdd[pick - kPredefinedCount - 62];
}

/// The component type a descriptor matches (its complex form too when `acceptComplex`),
/// or -1.
int Component(const DataType& type, bool acceptComplex) {
    for (int i = 0; i < 10; ++i) {
        DataType complex = kComponents[i];
        complex.isComplex = true;
        if (type == kComponents[i] || (acceptComplex && type == complex)) {
            return i;
        }
    }
    return -1;
}

/// What the factory must do with a pair: the element types (indexes of kComponents) and
/// the packed bit count of the converter it creates.
struct Outcome {
    enum Kind { kNull, kWhole, kUnpack, kPack, kThrows } kind;
    int from;
    int to;
    unsigned int bits;
};

// A packed integer side against a whole-byte side whose element type `whole` names.
Outcome PackedOutcome(const DataType& whole, unsigned int bits, Outcome::Kind kind) {
    const int element = Component(whole, false);
    if (element < 0) {
        return {Outcome::kThrows, -1, -1, 0};
    }
    if (kComponents[element].isFloat || bits > 31) {
        return {Outcome::kNull, -1, -1, 0};
    }
    return {kind, element, element, bits};
}

Outcome Expect(const DataType& from, const DataType& to) {
    if (from == to) {
        return {Outcome::kNull, -1, -1, 0};
    }
    const bool acceptComplex = from.isComplex || to.isComplex;
    const int a = Component(from, acceptComplex);
    const int b = Component(to, acceptComplex);
    if (a >= 0 && b >= 0) {
        return {Outcome::kWhole, a, b, 0};
    }
    const bool fromPacked = from.bits % 8 != 0;
    const bool toPacked = to.bits % 8 != 0;
    if (fromPacked && !toPacked && !from.isFloat) {
        return PackedOutcome(to, from.bits, Outcome::kUnpack);
    }
    if (toPacked && !fromPacked && !to.isFloat) {
        return PackedOutcome(from, to.bits, Outcome::kPack);
    }
    return {Outcome::kNull, -1, -1, 0};
}

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
constexpr double kInf = std::numeric_limits<double>::infinity();
constexpr double kTiny = std::numeric_limits<double>::denorm_min();

// Floating values at and around the saturation thresholds and rounding ties of every
// destination, and specials.
const double kFloatingSpecials[] = {
    kNaN,          kInf,          -kInf,  0.5,          -0.5,   2.5,    -2.5,    0.49999997,
    -0.0,          126.6,         127.5,  -128.5,       254.5,  255.5,  32767.5, 65535.5,
    2147483646.5,  2147483647.5,  0x1p31, 4294967294.5, 0x1p32, 0x1p63, -0x1p63, 0x1p64,
    0x1p63 - 1024, 0x1p64 - 2048, 3.5e38, 1e300,        kTiny};

// Integer bit patterns at the ends of every width.
const std::uint64_t kIntegerSpecials[] = {
    0,          1,          ~0ull,      0x7F,       0x80,          0xFF, 0x7FFF, 0x8000,    0xFFFF,
    0x7FFFFFFF, 0x80000000, 0xFFFFFFFF, ~0ull >> 1, ~(~0ull >> 1), 200,  1000,   0 - 200ull};

template <class A>
A Special(std::mt19937& random) {
    if constexpr (std::is_floating_point_v<A>) {
        // Beyond the float range the conversion gives an infinity (IEEE).
        return static_cast<A>(kFloatingSpecials[random() % std::size(kFloatingSpecials)]);
    } else {
        return static_cast<A>(kIntegerSpecials[random() % std::size(kIntegerSpecials)]);
    }
}

/// `count` values of T made of the input bytes, with every value replaced by a special
/// one with probability `sprinkle` / 8.
template <class T>
std::vector<T> Values(kubo_fuzz::FuzzInput& input, std::size_t count, unsigned int sprinkle,
                      std::mt19937& random) {
    std::vector<T> values(count);
    const std::vector<unsigned char> bytes = input.Bytes(count * sizeof(T));
    if (count != 0) {
        std::memcpy(values.data(), bytes.data(), bytes.size());
    }
    for (T& value : values) {
        if (random() % 8 < sprinkle) {
            value = Special<T>(random);
        }
    }
    return values;
}

template <class T>
T Read(const std::vector<unsigned char>& bytes, std::size_t index) {
    T value;
    std::memcpy(&value, bytes.data() + index * sizeof(T), sizeof(T));
    return value;
}

bool GuardIntact(const std::vector<unsigned char>& buffer, std::size_t written) {
    return std::all_of(buffer.begin() + static_cast<std::ptrdiff_t>(written), buffer.end(),
                       [](unsigned char byte) { return byte == kSentinel; });
}

/// Runs a converter into a sentinel-filled buffer of `bytes` bytes plus the guard.
std::vector<unsigned char> Run(typeconv::IPromote& promote, const void* src, std::size_t bytes,
                               unsigned int count) {
    std::vector<unsigned char> out(bytes + kGuard, kSentinel);
    promote.Promote(src, out.data(), count);
    Check(GuardIntact(out, bytes), "nothing is written past the converted samples");
    return out;
}

template <class A, class B>
void CheckWhole(typeconv::IPromote& promote, bool complexIn, bool complexOut, unsigned int count,
                const std::vector<A>& src) {
    Check(promote.GetInputBits() == sizeof(A) * 8 && promote.GetOutputBits() == sizeof(B) * 8,
          "a whole-sample converter reports its component widths");
    const std::size_t in = complexIn ? 2 : 1;
    const std::size_t out = complexOut ? 2 : 1;
    const std::vector<unsigned char> dst = Run(promote, src.data(), out * count * sizeof(B), count);
    for (std::size_t i = 0; i < count; ++i) {
        Check(kubo_test::SameValue(Read<B>(dst, out * i), kubo_test::Expected<B>(src[in * i])),
              "the real part follows the per-value rule");
        if (complexIn && complexOut) {
            Check(kubo_test::SameValue(Read<B>(dst, 2 * i + 1),
                                       kubo_test::Expected<B>(src[2 * i + 1])),
                  "the imaginary part follows the per-value rule");
        } else if (complexOut) {
            Check(kubo_test::SameValue(Read<B>(dst, 2 * i + 1), B(0)),
                  "a real sample gets the imaginary part 0");
        }
    }
}

const char kTooWide[] =
    "Invalid type promote, the number of bit is bigger than the type requested for conversion";

/// The packed converter and its reverse from the factory: unpacking follows the stream
/// layout, packing the documented bit rule (over-wide samples included), and samples that
/// fit in N bits survive packing and unpacking.
template <class T>
void CheckPacked(typeconv::IPromote& promote, const Outcome& expected, const DataType& from,
                 const DataType& to, unsigned int count, unsigned int sprinkle,
                 kubo_fuzz::FuzzInput& input, std::mt19937& random) {
    const bool pack = expected.kind == Outcome::kPack;
    const unsigned int bits = expected.bits;
    const unsigned int typeBits = sizeof(T) * 8;
    Check(promote.GetInputBits() == (pack ? typeBits : bits) &&
              promote.GetOutputBits() == (pack ? bits : typeBits),
          "a packed converter reports the packed and the element width");
    const std::size_t streamBytes = kubo_test::StreamBytes(count, bits);
    if (bits > typeBits) {
        // The conversion fails before anything is written, whatever the count.
        const std::vector<unsigned char> src(count * sizeof(T) + 1, 0);
        std::vector<unsigned char> dst(count * sizeof(T) + kGuard, kSentinel);
        try {
            promote.Promote(src.data(), dst.data(), count);
            Check(false, "a packed width above the element width fails");
        } catch (const kora::Exception& failure) {
            Check(typeid(failure) == typeid(kora::Exception) && failure.GetMessage() == kTooWide &&
                      failure.GetLine() == (pack ? 395u : 390u),
                  "a packed width above the element width fails as documented");
        }
        Check(GuardIntact(dst, 0), "a failing conversion writes nothing");
        return;
    }
    const std::unique_ptr<typeconv::IPromote> reverse(PromoteFactory().Create(to, from));
    Check(reverse != nullptr, "the reverse of a packed converter exists");
    typeconv::IPromote& packer = pack ? promote : *reverse;
    typeconv::IPromote& unpacker = pack ? *reverse : promote;

    const std::vector<unsigned char> stream = input.Bytes(streamBytes + 1);
    const std::vector<unsigned char> unpacked =
        Run(unpacker, stream.data(), count * sizeof(T), count);
    const std::vector<T> samples = kubo_test::ReferenceUnpack<T>(stream.data(), count, bits);
    Check(count == 0 || std::memcmp(unpacked.data(), samples.data(), count * sizeof(T)) == 0,
          "unpacking follows the stream layout");

    const std::vector<T> wide = Values<T>(input, count, sprinkle, random);
    const std::vector<unsigned char> packed = Run(packer, wide.data(), streamBytes, count);
    Check(std::equal(packed.begin(), packed.begin() + static_cast<std::ptrdiff_t>(streamBytes),
                     kubo_test::ReferencePack(wide.data(), count, bits).begin()),
          "packing follows the stream layout");

    // The unpacked samples fit in N bits: packed again they come back.
    const std::vector<unsigned char> again = Run(packer, unpacked.data(), streamBytes, count);
    const std::vector<unsigned char> back = Run(unpacker, again.data(), count * sizeof(T), count);
    Check(std::equal(back.begin(), back.begin() + static_cast<std::ptrdiff_t>(count * sizeof(T)),
                     unpacked.begin()),
          "samples of N bits survive packing and unpacking");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    kubo_fuzz::FuzzInput input(data, size);
    const DataType from = PickType(input);
    const DataType to = PickType(input);
    const unsigned int count = input.Take(256) + 256 * input.Take(2);
    const unsigned int sprinkle = input.Take(5);
    std::mt19937 random(input.Take(256) * 256 + input.Take(256));

    const Outcome expected = Expect(from, to);
    std::unique_ptr<typeconv::IPromote> promote;
    try {
        promote.reset(PromoteFactory().Create(from, to));
    } catch (const kora::Exception& failure) {
        Check(expected.kind == Outcome::kThrows, "only a packed side against no component fails");
        Check(typeid(failure) == typeid(kora::Exception) &&
                  failure.GetMessage() == "Invalid type requested." && failure.GetLine() == 175,
              "an unmatched whole side fails as the dispatcher reports it");
        return 0;
    }
    Check(expected.kind != Outcome::kThrows, "a packed side against no component fails");
    Check((promote == nullptr) == (expected.kind == Outcome::kNull),
          "a converter exactly where the factory rules give one");
    if (expected.kind == Outcome::kWhole) {
        kubo_test::WithComponent(expected.from, [&](auto a) {
            using A = typename decltype(a)::type;
            const std::vector<A> src =
                Values<A>(input, (from.isComplex ? 2u : 1u) * count, sprinkle, random);
            kubo_test::WithComponent(expected.to, [&](auto b) {
                CheckWhole<A, typename decltype(b)::type>(*promote, from.isComplex, to.isComplex,
                                                          count, src);
            });
        });
    } else if (expected.kind != Outcome::kNull) {
        kubo_test::WithComponent(expected.from, [&](auto t) {
            using T = typename decltype(t)::type;
            if constexpr (std::is_integral_v<T>) {
                CheckPacked<T>(*promote, expected, from, to, count, sprinkle, input, random);
            }
        });
    }
    return 0;
}
