// Binary PGM and PPM files, the simplest formats every image viewer opens.
#ifndef KUBO_EXAMPLES_DEMO_IMAGEFILE_H
#define KUBO_EXAMPLES_DEMO_IMAGEFILE_H

#include <string>

namespace demo {

/// Writes 8-bit grey pixels (width x height bytes); returns false when the file fails.
bool WritePgm(const std::string& path, unsigned int width, unsigned int height,
              const unsigned char* grey);

/// Writes 8-bit RGB pixels (width x height x 3 bytes); returns false when the file fails.
bool WritePpm(const std::string& path, unsigned int width, unsigned int height,
              const unsigned char* rgb);

}  // namespace demo

#endif  // KUBO_EXAMPLES_DEMO_IMAGEFILE_H
