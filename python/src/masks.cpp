// kubo.validity_mask: validity masks of numpy images by the library's no-data decisions.
#include <cstdint>
#include <cstring>  // std::memcpy
#include <string>
#include <vector>

#include "arrays.h"
#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/mask.h"
#include "vrkframework/basic/kubo/masks/maskdecision.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace kora::kubo::python {
namespace {

// Pixels flagged and packed at a time: the flags stay in the first-level cache between
// the two steps (measured fastest from 4096 to 8192 pixels).
constexpr std::uint64_t kBandPixels = std::uint64_t{1} << 13;

BkgdRule ParseRule(const std::string& rule) {
    if (rule == "all") {
        return BkgdAllChans;
    }
    if (rule == "any") {
        return BkgdAnyChan;
    }
    if (rule == "pairs") {
        return BkgdChanPairs;
    }
    throw py::value_error("rule must be 'all', 'any' or 'pairs', not '" + rule + "'");
}

std::vector<double> ReadNoData(py::handle nodata) {
    try {
        if (!py::isinstance<py::str>(nodata) && py::hasattr(nodata, "__len__")) {
            std::vector<double> values;
            for (const py::handle value : nodata) {
                values.push_back(value.cast<double>());
            }
            return values;
        }
        return {nodata.cast<double>()};
    } catch (py::cast_error&) {
        throw py::type_error("nodata must be a real number or a sequence of them");
    }
}

// Copies `count` bits from bit `offset` of `stream` to the start of `row`, clearing the
// bits after them in the last byte.
void CopyBits(const unsigned char* stream, std::uint64_t offset, std::uint64_t count,
              unsigned char* row) {
    const unsigned char* from = stream + offset / 8;
    const unsigned int shift = static_cast<unsigned int>(offset % 8);
    const auto bytes = static_cast<std::size_t>((count + 7) / 8);
    if (shift == 0) {
        std::memcpy(row, from, bytes);
    } else {
        // Every byte but the last takes bits from two source bytes; the last takes the second
        // only when the copied bits reach into it (never read a byte past the last bit).
        const unsigned int back = 8 - shift;
        for (std::size_t i = 0; i + 1 < bytes; ++i) {
            row[i] = static_cast<unsigned char>(from[i] << shift | from[i + 1] >> back);
        }
        const bool reaches = (offset / 8 + bytes) * 8 < offset + count;
        row[bytes - 1] = static_cast<unsigned char>(from[bytes - 1] << shift |
                                                    (reaches ? from[bytes] >> back : 0));
    }
    if (count % 8 != 0) {
        row[bytes - 1] &= static_cast<unsigned char>(0xFF << (8 - count % 8));
    }
}

struct MaskRequest {
    MaskDecision decision;
    std::uint64_t width;
    bool packed;
    unsigned char* out;
    std::uint64_t rowBytes;  // of `out`
};

// Flags `rows` rows of `raster` (the rows of `out` from `firstRow`): straight into the
// flag array, or through cache-sized bands packed by the library's Mask.
void FlagRows(MaskRequest& request, const Raster& raster, std::uint64_t firstRow,
              std::uint64_t rows) {
    const std::uint64_t width = request.width;
    if (!request.packed) {
        request.decision.EvaluateRange(raster, 0, static_cast<std::size_t>(rows * width),
                                       request.out + firstRow * width);
        return;
    }
    // The library packs a mask as one bit stream without row padding; the module's rows
    // start on whole bytes (numpy.packbits(flags, axis=-1)), so each band's stream is
    // copied row by row. A row longer than a band is flagged in pieces of a multiple of
    // 8 pixels, so that each piece starts on a byte of its row.
    const std::uint64_t band = std::max<std::uint64_t>(8, PieceLimit(kBandPixels) & ~7u);
    std::vector<unsigned char> flags(static_cast<std::size_t>(std::min(band, rows * width)));
    const auto pack = [&](std::uint64_t first, std::uint64_t pieceWidth, std::uint64_t pieceRows,
                          unsigned char* target) {
        request.decision.EvaluateRange(
            raster, first, static_cast<std::size_t>(pieceWidth * pieceRows), flags.data());
        const Mask mask(RasterInfo(static_cast<unsigned int>(pieceWidth),
                                   static_cast<unsigned int>(pieceRows), 1, DataType::Type1U),
                        RasterContext(), flags.data(), false, false);
        for (std::uint64_t row = 0; row < pieceRows; ++row) {
            CopyBits(mask.GetBits(), row * pieceWidth, pieceWidth, target + row * request.rowBytes);
        }
    };
    if (width <= band) {
        const std::uint64_t bandRows = band / width;
        for (std::uint64_t row = 0; row < rows; row += bandRows) {
            pack(row * width, width, std::min(bandRows, rows - row),
                 request.out + (firstRow + row) * request.rowBytes);
        }
        return;
    }
    for (std::uint64_t row = 0; row < rows; ++row) {
        for (std::uint64_t column = 0; column < width; column += band) {
            pack(row * width + column, std::min(band, width - column), 1,
                 request.out + (firstRow + row) * request.rowBytes + column / 8);
        }
    }
}

py::array ValidityMask(const py::object& array, const py::object& nodata, const std::string& rule,
                       const py::object& channels, bool packed, const py::object& sampleType) {
    Samples src = ReadSamples(array, "array", sampleType);
    if (src.shape.size() != 2 && src.shape.size() != 3) {
        throw py::value_error(
            "array must have the shape (rows, columns) or (rows, columns, "
            "channels), not " +
            std::to_string(src.shape.size()) + " dimensions");
    }
    const auto height = static_cast<std::uint64_t>(src.shape[0]);
    const auto width = static_cast<std::uint64_t>(src.shape[1]);
    const std::uint64_t channelCount =
        src.shape.size() == 3 ? static_cast<std::uint64_t>(src.shape[2]) : 1;
    if (height > UINT32_MAX || width > UINT32_MAX || channelCount > UINT32_MAX) {
        throw py::value_error(
            "array is too large: rows, columns and channels must each fit "
            "in 32 bits");
    }
    const BkgdRule bkgdRule = ParseRule(rule);
    std::vector<double> noData = ReadNoData(nodata);
    std::vector<unsigned int> tested;
    bool expanded = true;
    if (!channels.is_none()) {
        for (const py::handle channel : channels) {
            const auto index = channel.cast<long long>();
            if (index < 0 || static_cast<std::uint64_t>(index) >= channelCount) {
                throw py::value_error("channel " + std::to_string(index) + " is not one of the " +
                                      std::to_string(channelCount) + " channels of array");
            }
            tested.push_back(static_cast<unsigned int>(index + 1));
        }
        if (noData.size() == 1) {
            noData.assign(tested.size(), noData.front());
        }
        if (noData.size() != tested.size()) {
            throw py::value_error("nodata needs one value per listed channel");
        }
    } else if (noData.size() == 1) {
        expanded = false;  // the library widens the one value to every channel
    } else if (noData.size() == channelCount) {
        for (unsigned int channel = 1; channel <= channelCount; ++channel) {
            tested.push_back(channel);
        }
    } else {
        throw py::value_error("nodata needs one value, or one per channel (" +
                              std::to_string(channelCount) + ")");
    }

    const std::uint64_t pixelBytes = channelCount * src.sampleBytes;
    const bool pixelsContiguous =
        (src.shape.size() == 2 || channelCount == 1 ||
         static_cast<std::uint64_t>(src.strides[2]) == src.sampleBytes) &&
        (width <= 1 || static_cast<std::uint64_t>(src.strides[1]) == pixelBytes);
    // Under the pair rule an odd number of samples a pixel pairs a row's last sample with
    // the next row's first; only a contiguous buffer keeps them neighbours.
    const std::uint64_t samplesPerPixel = channelCount * (src.type.isComplex ? 2 : 1);
    const bool pairsAcrossRows = bkgdRule == BkgdChanPairs && samplesPerPixel % 2 == 1;
    if (!pixelsContiguous || (pairsAcrossRows && !src.IsContiguous())) {
        src = ContiguousCopy(src);
    }
    const bool rowsContiguous =
        height <= 1 || static_cast<std::uint64_t>(src.strides[0]) == width * pixelBytes;

    const std::uint64_t rowBytes = packed ? (width + 7) / 8 : width;
    py::array result = packed ? py::array(py::dtype::of<std::uint8_t>(),
                                          {src.shape[0], static_cast<py::ssize_t>(rowBytes)})
                              : py::array(py::dtype::of<bool>(), {src.shape[0], src.shape[1]});
    MaskRequest request{MaskDecision(bkgdRule, noData, tested, expanded), width, packed,
                        static_cast<unsigned char*>(result.mutable_data()), rowBytes};
    if (height == 0 || width == 0) {
        return result;
    }
    {
        py::gil_scoped_release release;
        const RasterInfo rowInfo(static_cast<unsigned int>(width), 1,
                                 static_cast<unsigned int>(channelCount), src.type);
        if (rowsContiguous) {
            const Raster raster =
                WrapRaster(src.data,
                           RasterInfo(rowInfo.width, static_cast<unsigned int>(height),
                                      rowInfo.channels, src.type),
                           RasterContext());
            FlagRows(request, raster, 0, height);
        } else {
            for (std::uint64_t row = 0; row < height; ++row) {
                const Raster raster =
                    WrapRaster(src.data + static_cast<py::ssize_t>(row) * src.strides[0], rowInfo,
                               RasterContext());
                FlagRows(request, raster, row, 1);
            }
        }
    }
    return result;
}

}  // namespace

