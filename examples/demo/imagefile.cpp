// Binary PGM (P5) and PPM (P6) writers.
#include "imagefile.h"

#include <fstream>

namespace demo {
namespace {

bool Write(const std::string& path, const char* magic, unsigned int width, unsigned int height,
           const unsigned char* pixels, std::size_t bytesPerPixel) {
    std::ofstream file(path, std::ios::binary);
    file << magic << '\n' << width << ' ' << height << "\n255\n";
    file.write(reinterpret_cast<const char*>(pixels),
               static_cast<std::streamsize>(std::size_t{width} * height * bytesPerPixel));
    return static_cast<bool>(file);
}

}  // namespace

bool WritePgm(const std::string& path, unsigned int width, unsigned int height,
              const unsigned char* grey) {
    return Write(path, "P5", width, height, grey, 1);
}

bool WritePpm(const std::string& path, unsigned int width, unsigned int height,
              const unsigned char* rgb) {
    return Write(path, "P6", width, height, rgb, 3);
}

}  // namespace demo
