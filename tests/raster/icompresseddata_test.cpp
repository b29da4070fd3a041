#include "vrkframework/basic/kubo/raster/icompresseddata.h"

#include <gtest/gtest.h>

#include <memory>

#include "support/compressedsamples.h"
#include "vrkframework/basic/kubo/raster/bitwiserlecompresseddata.h"
#include "vrkframework/basic/kubo/raster/linerlecompressedbitmask.h"
#include "vrkframework/basic/kubo/raster/rlecompresseddata.h"

namespace {

using kora::kubo::BitwiseRLECompressedData;
using kora::kubo::DataType;
using kora::kubo::ICompressedData;
using kora::kubo::LineRLECompressedBitMask;
using kora::kubo::RasterContext;
using kora::kubo::RasterInfo;
using kora::kubo::RLECompressedData;
using kubo_test::Bytes;

// Every compressed raster decodes through the interface, each overload reaching its own
// implementation, and is destroyed through it.
TEST(ICompressedData, EachDecodeOverloadReachesTheImplementation) {
    // A 6 x 4 mask of 0 and 1 bytes: all three classes restore it exactly.
    Bytes bytes = kubo_test::RunBytes(6 * 4, 1, {0, 1}, 5);
    RasterInfo info(6, 4, 1, DataType::Type8U);
    RasterContext context;
    std::unique_ptr<ICompressedData> objects[] = {
        std::make_unique<RLECompressedData>(bytes.data(), info, context),
        std::make_unique<BitwiseRLECompressedData>(bytes.data(), info),
        std::make_unique<LineRLECompressedBitMask>(6u, 4u)};
    for (unsigned long row = 0; row < 4; ++row) {
        dynamic_cast<LineRLECompressedBitMask&>(*objects[2])
            .CompressRow(bytes.data() + 6 * row, row);
    }
    EXPECT_NE(dynamic_cast<RLECompressedData*>(objects[0].get()), nullptr);
    EXPECT_NE(dynamic_cast<BitwiseRLECompressedData*>(objects[1].get()), nullptr);
    for (const auto& object : objects) {
        const ICompressedData& data = *object;
        EXPECT_EQ(kubo_test::Take(data.Decode(), bytes.size()), bytes);
        Bytes whole(bytes.size());
        data.Decode(whole.data());
        EXPECT_EQ(whole, bytes);
        // One row of a window is a slice in every class.
        EXPECT_EQ(kubo_test::Take(data.Decode(2, 1, 3, 1), 3),
                  kubo_test::Slice(bytes, 6, 2, 1, 3, 1));
        Bytes window(3);
        data.Decode(1, 2, 3, 1, window.data());
        EXPECT_EQ(window, kubo_test::Slice(bytes, 6, 1, 2, 3, 1));
    }
}

}  // namespace
