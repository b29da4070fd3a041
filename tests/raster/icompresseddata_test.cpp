#include "vrkframework/basic/kubo/raster/icompresseddata.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "support/compressedsamples.h"
#include "support/expectfailure.h"
#include "vrkframework/basic/kubo/raster/bitwiserlecompresseddata.h"
#include "vrkframework/basic/kubo/raster/count32.h"
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

constexpr char kNullDecode[] = "pBuffer is NULL, cannot Decode in NULL buffer";

// What the shared behaviour of each class is checked with: how to build one from a mask
// of 0 and 1 bytes, where its compressed bytes are, and what its null-buffer failures say.
template <class T>
struct Traits;

template <>
struct Traits<RLECompressedData> {
    static constexpr char kName[] = "RLECompressedData";
    static constexpr char kSource[] = "vrkframework/basic/kubo/raster/rlecompresseddata";
    static constexpr unsigned int kWholeLine = 107;
    static constexpr unsigned int kWindowLine = 146;
    static constexpr const char* kWindowMessage = kNullDecode;
    static RLECompressedData Make(Bytes& bytes, unsigned int width, unsigned int height) {
        RasterInfo info(width, height, 1, DataType::Type8U);
        RasterContext context;
        return RLECompressedData(bytes.data(), info, context);
    }
    static const unsigned char* Compressed(const RLECompressedData& data) {
        return data.GetCompressedData();
    }
};

template <>
struct Traits<BitwiseRLECompressedData> {
    static constexpr char kName[] = "BitwiseRLECompressedData";
    static constexpr char kSource[] = "vrkframework/basic/kubo/raster/bitwiserlecompresseddata";
    static constexpr unsigned int kWholeLine = 128;
    static constexpr unsigned int kWindowLine = 196;
    static constexpr const char* kWindowMessage = "pBuffer is NULL, cannot compress NULL buffer";
    static BitwiseRLECompressedData Make(Bytes& bytes, unsigned int width, unsigned int height) {
        RasterInfo info(width, height, 1, DataType::Type8U);
        return BitwiseRLECompressedData(bytes.data(), info);
    }
    static const unsigned char* Compressed(const BitwiseRLECompressedData& data) {
        return data.GetCompressedData();
    }
};

template <>
struct Traits<LineRLECompressedBitMask> {
    static constexpr char kName[] = "LineRLECompressedBitMask";
    static constexpr char kSource[] = "vrkframework/basic/kubo/raster/linerlecompressedbitmask";
    static constexpr unsigned int kWholeLine = 177;
    static constexpr unsigned int kWindowLine = 210;
    static constexpr const char* kWindowMessage = kNullDecode;
    static LineRLECompressedBitMask Make(Bytes& bytes, unsigned int width, unsigned int height) {
        LineRLECompressedBitMask mask(width, height);
        for (unsigned long row = 0; row < height; ++row) {
            mask.CompressRow(bytes.data() + row * width, row);
        }
        return mask;
    }
    static const unsigned char* Compressed(const LineRLECompressedBitMask& mask) {
        return mask.GetCompressedRow(0);
    }
};

template <class T>
class CompressedRaster : public testing::Test {
protected:
    Bytes m_bytes = kubo_test::RunBytes(6 * 4, 1, {0, 1}, 5);
    T Make() { return Traits<T>::Make(m_bytes, 6, 4); }
};

using Implementations =
    testing::Types<RLECompressedData, BitwiseRLECompressedData, LineRLECompressedBitMask>;
TYPED_TEST_SUITE(CompressedRaster, Implementations);

// Each overload reached through the interface decodes as its implementation defines; one
// row of a window is a slice in every class.
TYPED_TEST(CompressedRaster, DecodesThroughTheInterfaceAndIsDestroyedThroughIt) {
    const std::unique_ptr<ICompressedData> object = std::make_unique<TypeParam>(this->Make());
    EXPECT_NE(dynamic_cast<TypeParam*>(object.get()), nullptr);
    const Bytes& bytes = this->m_bytes;
    EXPECT_EQ(kubo_test::Take(object->Decode(), bytes.size()), bytes);
    Bytes whole(bytes.size());
    object->Decode(whole.data());
    EXPECT_EQ(whole, bytes);
    EXPECT_EQ(kubo_test::Take(object->Decode(2, 1, 3, 1), 3),
              kubo_test::Slice(bytes, 6, 2, 1, 3, 1));
    Bytes window(3);
    object->Decode(1, 2, 3, 1, window.data());
    EXPECT_EQ(window, kubo_test::Slice(bytes, 6, 1, 2, 3, 1));
}

