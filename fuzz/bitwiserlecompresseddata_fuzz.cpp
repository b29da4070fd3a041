// Compresses arbitrary bytes as bit runs; every decoder must give them back: whole, and
// windows in any order or side by side through the one read cursor (rows read as bytes,
// placed by pixels), failing only where the rules say so: outside the raster, and for a
// row that starts inside the last run or before the stream.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "fuzzinput.h"
#include "vrkframework/basic/kubo/raster/bitwiserlecompresseddata.h"
#include "vrkframework/platform/exception.h"

using kora::kubo::BitwiseRLECompressedData;
using kora::kubo::DataType;
using kora::kubo::RasterInfo;
using kubo_fuzz::Check;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    kubo_fuzz::FuzzInput input(data, size);
    const DataType types[] = {DataType::Type8U, DataType::Type16U, DataType::Type32S};
    RasterInfo info(input.Take(48), input.Take(24), 1 + input.Take(3), types[input.Take(3)]);
    std::mt19937 random(input.Take(256) * 256 + input.Take(256));
    const bool mask = input.Take(2) == 1;
    const unsigned int stretch = 1 + input.Take(200);
    const long long sample = (info.dataType.bits + 7) / 8;
    const long long pixel = sample * info.channels;
    const long long line = pixel * info.width;
    const auto rasterSize = static_cast<std::size_t>(line * info.height);
    std::vector<unsigned char> bytes = input.Bytes(rasterSize, mask, stretch);
    bytes.push_back(0);  // a valid address for an empty raster

    const BitwiseRLECompressedData compressed(bytes.data(), info);
    bytes.pop_back();
    const unsigned char* runs = compressed.GetCompressedData();
    const std::size_t runCount = compressed.GetCompressedSize();
    std::size_t bits = 0;
    for (std::size_t i = 0; i < runCount; ++i) {
        Check(runs[i] != 0 || i == 0 || runs[i - 1] == 255, "a 0 comes first or after a 255");
        bits += runs[i];
    }
    Check(bits == 8 * rasterSize, "the runs cover the raster");
    const long long lastRunStart = static_cast<long long>(bits) - runs[runCount - 1];

    std::unique_ptr<unsigned char[]> whole(compressed.Decode());
    Check(std::equal(bytes.begin(), bytes.end(), whole.get()), "whole decoding restores the bytes");
    std::vector<unsigned char> out(rasterSize + 1, 0xEE);
    compressed.Decode(out.data());
    Check(std::equal(bytes.begin(), bytes.end(), out.begin()) && out.back() == 0xEE,
          "decoding into a buffer restores the bytes and stops at their end");

    const auto pick = [&](long long low, long long high) {
        return static_cast<int>(
            low + static_cast<long long>(random() % static_cast<unsigned long>(high - low + 1)));
    };
    const long long width = info.width;
    const long long height = info.height;
    int lastX = 0;
    int lastY = 0;
    int lastW = 0;
    for (int i = 0; i < 6; ++i) {
        // Every other window starts where the last one ended, on the same rows, as tiles
        // decoded side by side do.
        const bool beside = i % 2 == 1 && lastW > 0;
        const int x = beside ? lastX + lastW : pick(-2, width + 1);
        const int y = beside ? lastY : pick(-1, height);
        const int w = pick(-1, width + 1);
        const int h = pick(-1, height + 1);
        lastX = x;
        lastY = y;
        lastW = w;
        const bool inside = y < height && y + h <= height && x < width && x + w <= width;
        const long long rowBytes = std::max(w, 0);
        const long long rows = std::max(h, 0);
        const long long spacing = rowBytes * pixel;
        std::vector<unsigned char> window(
            static_cast<std::size_t>(rows > 0 ? (rows - 1) * spacing + rowBytes + 1 : 1), 0xEE);
        std::vector<unsigned char> expected = window;
        bool startsInLastRun = false;
        bool beforeTheStream = false;
        for (long long r = 0; inside && r < rows; ++r) {
            const long long offset = (y + r) * line + x;
            beforeTheStream = beforeTheStream || offset < 0;
            startsInLastRun = startsInLastRun || 8 * offset > lastRunStart;
            for (long long k = 0; k < rowBytes && offset >= 0; ++k) {
                expected[static_cast<std::size_t>(r * spacing + k)] =
                    bytes[static_cast<std::size_t>(offset + k)];
            }
        }
        try {
            compressed.Decode(x, y, w, h, window.data());
            Check(inside, "windows outside the raster fail");
            Check(window == expected, "window rows are the bytes at their offsets");
        } catch (const kora::OutOfBoundsException& failure) {
            Check(!inside && failure.GetValues() == std::vector<int>{x, y, w, w},
                  "only windows outside the raster fail the check, reporting x, y, w, w");
        } catch (const kora::DataException& failure) {
            Check(inside && (startsInLastRun || beforeTheStream) &&
                      std::string(failure.what()) == "Uncompressed index not found.",
                  "seeks fail only into the last run or before the stream");
        }
    }
    BitwiseRLECompressedData copy(compressed);
    Check(copy.GetCompressedData() == runs, "copies share the runs");
    return 0;
}
