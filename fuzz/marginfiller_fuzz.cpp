// Fills the margins of rasters of random geometry, sample layout and contents, twice, with
// random behaviours and band sets (unknown bits included, margins up to past the image):
// the buffer must equal the pixel rules applied to a copy, and a behaviour other than 1, 2
// or 3 must fail with its report before anything is written.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <random>

#include "fuzzfailure.h"
#include "fuzzinput.h"
#include "support/marginreference.h"
#include "vrkframework/basic/kubo/raster/marginfiller.h"
#include "vrkframework/basic/kubo/raster/raster.h"

using kora::kubo::DataType;
using kora::kubo::Raster;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;
using kubo_fuzz::Check;

namespace {

// Only the width and the complex flag matter to byte copies. Whole sample widths mostly;
// otherwise any width from 0 to 64 bits, where 1U and the other widths below 8 have pixels
// of no whole byte and packed widths start pixels inside bytes.
DataType TakeType(kubo_fuzz::FuzzInput& input) {
    constexpr unsigned int kWholeBits[] = {8, 16, 32, 64};
    const unsigned int bits = input.Take(3) != 0 ? kWholeBits[input.Take(4)] : input.Take(65);
    return DataType(bits, false, false, bits, 0, input.Take(3) == 0);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    kubo_fuzz::FuzzInput input(data, size);
    const DataType type = TakeType(input);
    const unsigned int channels = 1 + input.Take(4);
    const unsigned int width = input.Take(13);
    const unsigned int height = input.Take(13);
    // Margins reach a few pixels past the image.
    const RasterContext margins(input.Take(width + 4), input.Take(height + 4), 0, 0);
    Raster raster(RasterInfo(width, height, channels, type), margins);
    std::mt19937 random(input.Take(256) * 256 + input.Take(256));
    std::generate(raster.data, raster.data + raster.byteSize,
                  [&] { return static_cast<unsigned char>(random()); });
    Raster expected(raster);

    for (int pass = 0; pass < 2; ++pass) {
        const unsigned int behaviour = input.Take(5);
        const unsigned int bands = input.Take(256) | (input.Take(4) == 0 ? 0xFFFFFF00u : 0u);
        const auto fill = [&] {
            kora::kubo::FillRasterMargins(&raster, static_cast<eMarginBehaviour>(behaviour), bands);
        };
        if (behaviour == 0 || behaviour > 3) {
            const auto failure =
                kubo_fuzz::ExpectFailure<kora::Exception>(fill, "another behaviour fails");
            kubo_fuzz::CheckReport(failure, "Invalid margin behavior requested.",
                                   "vrkframework/basic/kubo/raster/marginfiller",
                                   "void __cdecl kora::kubo::FillRasterMargins(class "
                                   "kora::kubo::Raster *const ,enum eMarginBehaviour,unsigned int)",
                                   40);
        } else {
            fill();
            kubo_test::ReferenceFillMargins(expected, static_cast<int>(behaviour), bands);
        }
        Check(std::equal(raster.data, raster.data + raster.byteSize, expected.data),
              "the buffer is the pixel rules applied in band order");
    }
    return 0;
}