TYPED_TEST(CompressedRaster, CopiesShareTheCompressedBytesUntilTheLastHolderGoes) {
    auto source = std::make_unique<TypeParam>(this->Make());
    const unsigned char* compressed = Traits<TypeParam>::Compressed(*source);
    TypeParam copy(*source);
    Bytes other(6 * 4, 1);
    TypeParam assigned = Traits<TypeParam>::Make(other, 6, 4);
    assigned = *source;  // the target's own bytes go with it
    EXPECT_EQ(Traits<TypeParam>::Compressed(copy), compressed);
    EXPECT_EQ(Traits<TypeParam>::Compressed(assigned), compressed);
    source.reset();
    EXPECT_EQ(kubo_test::Take(copy.Decode(), this->m_bytes.size()), this->m_bytes);

    const TypeParam& self = assigned;
    assigned = self;
    TypeParam moved(std::move(copy));
    // Moving copies, so the source stays usable.
    EXPECT_EQ(kubo_test::Take(copy.Decode(), this->m_bytes.size()), this->m_bytes);  // NOLINT
    EXPECT_EQ(Traits<TypeParam>::Compressed(moved), compressed);
    EXPECT_EQ(kubo_test::Take(assigned.Decode(), this->m_bytes.size()), this->m_bytes);
}

TYPED_TEST(CompressedRaster, InheritedDescriptionStaysZeroUntilACopyTakesItFromItsSource) {
    TypeParam data = this->Make();
    EXPECT_EQ(data.width, 0u);
    EXPECT_EQ(data.height, 0u);
    EXPECT_EQ(data.channels, 0u);
    EXPECT_EQ(data.dataType, DataType());
    data.width = 11;
    data.dataType = DataType::Type64R;
    const TypeParam copy(data);
    EXPECT_EQ(copy.width, 11u);
    EXPECT_EQ(copy.dataType, DataType::Type64R);
}

TYPED_TEST(CompressedRaster, NullOutputBuffersAreRejected) {
    using T = Traits<TypeParam>;
    const TypeParam data = this->Make();
    const std::string prefix = std::string("void __cdecl kora::kubo::") + T::kName + "::Decode(";
    const auto whole = kubo_test::Catch<kora::DataException>([&] { data.Decode(nullptr); });
    ASSERT_TRUE(whole);
    kubo_test::ExpectReport(*whole, kNullDecode, T::kSource,
                            (prefix + "unsigned char *) const").c_str(), T::kWholeLine);
    const auto window =
        kubo_test::Catch<kora::DataException>([&] { data.Decode(0, 0, 1, 1, nullptr); });
    ASSERT_TRUE(window);
    kubo_test::ExpectReport(*window, T::kWindowMessage, T::kSource,
                            (prefix + "int,int,int,int,unsigned char *) const").c_str(),
                            T::kWindowLine);
}

// Sizes past what the 32-bit accessors return are refused rather than truncated (the
// streams of a raster large enough for that are tested by size in kubo_large).
TEST(CompressedSizes, CountsPast32BitsAreRefused) {
    EXPECT_EQ(kora::kubo::detail::Count32(4294967295u, "A size", "source", "function"),
              4294967295u);
    const auto failure = kubo_test::Catch<kora::OutOfBoundsException>([] {
        kora::kubo::detail::Count32(4294967296u, "A compressed size", "source", "function");
    });
    ASSERT_TRUE(failure.has_value());
    kubo_test::ExpectReport(*failure, "A compressed size of 4294967296 exceeds 4294967295",
                            "source", "function", 0);
}

}  // namespace
