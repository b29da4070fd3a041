#include "vrkframework/basic/kubo/raster/raster.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <utility>

#include "vrkframework/platform/rasterreader.h"

namespace {

using namespace kora::kubo;

class FakeReader : public kora::datasources::IRasterReader {
public:
    unsigned int GetWidth() const override { return Record('w', 640); }
    unsigned int GetHeight() const override { return Record('h', 480); }
    unsigned int GetChannelCount() const override { return Record('c', 3); }
    const DataType& GetDataType() const override {
        m_calls += 't';
        return DataType::TypeC16S;
    }
    const std::string& Calls() const { return m_calls; }

private:
    unsigned int Record(char call, unsigned int value) const {
        m_calls += call;
        return value;
    }
    mutable std::string m_calls;
};

TEST(RasterInfo, DefaultIsAllZero) {
    const RasterInfo info;
    EXPECT_EQ(info.width, 0u);
    EXPECT_EQ(info.height, 0u);
    EXPECT_EQ(info.channels, 0u);
    EXPECT_EQ(info.dataType, DataType());
}

TEST(RasterInfo, AsksTheReaderForWidthHeightChannelsAndTypeInThatOrder) {
    const FakeReader reader;
    const RasterInfo info(reader);
    EXPECT_EQ(reader.Calls(), "whct");
    EXPECT_EQ(info.width, 640u);
    EXPECT_EQ(info.height, 480u);
    EXPECT_EQ(info.channels, 3u);
    EXPECT_EQ(info.dataType, DataType::TypeC16S);
}

TEST(RasterContext, DefaultIsAllZeroAndValuesKeepTheirOrder) {
    const RasterContext none;
    EXPECT_EQ(none.xMargin + none.yMargin + none.xOffset + none.yOffset, 0u);
    const RasterContext context(1, 2, 3, 4);
    EXPECT_EQ(context.xMargin, 1u);
    EXPECT_EQ(context.yMargin, 2u);
    EXPECT_EQ(context.xOffset, 3u);
    EXPECT_EQ(context.yOffset, 4u);
}

TEST(Raster, DefaultWrapsNothing) {
    const Raster raster;
    EXPECT_EQ(raster.lineStride, 0u);
    EXPECT_EQ(raster.bufferHeight, 0u);
    EXPECT_EQ(raster.data, nullptr);
    EXPECT_EQ(raster.byteSize, 0u);
    EXPECT_FALSE(raster.ownsData);
    EXPECT_EQ(raster.width, 0u);
    EXPECT_EQ(raster.xMargin, 0u);
}

TEST(Raster, SizesIncludeMarginsAndRoundSampleBytesUp) {
    struct Case {
        DataType type;
        unsigned int channels;
        std::uint64_t sampleBytes;
    };
    for (const Case& c :
         {Case{DataType::Type8U, 1, 1}, Case{DataType::Type1U, 1, 1}, Case{DataType::Type16S, 3, 6},
          Case{DataType::TypeC32R, 2, 16}, Case{DataType::TypeC64R, 1, 16},
          Case{DataType(12, false, false, 12, 0, false), 1, 2}}) {
        const Raster raster(RasterInfo(10, 7, c.channels, c.type), RasterContext(2, 3, 100, 200));
        EXPECT_EQ(raster.lineStride, 14u);
        EXPECT_EQ(raster.bufferHeight, 13u);
        EXPECT_EQ(raster.byteSize, 14u * 13u * c.sampleBytes);
        EXPECT_TRUE(raster.ownsData);
        ASSERT_NE(raster.data, nullptr);
        EXPECT_EQ(raster.width, 10u);
        EXPECT_EQ(raster.height, 7u);
        EXPECT_EQ(raster.channels, c.channels);
        EXPECT_EQ(raster.dataType, c.type);
        EXPECT_EQ(raster.xOffset, 100u);
        EXPECT_EQ(raster.yOffset, 200u);
        raster.data[raster.byteSize - 1] = 0xff;  // the whole extent is writable
    }
}

TEST(Raster, WithoutMarginsPixelXYIsAtIndexYTimesWidthPlusX) {
    Raster raster(RasterInfo(5, 4, 1, DataType::Type8U), RasterContext());
    ASSERT_EQ(raster.lineStride, 5u);
    for (unsigned int i = 0; i < raster.byteSize; ++i) {
        raster.data[i] = static_cast<unsigned char>(i);
    }
    EXPECT_EQ(raster.data[3 * raster.width + 2], 17);
}

TEST(Raster, WrappedBufferOutlivesTheRaster) {
    auto buffer = std::make_unique<unsigned char[]>(16);
    buffer[0] = 7;
    {
        Raster wrapper;
        wrapper.data = buffer.get();
        wrapper.byteSize = 16;
    }
    EXPECT_EQ(buffer[0], 7);
}

TEST(Raster, NullDataWithOwnershipIsDestroyedWithoutFreeing) {
    Raster raster;
    raster.ownsData = true;
    EXPECT_EQ(raster.data, nullptr);
}

TEST(Raster, CopyOfAnOwningRasterOwnsItsOwnBuffer) {
    Raster source(RasterInfo(3, 2, 1, DataType::Type16U), RasterContext(1, 1, 0, 0));
    for (unsigned int i = 0; i < source.byteSize; ++i) {
        source.data[i] = static_cast<unsigned char>(i + 1);
    }
    Raster copy(source);
    ASSERT_NE(copy.data, source.data);
    EXPECT_TRUE(copy.ownsData);
    EXPECT_EQ(copy.byteSize, source.byteSize);
    EXPECT_EQ(copy.lineStride, source.lineStride);
    EXPECT_EQ(0, std::memcmp(copy.data, source.data, source.byteSize));
    copy.data[0] = 99;
    EXPECT_EQ(source.data[0], 1);

    Raster assigned(RasterInfo(1, 1, 1, DataType::Type8U), RasterContext());
    assigned = source;
    EXPECT_NE(assigned.data, source.data);
    EXPECT_EQ(assigned.width, 3u);
    EXPECT_EQ(assigned.dataType, DataType::Type16U);
    const Raster& alias = assigned;
    assigned = alias;  // self-assignment keeps the buffer
    EXPECT_EQ(assigned.data[1], 2);
}

TEST(Raster, CopyOfAWrappingRasterWrapsTheSameBuffer) {
    unsigned char buffer[4] = {1, 2, 3, 4};
    Raster wrapper;
    wrapper.data = buffer;
    wrapper.byteSize = 4;
    const Raster copy(wrapper);
    EXPECT_EQ(copy.data, buffer);
    EXPECT_FALSE(copy.ownsData);
}

TEST(Raster, MoveTransfersOwnership) {
    Raster source(RasterInfo(2, 2, 1, DataType::Type8U), RasterContext());
    unsigned char* buffer = source.data;
    Raster moved(std::move(source));
    EXPECT_EQ(moved.data, buffer);
    EXPECT_TRUE(moved.ownsData);
    EXPECT_FALSE(source.ownsData);  // NOLINT(bugprone-use-after-move): moved-from state
    Raster target(RasterInfo(9, 9, 1, DataType::Type8U), RasterContext());
    target = std::move(moved);
    EXPECT_EQ(target.data, buffer);
    EXPECT_EQ(target.width, 2u);
}

TEST(Raster, DeletingThroughTheInfoBaseFreesTheBuffer) {
    std::unique_ptr<RasterInfo> raster =
        std::make_unique<Raster>(RasterInfo(8, 8, 1, DataType::Type8U), RasterContext());
    EXPECT_NE(dynamic_cast<Raster*>(raster.get()), nullptr);
}

}  // namespace
