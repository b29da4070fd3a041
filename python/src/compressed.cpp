// The three compressed forms as Python classes: built from arrays, decoded whole or by window.
#include <climits>  // INT_MAX
#include <cstdint>
#include <cstring>  // std::memcpy, std::memset
#include <memory>
#include <mutex>
#include <shared_mutex>
#include <string>
#include <vector>

#include "arrays.h"
#include "vrkframework/basic/kubo/raster/bitwiserlecompresseddata.h"
#include "vrkframework/basic/kubo/raster/linerlecompressedbitmask.h"
#include "vrkframework/basic/kubo/raster/rlecompresseddata.h"

namespace kora::kubo::python {
namespace {

/// What a compressed image was made from: the shape and dtype its decoded arrays take.
struct Layout {
    std::vector<py::ssize_t> arrayShape;  ///< of the source array, pair axis included
    py::dtype dtype;
    DataType type;
    std::uint64_t height = 0;
    std::uint64_t width = 0;
    std::uint64_t pixelBytes = 0;  ///< every channel, both components
    /// How the library sees it: it sizes a sample by its bits alone, whatever the complex
    /// flag says, so a complex image would be compressed only half; it is described as two
    /// channels of its component type instead.
    RasterInfo info;

    py::array NewArray(std::uint64_t rows, std::uint64_t columns) const {
        std::vector<py::ssize_t> shape = arrayShape;
        shape[0] = static_cast<py::ssize_t>(rows);
        shape[1] = static_cast<py::ssize_t>(columns);
        return py::array(dtype, shape);
    }
};

Layout LayoutOf(const Samples& samples) {
    if (samples.shape.size() != 2 && samples.shape.size() != 3) {
        throw py::value_error(
            "array must have the shape (rows, columns) or (rows, columns, "
            "channels), not " +
            std::to_string(samples.shape.size()) + " dimensions");
    }
    Layout layout;
    layout.arrayShape.assign(samples.array.shape(), samples.array.shape() + samples.array.ndim());
    layout.dtype = samples.array.dtype();
    layout.type = samples.type;
    layout.height = static_cast<std::uint64_t>(samples.shape[0]);
    layout.width = static_cast<std::uint64_t>(samples.shape[1]);
    const std::uint64_t channels =
        samples.shape.size() == 3 ? static_cast<std::uint64_t>(samples.shape[2]) : 1;
    layout.pixelBytes = channels * samples.sampleBytes;
    if (layout.height > INT_MAX || layout.width > INT_MAX || channels * 2 > UINT_MAX) {
        throw py::value_error(
            "array is too large: windows address at most 2147483647 rows "
            "and columns");
    }
    DataType component = samples.type;
    component.isComplex = false;
    layout.info = RasterInfo(
        static_cast<unsigned int>(layout.width), static_cast<unsigned int>(layout.height),
        static_cast<unsigned int>(channels * (samples.type.isComplex ? 2 : 1)), component);
    return layout;
}

/// The window (x, y, width, height), checked against the image.
struct Window {
    std::uint64_t x, y, width, height;
};

Window ReadImageWindow(py::handle value, const Layout& layout) {
    std::uint64_t bounds[4];
    ReadWindow(value, bounds);
    const Window window{bounds[0], bounds[1], bounds[2], bounds[3]};
    if (window.x + window.width > layout.width || window.y + window.height > layout.height) {
        throw py::value_error("window (" + std::to_string(window.x) + ", " +
                              std::to_string(window.y) + ", " + std::to_string(window.width) +
                              ", " + std::to_string(window.height) + ") exceeds the image of " +
                              std::to_string(layout.width) + " x " + std::to_string(layout.height) +
                              " pixels");
    }
    return window;
}

// The whole image (`whole(out)`) or a window of it (`part(window, out)`) in a new array,
// decoded without the interpreter lock.
template <class Whole, class Part>
py::array DecodeImage(const Layout& layout, const py::object& window, Whole whole, Part part) {
    const bool all = window.is_none();
    const Window w =
        all ? Window{0, 0, layout.width, layout.height} : ReadImageWindow(window, layout);
    py::array result = layout.NewArray(w.height, w.width);
    auto* out = static_cast<unsigned char*>(result.mutable_data());
    if (w.width != 0 && w.height != 0) {
        py::gil_scoped_release release;
        all ? whole(out) : part(w, out);
    }
    return result;
}

void RequireSizes(int width, int height) {
    if (width < 0 || height < 0) {
        throw py::value_error("width and height must not be negative");
    }
}

// Copies `rows` rows of `rowBytes` bytes, `stride` bytes apart in `from`, into `to`.
void GatherRows(const unsigned char* from, std::uint64_t stride, std::uint64_t rows,
                std::uint64_t rowBytes, unsigned char* to) {
    for (std::uint64_t row = 0; row < rows; ++row) {
        std::memcpy(to + row * rowBytes, from + row * stride, static_cast<std::size_t>(rowBytes));
    }
}

template <class Compressed>
py::bytes CompressedBytes(const Compressed& data) {
    return py::bytes(reinterpret_cast<const char*>(data.GetCompressedData()),
                     data.GetCompressedSize());
}

template <class Compressed>
py::buffer_info CompressedBuffer(const Compressed& data) {
    return py::buffer_info(const_cast<unsigned char*>(data.GetCompressedData()), 1,
                           py::format_descriptor<std::uint8_t>::format(), 1,
                           {static_cast<py::ssize_t>(data.GetCompressedSize())}, {1}, true);
}

class PyRle {
public:
    PyRle(const py::object& array, const py::object& sampleType) {
        Samples samples = ReadSamples(array, "array", sampleType);
        layout_ = LayoutOf(samples);
        if (!samples.IsContiguous()) {
            samples = ContiguousCopy(samples);
        }
        RasterContext context;
        py::gil_scoped_release release;
        data_ = std::make_unique<RLECompressedData>(samples.data, layout_.info, context);
    }

