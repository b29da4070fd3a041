// The thread-safety contract of docs/architecture.md: each class's documented-safe operations
// run from four threads at once, started together, and give what one thread alone gives.
// Built with ThreadSanitizer (preset tsan) any unsynchronised access fails the run.
#include <gtest/gtest.h>

#include <atomic>
#include <cmath>
#include <cstdint>
#include <cstring>  // std::memcpy
#include <functional>
#include <memory>
#include <thread>
#include <vector>

#include "vrkframework/basic/kubo/kubo.h"

namespace {

using namespace kora::kubo;
using Bytes = std::vector<unsigned char>;

constexpr std::size_t kThreads = 4;
constexpr int kRounds = 20;

// Runs work(thread) on kThreads threads released at the same moment.
void OnFourThreads(const std::function<void(std::size_t)>& work) {
    std::atomic<std::size_t> ready{0};
    std::vector<std::thread> threads;
    for (std::size_t thread = 0; thread < kThreads; ++thread) {
        threads.emplace_back([&, thread] {
            ++ready;
            while (ready.load() < kThreads) {
                std::this_thread::yield();
            }
            work(thread);
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
}

// A 16U terrain with a no-data (0) border and holes, the kind of raster the module masks.
Raster Terrain(unsigned int width, unsigned int height, unsigned int margin = 0) {
    Raster raster(RasterInfo(width, height, 1, DataType::Type16U),
                  RasterContext(margin, margin, 0, 0));
    for (std::uint64_t i = 0; i < raster.byteSize / 2; ++i) {
        const std::uint16_t value = i % 7 == 0 || i % 97 < 5 ? 0 : static_cast<std::uint16_t>(i);
        std::memcpy(raster.data + 2 * i, &value, 2);
    }
    return raster;
}

Bytes Flags(const Mask& mask) {
    Bytes flags(mask.GetBitCount());
    for (unsigned int bit = 0; bit < mask.GetBitCount(); ++bit) {
        flags[bit] = mask.GetBit(bit) ? 1 : 0;
    }
    return flags;
}

// First: the kernel variant is chosen on first use, which four threads race for here.
TEST(ThreadSafety, KernelsChosenOnFirstUseFromFourThreads) {
    const Raster terrain = Terrain(300, 40);
    std::vector<Bytes> converted(kThreads);
    std::vector<Bytes> masks(kThreads);
    OnFourThreads([&](std::size_t thread) {
        const PromoteFactory factory;
        const std::unique_ptr<typeconv::IPromote> kernel(
            factory.Create(DataType::Type16U, DataType::Type8U));
        converted[thread].resize(300 * 40);
        kernel->Promote(terrain.data, converted[thread].data(), 300 * 40);
        const MaskDecisionBuilder builder(0.0, BkgdAllChans);  // one builder per thread
        const std::unique_ptr<Mask> mask(builder.BuildMask(terrain));
        masks[thread] = Flags(*mask);
    });
    for (std::size_t thread = 1; thread < kThreads; ++thread) {
        EXPECT_EQ(converted[thread], converted[0]);
        EXPECT_EQ(masks[thread], masks[0]);
    }
}

TEST(ThreadSafety, OneConverterServesFourThreads) {
    const PromoteFactory factory;
    const std::unique_ptr<typeconv::IPromote> kernel(
        factory.Create(DataType::Type32R, DataType::Type16S));
    std::vector<float> source(4099);
    for (std::size_t i = 0; i < source.size(); ++i) {
        source[i] = static_cast<float>(i) * 17.25f - 30000.0f;
    }
    std::vector<std::vector<std::int16_t>> out(kThreads, std::vector<std::int16_t>(source.size()));
    OnFourThreads([&](std::size_t thread) {
        for (int round = 0; round < kRounds; ++round) {
            kernel->Promote(source.data(), out[thread].data(),
                            static_cast<unsigned int>(source.size()));
            EXPECT_EQ(factory.Create(DataType::Type16S, DataType::Type16S), nullptr);
            EXPECT_EQ(PromoteType({DataType::Type16S, DataType::Type16U}), DataType::Type32S);
        }
    });
    for (std::size_t thread = 1; thread < kThreads; ++thread) {
        EXPECT_EQ(out[thread], out[0]);
    }
}

TEST(ThreadSafety, TablesLookUpFromFourThreads) {
    const LUT stretch({{200.0, 0.0}, {1000.0, 100.0}, {3800.0, 255.0}});
    using Colour = RGBTuple<unsigned char>;
    const PCT palette(
        {{0.0, Colour{0, 0, 0}}, {128.0, Colour{40, 200, 9}}, {255.0, Colour{255, 255, 255}}});
    std::vector<double> sums(kThreads);
    OnFourThreads([&](std::size_t thread) {
        for (int value = 0; value < 4000; ++value) {
            const Colour colour = palette.GetValue(value % 256);
            sums[thread] += stretch.GetValue(value) + colour.r + colour.g + colour.b;
        }
    });
    for (std::size_t thread = 1; thread < kThreads; ++thread) {
        EXPECT_EQ(sums[thread], sums[0]);
    }
}

TEST(ThreadSafety, MasksAndTheirBuildersReadFromFourThreads) {
    const Raster terrain = Terrain(200, 30);
    const std::unique_ptr<Mask> mask(MaskDecisionBuilder(0.0, BkgdAllChans).BuildMask(terrain));
    CoordinateMaskBuilder coordinates;
    for (int i = 0; i < 50; ++i) {
        coordinates.AddValidCoordinate(i % 30, (i * 37) % 200);
    }
    const Bytes expected = Flags(*mask);
    const Bytes fromCoordinates = Flags(*std::unique_ptr<Mask>(coordinates.BuildMask(terrain)));
    OnFourThreads([&](std::size_t) {
        for (int round = 0; round < kRounds; ++round) {
            EXPECT_EQ(Flags(*mask), expected);
            EXPECT_EQ(Flags(*std::unique_ptr<Mask>(coordinates.BuildMask(terrain))),
                      fromCoordinates);
        }
    });
}

// The byte runs and the row runs decode from one shared object; the bit runs move a cursor,
// so each thread decodes through its own copy, which shares the compressed bytes.
TEST(ThreadSafety, CompressedFormsDecodeFromFourThreads) {
    Raster terrain = Terrain(256, 24);
    RasterInfo info(256, 24, 1, DataType::Type16U);
    RasterContext context;
    const RLECompressedData bytes(terrain.data, info, context);
    const std::unique_ptr<Mask> mask(MaskDecisionBuilder(0.0, BkgdAllChans).BuildMask(terrain));
    Bytes flags = Flags(*mask);
    Raster flagRaster(RasterInfo(256, 24, 1, DataType::Type8U), RasterContext());
    std::memcpy(flagRaster.data, flags.data(), flags.size());
    const LineRLECompressedBitMask rows(flagRaster);
    RasterInfo bitInfo(256, 24, 1, DataType::Type8U);
    const BitwiseRLECompressedData bits(flags.data(), bitInfo);

    Bytes wholeBytes(terrain.byteSize);
    bytes.Decode(wholeBytes.data());
    Bytes wholeRows(flags.size());
    rows.Decode(wholeRows.data());
    OnFourThreads([&](std::size_t thread) {
        const BitwiseRLECompressedData ownBits(bits);
        for (int round = 0; round < kRounds; ++round) {
            const int x = static_cast<int>(thread * 13 + static_cast<std::size_t>(round) * 7) % 200;
            const int y = static_cast<int>(thread + static_cast<std::size_t>(round)) % 20;
            Bytes out(wholeBytes.size());
            bytes.Decode(out.data());
            EXPECT_EQ(out, wholeBytes);
            Bytes fromBits(16 * 3);
            ownBits.Decode(x, y, 16, 3, fromBits.data());
            Bytes fromRows(16 * 3);
            rows.Decode(x, y, 16, 3, fromRows.data());
            for (int line = 0; line < 3; ++line) {
                const unsigned char* expected = wholeRows.data() + (y + line) * 256 + x;
                EXPECT_EQ(0, std::memcmp(fromBits.data() + line * 16, expected, 16));
                EXPECT_EQ(0, std::memcmp(fromRows.data() + line * 16, expected, 16));
            }
        }
    });
}

// Objects with a cache (interpretation, no-data decision) are safe one per thread; margins
// are filled in place, each thread on its own raster.
TEST(ThreadSafety, OneInterpretationAndOneMarginFillPerThread) {
    Raster radar(RasterInfo(64, 16, 1, DataType::TypeC16S), RasterContext());
    for (std::uint64_t i = 0; i < radar.byteSize / 2; ++i) {
        const auto value = static_cast<std::int16_t>(i * 31 % 2001 - 1000);
        std::memcpy(radar.data + 2 * i, &value, 2);
    }
    std::vector<Bytes> amplitudes(kThreads);
    std::vector<Bytes> filled(kThreads);
    OnFourThreads([&](std::size_t thread) {
        const ComplexInterpretation interpretation;
        for (int round = 0; round < kRounds; ++round) {
            const std::unique_ptr<Raster> amplitude(
                interpretation.InterpretRaster(&radar, kora::core::INTERPRETATION_AMPLITUDE));
            amplitudes[thread].assign(amplitude->data, amplitude->data + amplitude->byteSize);
        }
        Raster padded = Terrain(40, 20, 3);
        FillRasterMargins(&padded, MARGIN_MIRROR, MARGIN_ALL);
        filled[thread].assign(padded.data, padded.data + padded.byteSize);
    });
    for (std::size_t thread = 1; thread < kThreads; ++thread) {
        EXPECT_EQ(amplitudes[thread], amplitudes[0]);
        EXPECT_EQ(filled[thread], filled[0]);
    }
}

TEST(ThreadSafety, ControlPointsReadAndCopiedFromFourThreads) {
    ControlPointContainer container;
    for (unsigned int id = 1; id <= 8; ++id) {
        ControlPoint point(id);
        GroundLocation ground;
        ground.SetCoords(id * 10.0, id * 20.0, id * 1.5);
        point.SetGroundLocation(ground);
        container.GetControlPoints().push_back(point);
    }
    container.GetKVPMetadata()["Sensor"] = "frame camera";
    const ControlPointContainer& shared = container;
    OnFourThreads([&](std::size_t) {
        for (int round = 0; round < kRounds; ++round) {
            const ControlPointContainer copy(shared);
            EXPECT_EQ(copy.GetControlPoints().size(), 8u);
            EXPECT_EQ(copy.GetControlPoints()[3], shared.GetControlPoints()[3]);
            EXPECT_EQ(shared.GetKVPMetadata().count("SENSOR"), 1u);
        }
    });
}

}  // namespace
