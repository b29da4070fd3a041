// Synthetic scenes for the demo: a 12-bit terrain with a no-data border and holes, and a
// speckled complex (radar-like) image of the same ground. Deterministic for a given seed.
#ifndef KUBO_EXAMPLES_DEMO_SCENE_H
#define KUBO_EXAMPLES_DEMO_SCENE_H

#include <cstdint>
#include <vector>

namespace demo {

/// Heights in 1..4095 (12 bits) for valid ground, 0 where there is no data.
struct Terrain {
    unsigned int width;
    unsigned int height;
    std::vector<std::uint16_t> heights;
};

/// Interleaved (real, imaginary) pairs of 16-bit signed components.
struct ComplexScene {
    unsigned int width;
    unsigned int height;
    std::vector<std::int16_t> samples;
};

constexpr std::uint16_t kNoData = 0;

Terrain MakeTerrain(unsigned int width, unsigned int height, std::uint32_t seed);

/// Backscatter follows the terrain's slopes; each pixel carries multiplicative speckle and a
/// random phase.
ComplexScene MakeRadarScene(const Terrain& terrain, std::uint32_t seed);

}  // namespace demo

#endif  // KUBO_EXAMPLES_DEMO_SCENE_H