    py::array Decode(const py::object& window) const {
        return DecodeImage(
            layout_, window, [this](unsigned char* out) { data_->Decode(out); },
            [this](const Window& w, unsigned char* out) { DecodeWindow(w, out); });
    }

    py::array DecodeWindowRaw(int x, int y, int width, int height) const {
        RequireSizes(width, height);
        py::array_t<std::uint8_t> out(static_cast<py::ssize_t>(width) * height);
        auto* bytes = out.mutable_data();
        py::gil_scoped_release release;
        data_->Decode(x, y, width, height, bytes);
        return std::move(out);
    }

    const Layout& GetLayout() const { return layout_; }
    const RLECompressedData& Get() const { return *data_; }

private:
    void DecodeWindow(const Window& w, unsigned char* out) const {
        // The library's window rule shifts rows after the first (its running total grows by
        // the pair entered, not the pair left), but one row read from any start is exact:
        // the rows are read as one run of bytes from the window's first pixel to its last,
        // then the window's part of each row is kept.
        const std::uint64_t line = layout_.width * layout_.pixelBytes;
        const std::uint64_t rowBytes = w.width * layout_.pixelBytes;
        const std::uint64_t span = (w.height - 1) * line + rowBytes;
        const bool whole = w.height == 1 || w.width == layout_.width;
        std::vector<unsigned char> rows(whole ? 0 : static_cast<std::size_t>(span));
        ReadSpan(w.y * layout_.width + w.x, span, whole ? out : rows.data());
        if (!whole) {
            GatherRows(rows.data(), line, w.height, rowBytes, out);
        }
    }

    // Decodes `count` bytes from pixel `first` (row-major) through one-row windows of the
    // library, each at most INT_MAX bytes of whole pixels.
    void ReadSpan(std::uint64_t first, std::uint64_t count, unsigned char* out) const {
        const std::uint64_t pixel = layout_.pixelBytes;
        const std::uint64_t piece = std::max(pixel, PieceLimit(INT_MAX) / pixel * pixel);
        for (std::uint64_t done = 0; done < count; done += piece) {
            const std::uint64_t at = first + done / pixel;
            data_->Decode(static_cast<int>(at % layout_.width),
                          static_cast<int>(at / layout_.width),
                          static_cast<int>(std::min(piece, count - done)), 1, out + done);
        }
    }

