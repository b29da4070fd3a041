// Compresses an arbitrary mask (from a raster with margins, and row by row); every
// decoder must give back 0 and 1 flags: whole, rows, windows (clear past a row's end,
// failing past its start), also after rows are replaced through a copy.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <random>
#include <vector>

#include "fuzzinput.h"
#include "vrkframework/basic/kubo/raster/linerlecompressedbitmask.h"
#include "vrkframework/platform/exception.h"

using kora::kubo::DataType;
using kora::kubo::LineRLECompressedBitMask;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;
using kubo_fuzz::Check;

namespace {

void CheckMask(const LineRLECompressedBitMask& mask, const std::vector<unsigned char>& flags,
               std::mt19937& random) {
    const std::size_t width = mask.GetWidth();
    const std::size_t height = mask.GetHeight();
    std::unique_ptr<unsigned char[]> whole(mask.Decode());
    Check(std::equal(flags.begin(), flags.end(), whole.get()), "whole decoding gives the flags");
    for (std::size_t row = 0; row < height; ++row) {
        std::unique_ptr<unsigned char[]> decoded(mask.DecodeRow(row));
        Check(std::equal(decoded.get(), decoded.get() + width,
                         flags.begin() + static_cast<std::ptrdiff_t>(row * width)),
              "a decoded row is the row's flags");
    }
    const auto pick = [&](std::size_t high) { return static_cast<int>(random() % (high + 1)); };
    for (int i = 0; i < 4; ++i) {
        const int x = pick(width + 1);
        const int y = pick(height);
        const int w = pick(width + 3);
        const int h = pick(height + 1);
        std::vector<unsigned char> window(static_cast<std::size_t>(w * h) + 1, 0xEE);
        // A start fails past a row's runs: past its width, or anywhere but 0 in a row
        // past the last.
        const bool fails =
            h > 0 &&
            (static_cast<std::size_t>(x) > width ||
             (x > 0 && static_cast<std::size_t>(y) + static_cast<std::size_t>(h) > height));
        try {
            mask.Decode(x, y, w, h, window.data());
            Check(!fails, "a start past a row's runs fails");
        } catch (const kora::DataException&) {
            Check(fails, "only a start past a row's runs fails");
            continue;
        }
        for (int r = 0; r < h; ++r) {
            for (int k = 0; k < w; ++k) {
                const std::size_t column = static_cast<std::size_t>(x + k);
                const std::size_t row = static_cast<std::size_t>(y + r);
                const unsigned char flag =
                    row < height && column < width ? flags[row * width + column] : 0;
                Check(window[static_cast<std::size_t>(r * w + k)] == flag,
                      "a window is a slice of the flags, clear past the mask");
            }
        }
        Check(window.back() == 0xEE, "a window writes w x h bytes");
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    kubo_fuzz::FuzzInput input(data, size);
    const unsigned int width = input.Take(80);
    const unsigned int height = input.Take(20);
    const RasterContext margins(input.Take(3), input.Take(3), 0, 0);
    std::mt19937 random(input.Take(256) * 256 + input.Take(256));
    const bool mask = input.Take(2) == 1;
    const unsigned int stretch = 1 + input.Take(300);
    const std::size_t count = std::size_t{width} * height;
    const std::vector<unsigned char> bytes = input.Bytes(count, mask, stretch);
    std::vector<unsigned char> flags(count);
    std::transform(bytes.begin(), bytes.end(), flags.begin(),
                   [](unsigned char byte) { return byte != 0 ? 1 : 0; });

    // The raster holds the bytes in its visible area and noise in its margins.
    Raster raster(RasterInfo(width, height, 1, DataType::Type8U), margins);
    std::generate(raster.data, raster.data + raster.byteSize,
                  [&] { return static_cast<unsigned char>(random()); });
    for (unsigned int row = 0; row < height; ++row) {
        std::copy_n(bytes.begin() + std::ptrdiff_t{row} * width, width,
                    raster.data + (std::size_t{row} + margins.yMargin) * raster.lineStride +
                        margins.xMargin);
    }
    const LineRLECompressedBitMask fromRaster(raster);
    LineRLECompressedBitMask byRows(width, height);
    std::vector<unsigned char> copy = bytes;
    for (unsigned int row = 0; row < height; ++row) {
        byRows.CompressRow(copy.data() + std::size_t{row} * width, row);
        const unsigned int runs = byRows.GetCompressedRowSize(row);
        Check(runs == fromRaster.GetCompressedRowSize(row) &&
                  std::equal(byRows.GetCompressedRow(row), byRows.GetCompressedRow(row) + runs,
                             fromRaster.GetCompressedRow(row)),
              "both constructions give the same runs");
        std::size_t pixels = 0;
        for (unsigned int i = 0; i < runs; ++i) {
            pixels += byRows.GetCompressedRow(row)[i];
        }
        Check(pixels == width, "a row's runs add up to its width");
    }
    CheckMask(fromRaster, flags, random);

    // Rows replaced through a copy are seen by the original.
    LineRLECompressedBitMask shared(byRows);
    for (unsigned int i = 0; i < height; ++i) {
        const unsigned int row = static_cast<unsigned int>(random() % height);
        std::vector<unsigned char> replacement = input.Bytes(width, random() % 2 == 0, 1 + i);
        std::rotate(replacement.begin(), replacement.begin() + i % (width + 1), replacement.end());
        shared.CompressRow(replacement.data(), row);
        std::transform(replacement.begin(), replacement.end(),
                       flags.begin() + std::ptrdiff_t{row} * width,
                       [](unsigned char byte) { return byte != 0 ? 1 : 0; });
    }
    CheckMask(byRows, flags, random);
    return 0;
}
