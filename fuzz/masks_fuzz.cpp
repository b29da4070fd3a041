// Builds no-data masks of random rasters with every form of MaskDecisionBuilder and
// compares each bit with a per-pixel reference of the rules: list widening, complex
// channels as (real, imaginary) pairs, the no-data value in the element or listed storage
// type, the channel tests of each rule (the pair rule reaching into the next pixel), and
// pixels past the buffer. A mask built again, after a copy of the builder has met
// another raster, and a decision evaluated on its own give the same flags.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <memory>
#include <numeric>
#include <random>
#include <type_traits>
#include <vector>

#include "fuzzinput.h"
#include "support/datatypes.h"
#include "vrkframework/basic/kubo/masks/mask.h"
#include "vrkframework/basic/kubo/masks/maskdecision.h"
#include "vrkframework/basic/kubo/masks/maskdecisionbuilder.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/raster.h"

using kora::kubo::BkgdRule;
using kora::kubo::DataType;
using kora::kubo::Mask;
using kora::kubo::MaskDecision;
using kora::kubo::MaskDecisionBuilder;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;
using kubo_fuzz::Check;

namespace {

using Flags = std::vector<unsigned char>;

// Hand-built descriptors: a 16-bit "float" reads as signed 16-bit, a complex float with
// another mantissa as 32R parts; the rest have no element type.
const DataType kOddTypes[] = {
    DataType(16, true, true, 10, 5, false), DataType(32, true, true, 24, 8, true),
    DataType(12, false, false, 12, 0, false), DataType(32, false, true, 23, 8, false),
    DataType(64, false, true, 52, 11, true)};

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
constexpr double kInf = std::numeric_limits<double>::infinity();
constexpr double kLargest = std::numeric_limits<double>::max();  // the untested 32R marker

// No-data values: exact and inexact in float, at and past the ends of each integer type
// and of its listed storage type, and without any integer.
const double kNoData[] = {
    0.0,     1.0,      -1.0,         0.1,          kNaN,  3.0,    9.0,
    -0.0,    2.5,      127.0,        -128.0,       255.0, 300.0,  32767.0,
    65535.0, -32769.0, 2147483647.0, 4294967295.0, 1e30,  0x1p63, 0x1p63 + 0x1p12,
    -0x1p63, 1e20,     kLargest,     kInf,         -kInf};

const unsigned int kChannels[] = {0, 1, 1, 2,  2,          3,          3,         4,
                                  5, 6, 7, 12, 0x7FFFFFFF, 0x80000001, 0xFFFFFFFF};

template <class T>
constexpr unsigned int CountOf(const T& array) {
    return sizeof array / sizeof array[0];
}

/// The element type the samples of a (real or part) descriptor are compared in, as an
/// index in dispatch order: by width and signedness, floating only where the width is 32
/// or 64 and the type signed; -1 for none.
int ElementOf(const DataType& type) {
    const int sign = type.isSigned ? 0 : 1;
    switch (type.bits) {
        case 8:
            return sign;
        case 16:
            return 2 + sign;
        case 32:
            return type.isFloat ? (type.isSigned ? 6 : -1) : 4 + sign;
        case 64:
            return type.isFloat ? (type.isSigned ? 7 : -1) : 8 + sign;
        default:
            return -1;
    }
}

/// The descriptor of one part of a complex sample: the float layouts restored for signed
/// floating parts of 32 and 64 bits, any other read as an integer of its width.
DataType PartOf(const DataType& type) {
    if (type.isFloat && type.isSigned && (type.bits == 32 || type.bits == 64)) {
        return type.bits == 32 ? DataType::Type32R : DataType::Type64R;
    }
    return DataType(type.bits, type.isSigned, type.isFloat, type.bits, 0, false);
}

std::uint64_t PixelCount(const Raster& raster) {
    return std::uint64_t{raster.width + 2 * raster.xMargin} * (raster.height + 2 * raster.yMargin);
}

DataType PickType(kubo_fuzz::FuzzInput& input) {
    constexpr unsigned int kPredefined = CountOf(kubo_test::kPredefinedTypes);
    const unsigned int pick = input.Take(kPredefined + CountOf(kOddTypes));
    return pick < kPredefined ? kubo_test::kPredefinedTypes[pick] : kOddTypes[pick - kPredefined];
}

/// v truncated toward zero as 64 bits: signed below 2^63, unsigned from there to 2^64;
/// NaN and values beyond have no integer and give the top bit alone.
std::uint64_t IntegerBits(double v) {
    if (v >= -0x1p63 && v < 0x1p63) {
        return static_cast<std::uint64_t>(static_cast<std::int64_t>(v));
    }
    if (v >= 0x1p63 && v < 0x1p64) {
        return static_cast<std::uint64_t>(v);
    }
    return std::uint64_t{1} << 63;
}

/// A no-data value in type S: the low bits of its integer, or rounded to float (to an
/// infinity beyond the float range, as IEEE conversion does).
template <class S>
S Stored(double v) {
    if constexpr (std::is_floating_point_v<S>) {
        return static_cast<S>(v);
    } else {
        return static_cast<S>(IntegerBits(v));
    }
}

/// The type that stores listed channels of T: one that holds every value of T and one
/// more, its maximum, meaning "not tested". The 64-bit types carry a flag instead.
template <class T>
using Twice = std::conditional_t<
    sizeof(T) == 1, std::conditional_t<std::is_signed_v<T>, std::int16_t, std::uint16_t>,
    std::conditional_t<sizeof(T) == 2,
                       std::conditional_t<std::is_signed_v<T>, std::int32_t, std::uint32_t>,
                       std::conditional_t<std::is_signed_v<T>, std::int64_t, std::uint64_t>>>;
template <class T>
using Listed = std::conditional_t<std::is_same_v<T, float>, double,
                                  std::conditional_t<sizeof(T) == 8, T, Twice<T>>>;

/// One channel's test. Every value involved is exact as a long double, so comparing
/// there is comparing in the storage type.
struct Test {
    bool tested;
    long double value;