    Layout layout_;
    std::unique_ptr<RLECompressedData> data_;
};

class PyBitwise {
public:
    PyBitwise(const py::object& array, const py::object& sampleType) {
        Samples samples = ReadSamples(array, "array", sampleType);
        layout_ = LayoutOf(samples);
        if (!samples.IsContiguous()) {
            samples = ContiguousCopy(samples);
        }
        py::gil_scoped_release release;
        data_ = std::make_unique<BitwiseRLECompressedData>(samples.data, layout_.info);
        const unsigned char* runs = data_->GetCompressedData();
        const std::uint64_t count = data_->GetCompressedSize();
        for (std::uint64_t run = 0; run + 1 < count; ++run) {
            lastRunStart_ += runs[run];
        }
        lastRunValue_ = count % 2 == 0 ? 0xFF : 0x00;  // run k holds bits of value k % 2
    }

    py::array Decode(const py::object& window) {
        return DecodeImage(
            layout_, window, [this](unsigned char* out) { data_->Decode(out); },  // no cursor
            [this](const Window& w, unsigned char* out) { DecodeWindow(w, out); });
    }

    py::array DecodeWindowRaw(int x, int y, int width, int height) {
        RequireSizes(width, height);
        const std::int64_t size =
            height == 0
                ? 0
                : std::int64_t{height - 1} * width * static_cast<std::int64_t>(layout_.pixelBytes) +
                      width;
        py::array_t<std::uint8_t> out(static_cast<py::ssize_t>(size));
        auto* bytes = out.mutable_data();
        py::gil_scoped_release release;
        const BitwiseRLECompressedData own(*data_);  // its own cursor, the same runs
        own.Decode(x, y, width, height, bytes);
        return std::move(out);
    }

    const Layout& GetLayout() const { return layout_; }
    const BitwiseRLECompressedData& Get() const { return *data_; }

private:
    void DecodeWindow(const Window& w, unsigned char* out) {
        const std::uint64_t line = layout_.width * layout_.pixelBytes;
        if (layout_.pixelBytes != 1) {
            // The library's window reads w bytes from byte x of a row but checks x and w
            // against the width in pixels: past the first `width` bytes of a row nothing
            // of a wider pixel can be reached. Such windows are cut from a whole decode.
            std::vector<unsigned char> whole(static_cast<std::size_t>(line * layout_.height));
            data_->Decode(whole.data());
            GatherRows(whole.data() + w.y * line + w.x * layout_.pixelBytes, line, w.height,
                       w.width * layout_.pixelBytes, out);
            return;
        }
        // The cursor cannot seek to a bit inside the last run (it fails with "Uncompressed
        // index not found."), yet every byte from there on holds that run's value: rows
        // that start past the last run's start are filled with it.
        std::uint64_t reachable = 0;
        while (reachable < w.height && ((w.y + reachable) * line + w.x) * 8 <= lastRunStart_) {
            ++reachable;
        }
        if (reachable != 0) {
            // The window decoder moves the object's read cursor: each call decodes through a
            // copy, which shares the runs and has its own cursor. Four threads decoding
            // windows of one object this way ran 2.1 times the windows a second of a lock
            // around the object (two cores); one thread alone, the same.
            const BitwiseRLECompressedData own(*data_);
            own.Decode(static_cast<int>(w.x), static_cast<int>(w.y), static_cast<int>(w.width),
                       static_cast<int>(reachable), out);
        }
        std::memset(out + reachable * w.width, lastRunValue_,
                    static_cast<std::size_t>((w.height - reachable) * w.width));
    }

    Layout layout_;
    std::unique_ptr<BitwiseRLECompressedData> data_;
    std::uint64_t lastRunStart_ = 0;
    unsigned char lastRunValue_ = 0;
};

class PyLineMask {
public:
    explicit PyLineMask(const py::object& array) {
        const Samples samples = ReadFlags(array, "array");
        if (samples.shape.size() != 2) {
            throw py::value_error("array must have the shape (rows, columns), not " +
                                  std::to_string(samples.shape.size()) + " dimensions");
        }
        SetShape(static_cast<std::uint64_t>(samples.shape[0]),
                 static_cast<std::uint64_t>(samples.shape[1]), "array");
        const Samples rows = samples.IsLastAxisContiguous() ? samples : ContiguousCopy(samples);
        py::gil_scoped_release release;
        for (std::uint64_t row = 0; row < height_; ++row) {
            data_->CompressRow(rows.data + static_cast<py::ssize_t>(row) * rows.strides[0],
                               static_cast<unsigned long>(row));
        }
    }

