#include "vrkframework/basic/kubo/raster/raster.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <memory>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "support/expectfailure.h"
#include "vrkframework/platform/rasterreader.h"

namespace {

using namespace kora::kubo;

// Records the order of the queries.
class FakeReader : public kora::datasources::IRasterReader {
public:
    unsigned int GetWidth() const override { return Record('w', 640); }
    unsigned int GetHeight() const override { return Record('h', 480); }
    unsigned int GetChannelCount() const override { return Record('c', 3); }
    const DataType& GetDataType() const override {
        calls += 't';
        return DataType::TypeC16S;
    }
    mutable std::string calls;

private:
    unsigned int Record(char call, unsigned int value) const {
        calls += call;
        return value;
    }
};

TEST(RasterInfo, FromAReaderAsksWidthHeightChannelsAndTypeInOrder) {
    const FakeReader reader;
    const RasterInfo info(reader);
    EXPECT_EQ(reader.calls, "whct");
    EXPECT_EQ(info.width * 1000 + info.height, 640480u);
    EXPECT_EQ(info.channels, 3u);
    EXPECT_EQ(info.dataType, DataType::TypeC16S);
    const RasterInfo none;
    EXPECT_EQ(none.width + none.height + none.channels, 0u);
    EXPECT_EQ(none.dataType, DataType());
}

TEST(Raster, DefaultWrapsNothing) {
    const Raster raster;
    EXPECT_EQ(raster.lineStride + raster.bufferHeight + raster.width + raster.xMargin, 0u);
    EXPECT_EQ(raster.data, nullptr);
    EXPECT_EQ(raster.byteSize, 0u);
    EXPECT_FALSE(raster.ownsData);
}

TEST(Raster, SizesIncludeMarginsAndRoundSampleBytesUp) {
    struct Case {
        DataType type;
        unsigned int channels;
        std::uint64_t pixelBytes;
    };
    const Case cases[] = {
        {DataType::Type8U, 1, 1},    {DataType::Type1U, 1, 1},
        {DataType::Type16S, 3, 6},   {DataType::TypeC32R, 2, 16},
        {DataType::TypeC64R, 1, 16}, {DataType(12, false, false, 12, 0, false), 1, 2}};
    for (const Case& c : cases) {
        const Raster raster(RasterInfo(10, 7, c.channels, c.type), RasterContext(2, 3, 100, 200));
        EXPECT_EQ(raster.lineStride, 14u);
        EXPECT_EQ(raster.bufferHeight, 13u);
        EXPECT_EQ(raster.byteSize, 14u * 13u * c.pixelBytes);
        EXPECT_TRUE(raster.ownsData);
        EXPECT_EQ(raster.xOffset + raster.yOffset, 300u);
        EXPECT_EQ(raster.dataType, c.type);
        raster.data[raster.byteSize - 1] = 0xff;  // the whole extent is writable
    }
}

// Line stride and buffer height are 32-bit fields and the byte count a 64-bit one: an
// extent beyond them (a negative margin cast to unsigned, most often) is refused before
// anything is allocated, with the full extent in the message.
TEST(Raster, RefusesExtentsItsFieldsCannotDescribe) {
    const struct {
        RasterInfo info;
        RasterContext context;
        const char* message;
        std::vector<int> values;
    } cases[] = {
        {RasterInfo(10, 7, 1, DataType::Type8U),
         RasterContext(static_cast<unsigned int>(-3), 0, 0, 0),
         "A raster of 8589934596 x 7 pixels (margins included) exceeds 4294967295 pixels a side",
         {INT_MAX, 7}},
        {RasterInfo(10, 4294967295u, 1, DataType::Type8U),
         RasterContext(0, 1, 0, 0),
         "A raster of 10 x 4294967297 pixels (margins included) exceeds 4294967295 pixels a side",
         {10, INT_MAX}},
        {RasterInfo(4294967295u, 4294967295u, 4294967295u, DataType::TypeC64R),
         RasterContext(),
         "A raster of 4294967295 x 4294967295 pixels (margins included) exceeds 2^64 bytes",
         {INT_MAX, INT_MAX}},
    };
    for (const auto& c : cases) {
        const auto failure = kubo_test::Catch<kora::OutOfBoundsException>(
            [&] { const Raster raster(c.info, c.context); });
        ASSERT_TRUE(failure.has_value()) << c.message;
        kubo_test::ExpectReport(*failure, c.message, "vrkframework/basic/kubo/raster/raster",
                                "__cdecl kora::kubo::Raster::Raster(const class "
                                "kora::kubo::RasterInfo &,const class kora::kubo::RasterContext &)",
                                0);
        EXPECT_EQ(failure->GetValues(), c.values);
    }
}

// A wrapping raster is described exactly as an owning one of the same shape, over the
// caller's buffer, which it never frees.
TEST(Raster, WrapRasterDescribesTheCallersBufferLikeAnOwningRaster) {
    const RasterInfo info(10, 7, 3, DataType::TypeC16S);
    const RasterContext context(2, 1, 30, 40);
    const Raster owning(info, context);
    std::vector<unsigned char> buffer(owning.byteSize);
    const Raster wrapped = WrapRaster(buffer.data(), info, context);
    EXPECT_EQ(std::make_tuple(wrapped.width, wrapped.height, wrapped.channels, wrapped.xMargin,
                              wrapped.yMargin, wrapped.xOffset, wrapped.yOffset, wrapped.lineStride,
                              wrapped.bufferHeight, wrapped.byteSize),
              std::make_tuple(owning.width, owning.height, owning.channels, owning.xMargin,
                              owning.yMargin, owning.xOffset, owning.yOffset, owning.lineStride,
                              owning.bufferHeight, owning.byteSize));
    EXPECT_EQ(wrapped.dataType, info.dataType);
    EXPECT_EQ(wrapped.data, buffer.data());
    EXPECT_FALSE(wrapped.ownsData);
    const auto failure = kubo_test::Catch<kora::OutOfBoundsException>([] {
        WrapRaster(nullptr, RasterInfo(4294967295u, 1, 1, DataType::Type8U),
                   RasterContext(1, 0, 0, 0));
    });
    ASSERT_TRUE(failure.has_value());
    EXPECT_EQ(failure->GetFunction(),
              "class kora::kubo::Raster __cdecl kora::kubo::WrapRaster(unsigned char *,const class "
              "kora::kubo::RasterInfo &,const class kora::kubo::RasterContext &)");
}

TEST(Raster, ForeignBuffersAreNeverFreed) {
    auto buffer = std::make_unique<unsigned char[]>(16);
    buffer[0] = 7;
    {
        Raster wrapper;
        wrapper.data = buffer.get();
        wrapper.byteSize = 16;
        const Raster copy(wrapper);  // wraps the same buffer
        EXPECT_EQ(copy.data, buffer.get());
        EXPECT_FALSE(copy.ownsData);
        Raster ownerless;
        ownerless.ownsData = true;  // null data with ownership frees nothing
    }
    EXPECT_EQ(buffer[0], 7);
}

TEST(Raster, CopiesOwnTheirBuffersAndMovesTransferThem) {
    Raster source(RasterInfo(3, 2, 1, DataType::Type16U), RasterContext(1, 1, 0, 0));
    for (unsigned int i = 0; i < source.byteSize; ++i) {
        source.data[i] = static_cast<unsigned char>(i + 1);
    }
    Raster copy(source);
    ASSERT_NE(copy.data, source.data);
    EXPECT_TRUE(copy.ownsData);
    EXPECT_EQ(0, std::memcmp(copy.data, source.data, source.byteSize));

    Raster assigned(RasterInfo(1, 1, 1, DataType::Type8U), RasterContext());
    assigned = source;
    EXPECT_NE(assigned.data, source.data);
    EXPECT_EQ(assigned.dataType, DataType::Type16U);
    const Raster& alias = assigned;
    assigned = alias;  // self-assignment keeps the buffer
    EXPECT_EQ(assigned.data[1], 2);

    unsigned char* buffer = copy.data;
    Raster moved(std::move(copy));
    EXPECT_EQ(moved.data, buffer);
    EXPECT_FALSE(copy.ownsData);  // NOLINT(bugprone-use-after-move): the moved-from state
    assigned = std::move(moved);
    EXPECT_EQ(assigned.data, buffer);
}

}  // namespace
