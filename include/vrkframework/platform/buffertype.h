// Sample formats of the outside raster library's buffers.
#ifndef VRKFRAMEWORK_PLATFORM_BUFFERTYPE_H
#define VRKFRAMEWORK_PLATFORM_BUFFERTYPE_H

namespace raster {

enum BufferType {
    BUFFER_1U = 0,
    BUFFER_8S = 1,
    BUFFER_8U = 2,
    BUFFER_16S = 3,
    BUFFER_16U = 4,
    BUFFER_32S = 5,
    BUFFER_32U = 6,
    BUFFER_32R = 7,
    BUFFER_64S = 8,
    BUFFER_64U = 9,
    BUFFER_64R = 10
};

}  // namespace raster

#endif  // VRKFRAMEWORK_PLATFORM_BUFFERTYPE_H