    // The mask whose rows hold `runs` (the rows' runs one after another, `rowSizes[row]`
    // bytes each): the inverse of bytes() and row_sizes. The library takes rows as flags
    // only, so each row's runs are spread into a row of flags and compressed again; runs
    // the library wrote come out the same.
    PyLineMask(long long columns, const py::buffer& runs, const py::object& rowSizes) {
        if (columns < 0) {
            throw py::value_error("columns must not be negative");
        }
        const py::array_t<std::uint64_t, py::array::c_style | py::array::forcecast> sizes(rowSizes);
        if (sizes.ndim() != 1) {
            throw py::value_error("row_sizes must be 1-D, one count of bytes a row");
        }
        const py::buffer_info stream = runs.request();
        if (stream.itemsize != 1 || stream.ndim != 1 ||
            (stream.size > 1 && stream.strides[0] != 1)) {
            throw py::type_error("runs must be contiguous bytes (bytes or a 1-D uint8 array)");
        }
        SetShape(static_cast<std::uint64_t>(sizes.shape(0)), static_cast<std::uint64_t>(columns),
                 "columns");
        const auto* bytes = static_cast<const unsigned char*>(stream.ptr);
        const std::uint64_t* counts = sizes.data();
        std::uint64_t total = 0;
        for (std::uint64_t row = 0; row < height_; ++row) {
            total += counts[row];
        }
        if (total != static_cast<std::uint64_t>(stream.size)) {
            throw py::value_error("row_sizes add up to " + std::to_string(total) +
                                  " bytes, runs holds " + std::to_string(stream.size));
        }
        std::vector<unsigned char> flags(static_cast<std::size_t>(width_));
        std::uint64_t at = 0;
        py::gil_scoped_release release;  // the errors below need no interpreter to be made
        for (std::uint64_t row = 0; row < height_; ++row) {
            std::uint64_t column = 0;
            for (std::uint64_t run = 0; run < counts[row]; ++run) {
                const unsigned char length = bytes[at + run];
                if (column + length > width_) {
                    break;
                }
                std::memset(flags.data() + column, static_cast<int>(run % 2), length);
                column += length;
            }
            if (column != width_) {
                throw py::value_error("the runs of row " + std::to_string(row) +
                                      " do not cover its " + std::to_string(width_) + " pixels");
            }
            at += counts[row];
            data_->CompressRow(flags.data(), static_cast<unsigned long>(row));
        }
    }

    py::array Decode(const py::object& window) const {
        return DecodeImage(
            layout_, window,
            [this](unsigned char* out) {
                const std::shared_lock<std::shared_mutex> lock(rows_);
                data_->Decode(out);
            },
            [this](const Window& w, unsigned char* out) {
                const std::shared_lock<std::shared_mutex> lock(rows_);
                // Inside the mask the library's window is exactly the slice.
                data_->Decode(static_cast<int>(w.x), static_cast<int>(w.y),
                              static_cast<int>(w.width), static_cast<int>(w.height), out);
            });
    }

    py::array DecodeWindowRaw(int x, int y, int width, int height) const {
        RequireSizes(width, height);
        py::array_t<std::uint8_t> out(static_cast<py::ssize_t>(width) * height);
        auto* bytes = out.mutable_data();
        py::gil_scoped_release release;
        const std::shared_lock<std::shared_mutex> lock(rows_);
        data_->Decode(x, y, width, height, bytes);
        return std::move(out);
    }

    py::array DecodeRow(long long row) const {
        CheckRow(row);
        py::array_t<bool> result(static_cast<py::ssize_t>(width_));
        auto* out = reinterpret_cast<unsigned char*>(result.mutable_data());
        {
            py::gil_scoped_release release;
            const std::shared_lock<std::shared_mutex> lock(rows_);
            data_->DecodeRow(static_cast<unsigned long>(row), out);
        }
        return std::move(result);
    }

    void ReplaceRow(long long row, const py::object& values) {
        CheckRow(row);
        Samples samples = ReadFlags(values, "values");
        if (samples.shape.size() != 1 || static_cast<std::uint64_t>(samples.shape[0]) != width_) {
            throw py::value_error("values must be a 1-D array of " + std::to_string(width_) +
                                  " flags");
        }
        if (!samples.IsContiguous()) {
            samples = ContiguousCopy(samples);
        }
        py::gil_scoped_release release;
        const std::unique_lock<std::shared_mutex> lock(rows_);
        data_->CompressRow(samples.data, static_cast<unsigned long>(row));
    }

