// Compresses arbitrary bytes as a raster of arbitrary layout and margins; every decoder
// must give them back: whole, one-row windows as slices of the stream, other windows as
// the running-total rule defines them (past the stream included), and the allocating
// window decoder as a prefix of that.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <random>
#include <vector>

#include "fuzzinput.h"
#include "support/compressedsamples.h"
#include "vrkframework/basic/kubo/raster/rlecompresseddata.h"

using kora::kubo::DataType;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;
using kora::kubo::RLECompressedData;
using kubo_fuzz::Check;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    kubo_fuzz::FuzzInput input(data, size);
    const DataType types[] = {DataType::Type8U, DataType::Type16S, DataType::Type32R,
                              DataType::Type64U, DataType(12, false, false, 12, 0, false)};
    RasterInfo info(input.Take(40), input.Take(20), 1 + input.Take(3), types[input.Take(5)]);
    RasterContext context(input.Take(3), input.Take(3), 0, 0);
    std::mt19937 random(input.Take(256) * 256 + input.Take(256));
    const bool mask = input.Take(2) == 1;
    const unsigned int stretch = 1 + input.Take(300);
    const unsigned int width = info.width + 2 * context.xMargin;
    const unsigned int height = info.height + 2 * context.yMargin;
    const unsigned int pixel = info.channels * ((info.dataType.bits + 7) / 8);
    const std::size_t rasterSize = std::size_t{width} * height * pixel;
    std::vector<unsigned char> bytes = input.Bytes(rasterSize, mask, stretch);
    bytes.push_back(0);  // a valid address for an empty raster

    const RLECompressedData compressed(bytes.data(), info, context);
    bytes.pop_back();
    const unsigned char* pairs = compressed.GetCompressedData();
    const std::size_t pairBytes = compressed.GetCompressedSize();
    std::size_t total = 0;
    for (std::size_t i = 0; i < pairBytes; i += 2) {
        Check(pairs[i] >= 1, "counts are 1 to 255");
        Check(i == 0 || pairs[i + 1] != pairs[i - 1] || pairs[i - 2] == 255,
              "a value repeats only after a full pair");
        total += pairs[i];
    }
    Check(total == rasterSize, "the counts cover the raster");

    std::unique_ptr<unsigned char[]> whole(compressed.Decode());
    Check(std::equal(bytes.begin(), bytes.end(), whole.get()), "whole decoding restores the bytes");
    std::vector<unsigned char> out(rasterSize + 1, 0xEE);
    compressed.Decode(out.data());
    Check(std::equal(bytes.begin(), bytes.end(), out.begin()) && out.back() == 0xEE,
          "decoding into a buffer restores the bytes and stops at their end");

    const auto pick = [&](int low, int high) {
        return low + static_cast<int>(random() % static_cast<unsigned int>(high - low + 1));
    };
    for (int i = 0; i < 4; ++i) {
        // Mostly inside the raster, sometimes around or past it.
        const int x = pick(-2, static_cast<int>(width) + 1);
        const int y = pick(-1, static_cast<int>(height) + 1);
        const int w = pick(-1, static_cast<int>(width * pixel) + 9);
        const int h = pick(0, static_cast<int>(height) + 2);
        const std::vector<unsigned char> expected =
            kubo_test::PairWindowReference(pairs, pairBytes, width, pixel, x, y, w, h);
        std::vector<unsigned char> window(expected.size() + 1, 0xEE);
        compressed.Decode(x, y, w, h, window.data());
        Check(std::equal(expected.begin(), expected.end(), window.begin()) && window.back() == 0xEE,
              "window decoding follows the running-total rule");
        std::unique_ptr<unsigned char[]> allocated(compressed.Decode(x, y, w, h));
        const std::size_t written = std::min(expected.size(), rasterSize);
        Check(std::equal(expected.begin(), expected.begin() + static_cast<std::ptrdiff_t>(written),
                         allocated.get()),
              "the allocating window decoder fills its buffer as far as it goes");

        if (x >= 0 && y >= 0 && static_cast<unsigned int>(y) < height &&
            static_cast<unsigned int>(x) < width && w >= 0) {
            const std::size_t start =
                (std::size_t{static_cast<unsigned int>(y)} * width + static_cast<unsigned int>(x)) *
                pixel;
            const std::size_t count =
                std::min<std::size_t>(static_cast<std::size_t>(w), rasterSize - start);
            std::vector<unsigned char> row(count + 1, 0xEE);
            compressed.Decode(x, y, static_cast<int>(count), 1, row.data());
            Check(
                std::equal(bytes.begin() + static_cast<std::ptrdiff_t>(start),
                           bytes.begin() + static_cast<std::ptrdiff_t>(start + count), row.begin()),
                "a one-row window is the stream from its start");
        }
    }
    const RLECompressedData copy(compressed);
    Check(copy.GetCompressedData() == pairs, "copies share the pairs");
    return 0;
}
