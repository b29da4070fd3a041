// Packing and unpacking of N-bit streams for every bit count and integer element type, in
// every kernel variant, against a bit-by-bit reference of the documented layout.
#include "vrkframework/basic/core/typeconv/bitdepthpromote.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <functional>
#include <memory>
#include <random>
#include <string>
#include <type_traits>
#include <vector>

#include "support/datatypes.h"
#include "support/expectfailure.h"
#include "support/kernelvariants.h"
#include "support/promotereference.h"
#include "vrkframework/basic/core/typeconv/conversionkernels.h"
#include "vrkframework/basic/core/typeconv/packedpromote.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/promotefactory.h"

namespace {

using kora::kubo::DataType;
using kubo_test::StreamBytes;

const unsigned int kBitCounts[] = {1,  2,  3,  4,  5,  6,  7,  9,  10, 11, 12, 13, 14, 15, 17,
                                   18, 19, 20, 21, 22, 23, 24, 25, 26, 27, 28, 29, 30, 31};
const std::size_t kLengths[] = {0, 1, 7, 8, 9, 17, 1003};
constexpr unsigned char kStale = 0xFF;
constexpr std::size_t kGuard = 16;

DataType Packed(unsigned int bits) { return DataType(bits, false, false, bits, 0, false); }

template <class T>
std::vector<T> RandomSamples(std::size_t count, unsigned int bits, bool overWide,
                             std::mt19937_64& random) {
    std::vector<T> samples(count);
    for (T& sample : samples) {
        const std::uint64_t value = random();
        sample = static_cast<T>(overWide ? value : value & ((std::uint64_t{1} << bits) - 1));
    }
    return samples;
}

using Pack = std::function<void(const void*, unsigned char*, std::size_t)>;
using Unpack = std::function<void(const unsigned char*, void*, std::size_t)>;

/// Packs into a buffer of stale bytes and checks the stream and the untouched guard.
template <class T>
void CheckPack(const std::vector<T>& samples, unsigned int bits, const Pack& pack,
               const std::string& where) {
    const std::size_t streamBytes = StreamBytes(samples.size(), bits);
    std::vector<unsigned char> bytes(streamBytes + kGuard, kStale);
    pack(samples.data(), bytes.data(), samples.size());
    const std::vector<unsigned char> expected =
        kubo_test::ReferencePack(samples.data(), samples.size(), bits);
    ASSERT_EQ(std::vector<unsigned char>(bytes.begin(),
                                         bytes.begin() + static_cast<std::ptrdiff_t>(streamBytes)),
              expected)
        << where << ", " << bits << " bits, count " << samples.size();
    ASSERT_EQ(std::vector<unsigned char>(bytes.begin() + static_cast<std::ptrdiff_t>(streamBytes),
                                         bytes.end()),
              std::vector<unsigned char>(kGuard, kStale))
        << where;
}

template <class T>
void CheckUnpack(const std::vector<unsigned char>& stream, std::size_t count, unsigned int bits,
                 const Unpack& unpack, const std::string& where) {
    const T sentinel = static_cast<T>(0x5A);
    std::vector<T> samples(count + kGuard, sentinel);
    unpack(stream.data(), samples.data(), count);
    const std::vector<T> expected = kubo_test::ReferenceUnpack<T>(stream.data(), count, bits);
    ASSERT_EQ(std::vector<T>(samples.begin(), samples.begin() + static_cast<std::ptrdiff_t>(count)),
              expected)
        << where << ", " << bits << " bits, count " << count;
    ASSERT_EQ(std::vector<T>(samples.begin() + static_cast<std::ptrdiff_t>(count), samples.end()),
              std::vector<T>(kGuard, sentinel))
        << where;
}

// Every bit count that fits T, through the converters and the kernels of the variant in use.
template <class T>
void CheckEveryBitCount() {
    constexpr std::size_t kIndex = typeconv::detail::ComponentIndexOf<T>();
    std::mt19937_64 random(99);
    for (unsigned int bits : kBitCounts) {
        if (bits > sizeof(T) * 8) {
            continue;
        }
        // Through the converters the factory creates (24-bit packing is never chosen by
        // it, 24 being a whole number of bytes), and through each variant's kernels.
        const kora::kubo::PromoteFactory::InnerFactory<T> factory;
        const DataType whole = typeconv::priv::RealDescriptor<T>();
        const std::unique_ptr<typeconv::IPromote> packer(
            bits == 24 ? new typeconv::SpecialPromote<24, T, 1>()
                       : factory.Create(whole, Packed(bits)));
        const std::unique_ptr<typeconv::IPromote> unpacker(factory.Create(Packed(bits), whole));
        ASSERT_TRUE(packer && unpacker);
        std::vector<std::pair<std::string, Pack>> packs = {
            {"class", [&](const void* s, unsigned char* d, std::size_t n) {
                 packer->Promote(s, d, static_cast<unsigned int>(n));
             }}};
        std::vector<std::pair<std::string, Unpack>> unpacks = {
            {"class", [&](const unsigned char* s, void* d, std::size_t n) {
                 unpacker->Promote(s, d, static_cast<unsigned int>(n));
             }}};
        const typeconv::detail::KernelSet& kernels = typeconv::detail::ActiveKernels();
        packs.push_back({"kernel", [&](const void* s, unsigned char* d, std::size_t n) {
                             if (n != 0) {
                                 kernels.pack[kIndex](s, d, n, bits);
                             }
                         }});
        unpacks.push_back({"kernel", [&](const unsigned char* s, void* d, std::size_t n) {
                               kernels.unpack[kIndex](s, d, n, bits);
                           }});
        for (std::size_t count : kLengths) {
            const std::vector<T> samples = RandomSamples<T>(count, bits, false, random);
            const std::vector<T> overWide = RandomSamples<T>(count, bits, true, random);
            // One over-wide sample amid fitting ones: packing changes method around it.
            std::vector<T> mixed = samples;
            if (count > 300) {
                mixed[300] = overWide[300];
                // In a block of its own, bits set only above bit 31, in the last sample of a
                // word of 1, 2, 4 or 8 samples.
                if constexpr (sizeof(T) == 8) {
                    mixed[607] = static_cast<T>(samples[607] | T{1} << 33);
                }
            }
            const std::vector<unsigned char> stream =
                kubo_test::ReferencePack(samples.data(), count, bits);
            for (const auto& [name, pack] : packs) {
                CheckPack(samples, bits, pack, name);
                CheckPack(overWide, bits, pack, name + ", over-wide samples");
                CheckPack(mixed, bits, pack, name + ", one over-wide sample");
            }
            for (const auto& [name, unpack] : unpacks) {
                CheckUnpack<T>(stream, count, bits, unpack, name);
                // Round trip: the values come back as they went in.
                std::vector<T> back(count);
                unpack(stream.data(), back.data(), count);
                ASSERT_EQ(back, samples) << name;
            }
        }
    }
}

// BitDepth.<type>/<variant> for every integer component type.
const bool kBitCountsRegistered = [] {
    kubo_test::ForEachComponentType([](auto tag) {
        using T = typename decltype(tag)::type;
        if constexpr (std::is_integral_v<T>) {
            kubo_test::RegisterPerVariant("BitDepth", kubo_test::TypeName<T>(),
                                          &CheckEveryBitCount<T>, __FILE__, __LINE__);
        }
    });
    return true;
}();

TEST(BitDepth, DocumentedLayouts) {
    const std::vector<unsigned char> bits = {1, 0, 1, 1, 0, 0, 0, 1, 1};
    std::vector<unsigned char> packed(3, kStale);
    typeconv::BitDepthPromote<1, unsigned char, 0, 0>::Pack(bits.data(), packed.data(), 9);
    EXPECT_EQ(packed, (std::vector<unsigned char>{0xB1, 0x80, kStale}));

    const std::vector<unsigned short> twelve = {0xABC, 0x123};
    packed.assign(4, kStale);
    typeconv::BitDepthPromote<12, unsigned short, 0, 0>::Pack(twelve.data(), packed.data(), 2);
    EXPECT_EQ(packed, (std::vector<unsigned char>{0xAB, 0xC1, 0x23, kStale}));
    std::vector<unsigned short> back(3, 7);
    typeconv::BitDepthPromote<12, unsigned short, 0, 0>::Promote(packed.data(), back.data(), 2);
    EXPECT_EQ(back, (std::vector<unsigned short>{0xABC, 0x123, 7}));

    // No sign extension: 7 in three bits is 7 in char, 0xFFF in twelve bits 4095 in short.
    const unsigned char seven[] = {0xE0};
    char value = 0;
    typeconv::BitDepthPromote<3, char, 0, 0>::Promote(seven, &value, 1);
    EXPECT_EQ(value, 7);
    const unsigned char ones[] = {0xFF, 0xF0};
    short wide = 0;
    typeconv::BitDepthPromote<12, short, 0, 0>::Promote(ones, &wide, 1);
    EXPECT_EQ(wide, 4095);
}

TEST(BitDepth, OverWideSamplesSpillIntoThePreviousSample) {
    // The second 12-bit sample starts at bit 4 of byte 1: its bits above 11 are ORed into
    // the high nibble of that byte, which holds the first sample's low bits.
    const std::vector<unsigned short> samples = {0x000, 0xF123};
    std::vector<unsigned char> packed(3);
    typeconv::BitDepthPromote<12, unsigned short, 0, 0>::Pack(samples.data(), packed.data(), 2);
    EXPECT_EQ(packed, (std::vector<unsigned char>{0x00, 0xF1, 0x23}));
    // Within one byte a sample loses its high bits: 0xF in 3 bits at offset 0 and 3.
    const std::vector<unsigned char> small = {0xF, 0xF};
    typeconv::BitDepthPromote<3, unsigned char, 0, 0>::Pack(small.data(), packed.data(), 2);
    EXPECT_EQ(packed[0], 0xFC);
    // A signed sample spills as its promoted value: -1 brings its sign bits along, where
    // 0xFFFF spills only its one bit above bit 14.
    const std::vector<short> negative = {0, -1};
    packed.assign(4, 0);
    typeconv::BitDepthPromote<15, short, 0, 0>::Pack(negative.data(), packed.data(), 2);
    EXPECT_EQ(packed, (std::vector<unsigned char>{0x00, 0xFF, 0xFF, 0xFC}));
    const std::vector<unsigned short> positive = {0, 0xFFFF};
    typeconv::BitDepthPromote<15, unsigned short, 0, 0>::Pack(positive.data(), packed.data(), 2);
    EXPECT_EQ(packed, (std::vector<unsigned char>{0x00, 0x03, 0xFF, 0xFC}));
}

TEST(BitDepth, CountsBelowOneAsSigned32BitConvertNothing) {
    std::vector<unsigned char> packed(4, kStale);
    std::vector<unsigned short> samples(4, 9);
    for (unsigned int count : {0u, 0x80000000u, 0xFFFFFFFFu}) {
        typeconv::BitDepthPromote<12, unsigned short, 0, 0>::Pack(samples.data(), packed.data(),
                                                                  count);
        typeconv::BitDepthPromote<12, unsigned short, 0, 0>::Promote(packed.data(), samples.data(),
                                                                     count);
    }
    EXPECT_EQ(packed, std::vector<unsigned char>(4, kStale));
    EXPECT_EQ(samples, std::vector<unsigned short>(4, 9));
}

const char kTooWide[] =
    "Invalid type promote, the number of bit is bigger than the type requested for conversion";
const char kSourcePath[] = "vrkframework/basic/core/typeconv/promote";

TEST(BitDepth, BitCountsAboveTheElementWidthThrowBeforeWriting) {
    std::vector<unsigned char> packed(8, kStale);
    std::vector<unsigned char> bytes(8, kStale);
    auto failure = kubo_test::Catch<kora::Exception>([&] {
        typeconv::BitDepthPromote<12, unsigned char, 0, 0>::Promote(packed.data(), bytes.data(), 2);
    });
    ASSERT_TRUE(failure);
    kubo_test::ExpectReport(*failure, kTooWide, kSourcePath,
                            "void __cdecl typeconv::BitDepthPromote<12,unsigned char,0,0>::Promote("
                            "const unsigned char *,unsigned char *,unsigned int)",
                            390);
    failure = kubo_test::Catch<kora::Exception>([&] {
        typeconv::BitDepthPromote<12, unsigned char, 0, 0>::Pack(bytes.data(), packed.data(), 2);
    });
    ASSERT_TRUE(failure);
    kubo_test::ExpectReport(*failure, kTooWide, kSourcePath,
                            "void __cdecl typeconv::BitDepthPromote<12,unsigned char,0,0>::Pack("
                            "const unsigned char *,unsigned char *,unsigned int)",
                            395);
    std::vector<short> shorts(2, 3);
    failure = kubo_test::Catch<kora::Exception>(
        [&] { typeconv::BitDepthPromote<17, short, 0, 0>::Pack(shorts.data(), packed.data(), 0); });
    ASSERT_TRUE(failure);
    kubo_test::ExpectReport(*failure, kTooWide, kSourcePath,
                            "void __cdecl typeconv::BitDepthPromote<17,short,0,0>::Pack("
                            "const short *,unsigned char *,unsigned int)",
                            395);
    EXPECT_EQ(packed, std::vector<unsigned char>(8, kStale));
    EXPECT_EQ(bytes, std::vector<unsigned char>(8, kStale));
}

/// The bit counts of a converter pair, and the failure of both when N exceeds T.
void CheckConverters(typeconv::IPromote& unpack, typeconv::IPromote& pack, unsigned int bits,
                     unsigned int typeBits) {
    EXPECT_EQ(unpack.GetInputBits(), bits);
    EXPECT_EQ(unpack.GetOutputBits(), typeBits);
    EXPECT_EQ(pack.GetInputBits(), typeBits);
    EXPECT_EQ(pack.GetOutputBits(), bits);
    if (bits > typeBits) {
        std::vector<unsigned char> buffer(64, kStale);
        const auto unpackFailure = kubo_test::Catch<kora::Exception>(
            [&] { unpack.Promote(buffer.data(), buffer.data() + 32, 1); });
        const auto packFailure = kubo_test::Catch<kora::Exception>(
            [&] { pack.Promote(buffer.data(), buffer.data() + 32, 1); });
        ASSERT_TRUE(unpackFailure && packFailure);
        EXPECT_EQ(unpackFailure->GetLine(), 390u);
        EXPECT_EQ(packFailure->GetLine(), 395u);
        EXPECT_EQ(packFailure->GetMessage(), kTooWide);
        EXPECT_EQ(buffer, std::vector<unsigned char>(64, kStale));
    }
}

// Every converter the factory can create, as the exact instance (24-bit packing is never
// chosen by the factory; that converter is created directly).
template <class T, unsigned int N>
void CheckSpecialPromote() {
    if constexpr (N != 0 && N != 8 && N != 16) {
        const kora::kubo::PromoteFactory::InnerFactory<T> factory;
        const DataType whole = typeconv::priv::RealDescriptor<T>();
        const std::unique_ptr<typeconv::IPromote> unpack(factory.Create(Packed(N), whole));
        const std::unique_ptr<typeconv::IPromote> pack(
            N == 24 ? new typeconv::SpecialPromote<N, T, 1>() : factory.Create(whole, Packed(N)));
        ASSERT_TRUE((dynamic_cast<typeconv::SpecialPromote<N, T, 0>*>(unpack.get()) != nullptr &&
                     dynamic_cast<typeconv::SpecialPromote<N, T, 1>*>(pack.get()) != nullptr))
            << N;
        CheckConverters(*unpack, *pack, N, sizeof(T) * 8);
    }
}

template <class T, unsigned int... N>
void CheckEverySpecialPromote(std::integer_sequence<unsigned int, N...>) {
    (CheckSpecialPromote<T, N>(), ...);
}

TEST(BitDepth, TheFactoryCreatesEveryConverter) {
    kubo_test::ForEachComponentType([](auto tag) {
        using T = typename decltype(tag)::type;
        if constexpr (std::is_integral_v<T>) {
            CheckEverySpecialPromote<T>(std::make_integer_sequence<unsigned int, 32>());
        }
    });
}

}  // namespace