    py::bytes CompressedRow(long long row) const {
        CheckRow(row);
        const std::shared_lock<std::shared_mutex> lock(rows_);
        const auto r = static_cast<unsigned long>(row);
        return py::bytes(reinterpret_cast<const char*>(data_->GetCompressedRow(r)),
                         data_->GetCompressedRowSize(r));
    }

    py::array RowSizes() const {
        py::array_t<std::uint32_t> sizes(static_cast<py::ssize_t>(height_));
        auto* out = sizes.mutable_data();
        const std::shared_lock<std::shared_mutex> lock(rows_);
        for (std::uint64_t row = 0; row < height_; ++row) {
            out[row] = data_->GetCompressedRowSize(static_cast<unsigned long>(row));
        }
        return std::move(sizes);
    }

    py::bytes Bytes() const {
        std::string all;
        const std::shared_lock<std::shared_mutex> lock(rows_);
        for (std::uint64_t row = 0; row < height_; ++row) {
            const auto r = static_cast<unsigned long>(row);
            all.append(reinterpret_cast<const char*>(data_->GetCompressedRow(r)),
                       data_->GetCompressedRowSize(r));
        }
        return py::bytes(all);
    }

    py::tuple Shape() const { return py::make_tuple(height_, width_); }

private:
    void SetShape(std::uint64_t height, std::uint64_t width, const char* argument) {
        if (height > INT_MAX || width > INT_MAX) {
            throw py::value_error(std::string(argument) +
                                  " is too large: windows address at most 2147483647 rows "
                                  "and columns");
        }
        height_ = height;
        width_ = width;
        layout_.arrayShape = {static_cast<py::ssize_t>(height), static_cast<py::ssize_t>(width)};
        layout_.dtype = py::dtype::of<bool>();
        layout_.height = height;
        layout_.width = width;
        data_ = std::make_unique<LineRLECompressedBitMask>(static_cast<unsigned int>(width),
                                                           static_cast<unsigned int>(height));
    }

    // One byte a pixel, zero clear and anything else set: uint8, int8 or bool.
    static Samples ReadFlags(const py::object& array, const char* argument) {
        if (py::isinstance<py::array>(array) &&
            py::reinterpret_borrow<py::array>(array).dtype().kind() == 'b') {
            return ReadSamples(array.attr("view")("uint8"), argument, py::none());
        }
        Samples samples = ReadSamples(array, argument, py::none());
        if (samples.sampleBytes != 1 || samples.type.isComplex) {
            throw py::type_error(std::string(argument) +
                                 " must hold one byte a pixel (bool, uint8 or int8), not " +
                                 Describe(samples.type));
        }
        return samples;
    }

    void CheckRow(long long row) const {
        if (row < 0 || static_cast<std::uint64_t>(row) >= height_) {
            throw py::index_error("row " + std::to_string(row) + " is not one of the " +
                                  std::to_string(height_) + " rows");
        }
    }

    std::uint64_t height_ = 0;
    std::uint64_t width_ = 0;
    Layout layout_;  // decoded masks are bool arrays
    std::unique_ptr<LineRLECompressedBitMask> data_;
    mutable std::shared_mutex rows_;  // rows are replaced while others decode
};

const char kImageParametersDoc[] = R"doc(
Parameters
----------
array : numpy.ndarray
    An image of shape (rows, columns) or (rows, columns, channels); a view
    that is not C-contiguous is copied first.
sample_type : DataType, str or dtype-like, optional
    The type the array holds when its dtype alone does not say.
)doc";

const char kWindowDoc[] = R"doc(

Parameters
----------
window : sequence of 4 int, optional
    (x, y, width, height) in pixels, inside the image (a ``kubo.Tile`` is one).

Returns
-------
numpy.ndarray
    A new array: the whole image, or exactly ``image[y:y + height, x:x + width]``.

Raises
------
ValueError
    For a window outside the image.
)doc";