void RegisterMasks(py::module_& m) {
    m.def("validity_mask", &ValidityMask, py::arg("array"), py::arg("nodata"),
          py::arg("rule") = "all", py::arg("channels") = py::none(), py::arg("packed") = true,
          py::arg("sample_type") = py::none(),
          R"doc(The validity mask of an image: which pixels hold data, by no-data values.

A pixel is background (no data) when its tested channels equal their no-data
values under ``rule``: ``"all"`` every tested channel, ``"any"`` at least one,
``"pairs"`` both channels of at least one adjacent pair (0-1, 2-3, ...).
Samples are compared in their own type, the no-data value converted to it as
the library does (-1.0 matches 255 in uint8 data; NaN matches nothing). A
complex channel is tested as its real part against the no-data value and its
imaginary part against 0, and ``"any"`` becomes ``"pairs"`` for it.

Parameters
----------
array : numpy.ndarray
    The image, of shape (rows, columns) or (rows, columns, channels).
nodata : float or sequence of float
    One value for every tested channel, or one value per channel (or per
    listed channel).
rule : {"all", "any", "pairs"}
    When a pixel is background.
channels : sequence of int, optional
    The channels to test (counted from 0); the others are not looked at. An
    empty list marks every pixel valid. By default every channel is tested.
packed : bool
    Whether to pack eight pixels a byte.
sample_type : DataType, str or dtype-like, optional
    The type ``array`` holds when its dtype alone does not say (complex
    integers, held with a last axis of 2).

Returns
-------
numpy.ndarray
    Packed: a uint8 array of shape (rows, (columns + 7) // 8), each row starting
    on a new byte, its first pixel the most significant bit and the bits after
    its last pixel 0, exactly ``numpy.packbits(flags, axis=-1)``. (The library's
    own mask runs its bits on across rows; the module pads each row instead, so
    that rows can be indexed.) Else a bool array of shape (rows, columns), True
    where the pixel is valid.

Raises
------
TypeError
    For an array that is no numpy array of samples, or a non-numeric ``nodata``.
ValueError
    For a wrong number of dimensions, an unknown rule, a channel that does not
    exist or a count of no-data values that fits neither form.

Notes
-----
Runs without copying for C-contiguous images and for views whose rows are
strided but whose pixels lie together; other views are copied first (as are
strided views under the pair rule with an odd number of samples a pixel,
whose last sample pairs with the next row's first). Any size works: the
mask is built in bands of rows. Each call uses its own no-data decision, so
calls from several threads never share one; the interpreter lock is released
while flagging.
)doc");
}

}  // namespace kora::kubo::python
