// Sample formats of the outside raster library's buffers.
#ifndef VRKFRAMEWORK_PLATFORM_BUFFERTYPE_H
#define VRKFRAMEWORK_PLATFORM_BUFFERTYPE_H

/// Types of the outside raster library the framework exchanges buffers with.
namespace raster {

/// Sample format of a buffer. Only the values are fixed; see
/// kora::kubo::VRKDataType2RasterBufferType for the mapping from a DataType.
enum BufferType {
    BUFFER_1U = 0,   ///< one bit
    BUFFER_8S = 1,   ///< signed 8-bit integer
    BUFFER_8U = 2,   ///< unsigned 8-bit integer
    BUFFER_16S = 3,  ///< signed 16-bit integer
    BUFFER_16U = 4,  ///< unsigned 16-bit integer
    BUFFER_32S = 5,  ///< signed 32-bit integer
    BUFFER_32U = 6,  ///< unsigned 32-bit integer
    BUFFER_32R = 7,  ///< 32-bit float
    BUFFER_64S = 8,  ///< signed 64-bit integer
    BUFFER_64U = 9,  ///< unsigned 64-bit integer
    BUFFER_64R = 10  ///< 64-bit float
};

}  // namespace raster

#endif  // VRKFRAMEWORK_PLATFORM_BUFFERTYPE_H