template <class Class, class Py>
void AddArrayProperties(Class& cls) {
    cls.def_property_readonly(
           "shape", [](const Py& self) { return py::tuple(py::cast(self.GetLayout().arrayShape)); },
           "The shape of the decoded array.")
        .def_property_readonly(
            "dtype", [](const Py& self) { return self.GetLayout().dtype; },
            "The dtype of the decoded array.")
        .def_property_readonly(
            "sample_type", [](const Py& self) { return self.GetLayout().type; },
            "The sample type of the image.")
        .def_property_readonly(
            "compressed_size", [](const Py& self) { return self.Get().GetCompressedSize(); },
            "Bytes of the compressed stream.")
        .def(
            "__bytes__", [](const Py& self) { return CompressedBytes(self.Get()); },
            "A copy of the compressed stream.");
}

}  // namespace

void RegisterCompressed(py::module_& m) {
    py::class_<PyRle> rle(m, "RLECompressedData", py::buffer_protocol(),
                          (std::string(R"doc(An image held as (count, value) byte pairs.

The raw bytes of the image, in C order, are one stream of pairs: ``count``
(1 to 255) copies of ``value``, without header and without a break at rows.
The object exports the pairs through the buffer protocol (``memoryview(obj)``,
read-only, no copy) and ``bytes(obj)``. Safe to share between threads.
)doc") + kImageParametersDoc)
                              .c_str());
    rle.def(py::init<const py::object&, const py::object&>(), py::arg("array"),
            py::arg("sample_type") = py::none())
        .def("decode", &PyRle::Decode, py::arg("window") = py::none(),
             (std::string("Decodes the whole image or a window of it.") + kWindowDoc).c_str())
        .def("decode_window_raw", &PyRle::DecodeWindowRaw, py::arg("x"), py::arg("y"),
             py::arg("width"), py::arg("height"),
             R"doc(The library's own window decoder, unchecked.

``width`` counts bytes (pixels x channels x bytes a sample), ``x`` and ``y``
pixels. Every row seeks on a running total that grows by the count of each pair
entered, not of the pair left, so rows after the first can come out shifted
against the image: only a one-row window is a plain slice of the raw bytes.
Past the end of the pairs the stream reads as pairs of value 0.

Returns
-------
numpy.ndarray
    A new uint8 array of ``width * height`` bytes, the rows one after the other.

Raises
------
ValueError
    For a negative width or height.
)doc")
        .def_buffer([](const PyRle& self) { return CompressedBuffer(self.Get()); });
    AddArrayProperties<decltype(rle), PyRle>(rle);

    py::class_<PyBitwise> bitwise(
        m, "BitwiseRLECompressedData", py::buffer_protocol(),
        (std::string(R"doc(An image held as alternating runs of 0 and 1 bits.

The raw bytes of the image are read as bits, most significant first, and stored
as run lengths of one byte each: run k counts bits of value k % 2 (a run of 0
starts the stream when its first bit is 1, and follows a run of 255 whose bits
go on). It suits packed masks and other data with long runs of equal bits. The
runs are exported through the buffer protocol and ``bytes(obj)``.

Window decoding moves the library object's read cursor: each call decodes
through a copy of its own (sharing the runs), so one object may be shared
between threads, which decode at once.
)doc") + kImageParametersDoc)
            .c_str());
    bitwise
        .def(py::init<const py::object&, const py::object&>(), py::arg("array"),
             py::arg("sample_type") = py::none())
        .def("decode", &PyBitwise::Decode, py::arg("window") = py::none(),
             (std::string("Decodes the whole image or a window of it.\n\nWindows of one-byte "
                          "pixels seek with the library's cursor; wider pixels are cut from a "
                          "whole decode.") +
              kWindowDoc)
                 .c_str())
        .def("decode_window_raw", &PyBitwise::DecodeWindowRaw, py::arg("x"), py::arg("y"),
             py::arg("width"), py::arg("height"),
             R"doc(The library's own window decoder.

For each row r from y to y + height - 1 it reads ``width`` bytes from byte ``x``
of row r, placing the rows ``width`` x pixel bytes apart: ``x`` and ``width``
count bytes where they are read and pixels where they are checked, so only
one-byte pixels give a slice of the image. The cursor seeks run by run and
cannot reach a bit inside the last run.

Returns
-------
numpy.ndarray
    A new 1-D uint8 array of ``(height - 1) * width * pixel bytes + width`` bytes.

Raises
------
kubo.OutOfBoundsError
    Unless y < rows, y + height <= rows, x < columns and x + width <= columns.
kubo.DataError
    When a row starts inside the last run ("Uncompressed index not found.").
ValueError
    For a negative width or height.
)doc")
        .def_buffer([](const PyBitwise& self) { return CompressedBuffer(self.Get()); });
    AddArrayProperties<decltype(bitwise), PyBitwise>(bitwise);

    py::class_<PyLineMask>(m, "LineRLECompressedBitMask",
                           R"doc(A two-valued mask held as one run stream per row.

Each row is its own stream of one-byte run lengths, alternately clear and set,
starting with clear, so rows can be decoded, replaced or read in part on their
own. Decoded pixels are True where the source was non-zero.

Safe to share between threads: replacing a row waits for decoders and the
other way round.

Parameters
----------
array : numpy.ndarray
    A mask of shape (rows, columns), one byte a pixel (bool, uint8 or int8),
    zero for clear; rows may be strided (each is read where it lies).
)doc")
        .def(py::init<const py::object&>(), py::arg("array"))
        .def_static(
            "from_runs",
            [](long long columns, const py::buffer& runs, const py::object& rowSizes) {
                return std::make_unique<PyLineMask>(columns, runs, rowSizes);
            },
            py::arg("columns"), py::arg("runs"), py::arg("row_sizes"),
            R"doc(The mask of ``columns`` pixels a row whose rows hold the given runs.

The inverse of ``bytes(mask)`` and ``mask.row_sizes``: ``from_runs(columns,
bytes(mask), mask.row_sizes)`` equals ``mask``. Each row is compressed again from
its flags, so runs the library did not write (zero-length runs inside a row) come
out in the library's form.

Parameters
----------
columns : int
    Pixels a row.
runs : bytes-like
    Every row's runs one after the other.
row_sizes : array-like of int
    The number of runs (bytes) of each row.

Returns
-------
LineRLECompressedBitMask
    A new mask of ``len(row_sizes)`` rows.

Raises
------
TypeError
    For runs that are not contiguous bytes.
ValueError
    For row sizes that do not add up to the runs, or a row whose runs do not cover
    exactly ``columns`` pixels.
)doc")
        .def(py::pickle(
            [](const PyLineMask& mask) {
                return py::make_tuple(mask.Shape()[1], mask.Bytes(), mask.RowSizes());
            },
            [](const py::tuple& state) {
                return std::make_unique<PyLineMask>(state[0].cast<long long>(),
                                                    state[1].cast<py::buffer>(), state[2]);
            }))
        .def("decode", &PyLineMask::Decode, py::arg("window") = py::none(),
             (std::string("Decodes the whole mask or a window of it (bool arrays).") + kWindowDoc)
                 .c_str())
        .def("decode_window_raw", &PyLineMask::DecodeWindowRaw, py::arg("x"), py::arg("y"),
             py::arg("width"), py::arg("height"),
             R"doc(The library's own window decoder, unchecked.

Rows past the last read as clear, and so do pixels past the end of a row's runs.

Returns
-------
numpy.ndarray
    A new uint8 array of ``width * height`` bytes (0 or 1), rows one after another.

Raises
------
kubo.DataError
    When ``x`` lies past the end of a row's runs ("Uncompressed index not found.").
ValueError
    For a negative width or height.
)doc")
        .def("decode_row", &PyLineMask::DecodeRow, py::arg("row"),
             "The flags of one row, a new bool array.\n\nRaises\n------\nIndexError\n"
             "    For a row that does not exist.")
        .def("replace_row", &PyLineMask::ReplaceRow, py::arg("row"), py::arg("values"),
             "Compresses ``values`` (a 1-D array of one byte a pixel) into ``row``.\n\n"
             "Raises\n------\nIndexError\n    For a row that does not exist.\nValueError\n"
             "    For values of another length.")
        .def("compressed_row", &PyLineMask::CompressedRow, py::arg("row"),
             "The runs of one row, as bytes.")
        .def_property_readonly("row_sizes", &PyLineMask::RowSizes,
                               "The number of runs (bytes) of each row, a uint32 array.")
        .def_property_readonly("shape", &PyLineMask::Shape, "(rows, columns).")
        .def("__bytes__", &PyLineMask::Bytes,
             "Every row's runs one after the other (split them with ``row_sizes``).");
}

}  // namespace kora::kubo::python
