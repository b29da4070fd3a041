// Links against kubo through its public target and umbrella header only.
#include <vrkframework/basic/kubo/kubo.h>

#include <cstdio>

int main() {
    const kora::kubo::Raster raster(kora::kubo::RasterInfo(4, 3, 1, kora::kubo::DataType::Type16U),
                                    kora::kubo::RasterContext(1, 1, 0, 0));
    try {
        kora::kubo::TileIterator(0, 1);
    } catch (const kora::Exception& failure) {
        std::printf("kubo consumer: %s, %llu buffer bytes\n", failure.what(),
                    static_cast<unsigned long long>(raster.byteSize));
        return raster.byteSize == 60 ? 0 : 1;
    }
    return 1;
}