    bool Matches(long double sample) const { return sample == value; }
};

template <class T>
Test Plain(double v) {
    return {true, static_cast<long double>(Stored<T>(v))};
}

template <class T>
Test Untested() {
    if constexpr (sizeof(T) == 8) {
        return {false, std::numeric_limits<long double>::quiet_NaN()};
    } else {
        return {false, static_cast<long double>(std::numeric_limits<Listed<T>>::max())};
    }
}

template <class T>
Test ListedEntry(double v) {
    const Test entry = Plain<Listed<T>>(v);
    if constexpr (sizeof(T) == 8) {
        return entry;
    } else {
        // A value that converts to the marker is the marker: the channel is not tested.
        return {entry.value != Untested<T>().value, entry.value};
    }
}

/// The flags of every pixel of the buffer from the final lists, for element type T and
/// `channelCount` channels of it.
template <class T>
Flags ElementFlags(const Raster& raster, std::uint64_t pixels, std::uint64_t channelCount, int rule,
                   const std::vector<double>& noData, const std::vector<std::uint64_t>& channels) {
    std::vector<Test> tests;
    if (channelCount == 1) {
        tests.push_back(Plain<T>(noData.front()));
        rule = 1;  // one channel is tested alone: the any-channel test
    } else if (rule > 2) {
        return Flags(pixels, 0);  // no kernel: every pixel background
    } else if (channels.size() < channelCount) {
        tests.assign(channelCount, Untested<T>());
        for (std::size_t i = 0; i < std::min(channels.size(), noData.size()); ++i) {
            if (channels[i] >= 1 && channels[i] <= channelCount) {
                tests[channels[i] - 1] = ListedEntry<T>(noData[i]);
            }
        }
    } else if (std::all_of(noData.begin(), noData.end(),
                           [&](double v) { return v == noData.front(); })) {
        tests.assign(channelCount, Plain<T>(noData.front()));
    } else {
        for (const double v : noData) {
            tests.push_back(Plain<T>(v));  // by position: the list's length is the stride
        }
    }
    const std::size_t stride = tests.size();
    const std::size_t readable = raster.byteSize / sizeof(T) / stride;
    const auto sample = [&](std::size_t index) {
        T value;
        std::memcpy(&value, raster.data + index * sizeof(T), sizeof(T));
        return static_cast<long double>(value);
    };
    Flags flags(pixels, 0);
    for (std::size_t p = 0; p < std::min<std::uint64_t>(pixels, readable); ++p) {
        const auto hit = [&](std::size_t k) { return tests[k].Matches(sample(p * stride + k)); };
        bool valid = rule != 0;
        for (std::size_t k = 0; k < stride; ++k) {
            if (rule == 0) {
                valid = valid || (tests[k].tested && !hit(k));
            } else if (rule == 1) {
                valid = valid && !hit(k);
            } else if (k % 2 == 0) {
                // An odd stride pairs the last sample with the next pixel's first, tested as
                // channel 1; the buffer's last pixel has no next one.
                const bool partner =
                    k + 1 < stride ? hit(k + 1)
                                   : p + 1 < readable && tests[0].Matches(sample((p + 1) * stride));
                valid = valid && !(hit(k) && partner);
            }
        }
        flags[p] = valid ? 1 : 0;
    }
    return flags;
}

/// The reference: the flags of `raster` for final no-data and channel lists.
Flags ReferenceFlags(const Raster& raster, int rule, const std::vector<double>& noData,
                     const std::vector<unsigned int>& channels) {
    const std::uint64_t pixels = PixelCount(raster);
    if (channels.empty() || noData.empty()) {
        return Flags(pixels, 1);  // nothing to test: every pixel valid
    }
    DataType type = raster.dataType;
    std::uint64_t channelCount = raster.channels;
    std::vector<double> values;
    std::vector<std::uint64_t> numbers;
    if (type.isComplex) {
        // Each complex channel c is the pair of channels 2c - 1 (real, the value) and 2c
        // (imaginary, 0); a pixel with any matching channel is one with a matching pair.
        channelCount *= 2;
        rule = rule == 1 ? 2 : rule;
        for (const double v : noData) {
            values.insert(values.end(), {v, 0.0});
        }
        for (const unsigned int c : channels) {
            numbers.insert(numbers.end(), {2 * std::uint64_t{c} - 1, 2 * std::uint64_t{c}});
        }
        type = PartOf(type);
    } else {
        values = noData;
        numbers.assign(channels.begin(), channels.end());
    }
    Flags flags(pixels, 0);  // no element type: every pixel background
    kubo_test::WithComponent(ElementOf(type), [&](auto tag) {
        flags = ElementFlags<typename decltype(tag)::type>(raster, pixels, channelCount, rule,
                                                           values, numbers);
    });
    return flags;
}

/// Lists that are not final yet, as the first raster description met fixes them: the
/// values resized to `count` with copies of the last, channels 1 to `count`; nothing
/// happens without a value.
void Widen(std::vector<double>& noData, std::vector<unsigned int>& channels, unsigned int count) {
    if (!noData.empty()) {
        noData.resize(count, noData.back());
        channels.resize(count);
        std::iota(channels.begin(), channels.end(), 1u);
    }
}

/// A raster of random size and margins whose samples mostly come from `palette`.
Raster MakeRaster(kubo_fuzz::FuzzInput& input, const std::vector<double>& palette,
                  std::mt19937& random) {
    const DataType type = PickType(input);
    const unsigned int channels = 1 + input.Take(6);
    // Now and then just more pixels than one piece of the builder (2048), so that pieces
    // meet inside the raster.
    const bool large = input.Take(16) == 15;
    const unsigned int width = large ? 2040 + input.Take(40) : input.Take(9);
    const unsigned int height = large ? 1 + input.Take(2) : input.Take(6);
    const unsigned int hits = input.Take(9);
    Raster raster(RasterInfo(width, height, channels, type),
                  RasterContext(input.Take(3), input.Take(3), input.Take(5), input.Take(5)));
    input.Fill(raster.data, static_cast<std::size_t>(raster.byteSize));
    // A linear congruential generator seeded from `random` picks the samples: one draw of
    // the twister per sample took most of the time of a run.
    std::uint64_t state = random();
    const auto draw = [&state] {
        state = state * 6364136223846793005u + 1442695040888963407u;
        return static_cast<unsigned int>(state >> 33);
    };
    kubo_test::WithComponent(ElementOf(type.isComplex ? PartOf(type) : type), [&](auto tag) {
        using T = typename decltype(tag)::type;
        for (std::size_t i = 0; i < raster.byteSize / sizeof(T); ++i) {
            if (draw() % 8 < hits) {
                const T value = Stored<T>(palette[draw() % palette.size()]);
                std::memcpy(raster.data + i * sizeof(T), &value, sizeof(T));
            }
        }
    });
    return raster;
}

Flags BitsOf(const Mask& mask) {
    Flags bits(mask.GetBitCount());
    for (unsigned int i = 0; i < mask.GetBitCount(); ++i) {
        bits[i] = mask.GetBit(i) ? 1 : 0;
    }
    const unsigned int used = mask.GetBitCount() % 8;
    Check(used == 0 || (mask.GetBits()[mask.GetByteCount() - 1] & (0xFF >> used)) == 0,
          "the bits after the last pixel are 0");
    return bits;
}

void CheckMask(const MaskDecisionBuilder& builder, const Raster& raster, const Flags& expected) {
    const std::unique_ptr<Mask> mask(builder.BuildMask(raster));
    Check(mask != nullptr && mask->GetByteCount() == (expected.size() + 7) / 8,
          "a mask has a bit for every pixel");
    Check(BitsOf(*mask) == expected, "the mask follows the no-data rules");
}

std::vector<double> NoDataList(kubo_fuzz::FuzzInput& input) {
    std::vector<double> values(input.Take(8));
    for (double& v : values) {
        v = kNoData[input.Take(CountOf(kNoData))];
    }
    return values;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    kubo_fuzz::FuzzInput input(data, size);
    const unsigned int form = input.Take(7);
    const auto rule = static_cast<BkgdRule>(input.Take(4));
    const double v = kNoData[input.Take(CountOf(kNoData))];
    std::vector<double> noData = NoDataList(input);
    std::vector<unsigned int> channels(input.Take(8));
    for (unsigned int& c : channels) {
        c = kChannels[input.Take(CountOf(kChannels))];
    }
    const RasterInfo info(4, 4, input.Take(7), PickType(input));
    const bool expanded = input.Take(2) == 1;
    const bool bound = input.Take(2) == 1;
    std::mt19937 random(input.Take(256) * 256 + input.Take(256));

    // Samples come from the no-data values (some matching after conversion), 0 (the
    // imaginary no-data value) and 1.
    std::vector<double> palette = noData;
    palette.insert(palette.end(), {v, 0.0, 1.0});
    const Raster raster = MakeRaster(input, palette, random);
    const Raster other = MakeRaster(input, palette, random);

    // Each form and the lists it ends up with once bound to `raster`.
    int finalRule = rule;
    std::unique_ptr<MaskDecisionBuilder> builder;
    switch (form) {
        case 0:
            builder = std::make_unique<MaskDecisionBuilder>(info, v);
            finalRule = kora::kubo::BkgdAnyChan;
            noData = {v};
            channels.clear();
            Widen(noData, channels, info.channels);
            break;
        case 1:
            builder = std::make_unique<MaskDecisionBuilder>(v, rule);
            noData = {v};
            channels.clear();
            Widen(noData, channels, raster.channels);
            break;
        case 2:
            builder = std::make_unique<MaskDecisionBuilder>(v, rule, channels);
            noData.assign(channels.size(), v);
            break;
        case 3:
            builder = std::make_unique<MaskDecisionBuilder>(noData, rule);
            channels.resize(noData.size());
            std::iota(channels.begin(), channels.end(), 1u);
            break;
        case 4:
            builder = std::make_unique<MaskDecisionBuilder>(noData, rule, channels);
            break;
        case 5: {
            MaskDecision decision(rule, noData, channels, expanded);
            if (bound) {
                decision.Update(info);
            }
            builder = std::make_unique<MaskDecisionBuilder>(&decision);
            if (!expanded) {
                Widen(noData, channels, bound ? info.channels : raster.channels);
            }
            break;
        }
        default: {
            // No decision: every pixel background.
            const MaskDecisionBuilder none(static_cast<const kora::kubo::IMaskDecision*>(nullptr));
            CheckMask(none, raster, Flags(PixelCount(raster), 0));
            return 0;
        }
    }

    const Flags expected = ReferenceFlags(raster, finalRule, noData, channels);
    CheckMask(*builder, raster, expected);
    const std::unique_ptr<kora::kubo::IMaskDecision> decision(builder->GetDecision()->Clone());
    Flags flags(expected.size() + 1, 0xEE);
    decision->Evaluate(raster, flags.data());
    Check(flags.back() == 0xEE && std::equal(expected.begin(), expected.end(), flags.begin()),
          "a decision's own pass gives the mask's flags");

    // A copy shares the bound decision: its lists stay, its kernel follows the raster.
    const MaskDecisionBuilder copy(*builder);
    CheckMask(copy, other, ReferenceFlags(other, finalRule, noData, channels));
    CheckMask(*builder, raster, expected);
    return 0;
}
