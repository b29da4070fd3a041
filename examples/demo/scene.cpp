// Value-noise terrain and speckled radar scene. Integer hashing instead of the standard
// distributions keeps the pictures identical on every platform.
#include "scene.h"

#include <algorithm>
#include <cmath>

namespace demo {
namespace {

std::uint32_t Hash(std::uint32_t x, std::uint32_t y, std::uint32_t seed) {
    std::uint32_t h = x * 0x8da6b343u ^ y * 0xd8163841u ^ seed * 0xcb1ab31fu;
    h ^= h >> 15;
    h *= 0x2c1b3c6du;
    h ^= h >> 12;
    h *= 0x297a2d39u;
    h ^= h >> 15;
    return h;
}

double Unit(std::uint32_t h) { return (h >> 8) * (1.0 / 16777216.0); }

double Smooth(double t) { return t * t * (3.0 - 2.0 * t); }

// Bilinear value noise on a lattice of `cell` pixels, smoothed.
double ValueNoise(double x, double y, std::uint32_t seed) {
    const double fx = std::floor(x);
    const double fy = std::floor(y);
    const auto ix = static_cast<std::uint32_t>(static_cast<std::int64_t>(fx));
    const auto iy = static_cast<std::uint32_t>(static_cast<std::int64_t>(fy));
    const double tx = Smooth(x - fx);
    const double ty = Smooth(y - fy);
    const double top = Unit(Hash(ix, iy, seed)) * (1 - tx) + Unit(Hash(ix + 1, iy, seed)) * tx;
    const double bottom =
        Unit(Hash(ix, iy + 1, seed)) * (1 - tx) + Unit(Hash(ix + 1, iy + 1, seed)) * tx;
    return top * (1 - ty) + bottom * ty;
}

double Fractal(double x, double y, std::uint32_t seed) {
    double sum = 0.0;
    double amplitude = 0.5;
    double frequency = 1.0;
    for (std::uint32_t octave = 0; octave < 6; ++octave) {
        sum += amplitude * ValueNoise(x * frequency, y * frequency, seed + octave);
        amplitude *= 0.5;
        frequency *= 2.0;
    }
    return sum / (1.0 - std::pow(0.5, 6));
}

}  // namespace

Terrain MakeTerrain(unsigned int width, unsigned int height, std::uint32_t seed) {
    Terrain terrain{width, height, std::vector<std::uint16_t>(std::size_t{width} * height)};
    const double scale = 6.0 / std::max(width, height);
    for (unsigned int y = 0; y < height; ++y) {
        for (unsigned int x = 0; x < width; ++x) {
            // Ridged relief: valleys are sharp, summits rounded.
            const double n = Fractal(x * scale, y * scale, seed);
            const double ridged = 1.0 - std::fabs(2.0 * n - 1.0);
            const double elevation = std::clamp(0.15 + 0.85 * ridged * ridged, 0.0, 1.0);
            std::uint16_t value = static_cast<std::uint16_t>(1 + elevation * 4094.0);

            // A skewed footprint leaves a no-data border, as a rotated scene does.
            const double u = (x + 0.25 * y) / (1.25 * width);
            const double v = (y + 0.15 * (width - x)) / (1.15 * height);
            const bool outside = u < 0.04 || u > 0.96 || v < 0.05 || v > 0.95;
            // Cloud-like holes where a second noise field peaks.
            const bool hole = Fractal(x * scale * 1.7, y * scale * 1.7, seed ^ 0x5bd1e995u) > 0.78;
            if (outside || hole) {
                value = kNoData;
            }
            terrain.heights[std::size_t{y} * width + x] = value;
        }
    }
    return terrain;
}

ComplexScene MakeRadarScene(const Terrain& terrain, std::uint32_t seed) {
    const unsigned int w = terrain.width;
    const unsigned int h = terrain.height;
    ComplexScene scene{w, h, std::vector<std::int16_t>(std::size_t{w} * h * 2)};
    constexpr double kTwoPi = 6.283185307179586;
    for (unsigned int y = 0; y < h; ++y) {
        for (unsigned int x = 0; x < w; ++x) {
            const auto at = [&](unsigned int cx, unsigned int cy) {
                return static_cast<double>(
                    terrain.heights[std::size_t{std::min(cy, h - 1)} * w + std::min(cx, w - 1)]);
            };
            // Slopes facing the sensor (west) return more energy.
            const double slope = (at(x + 1, y) - at(x, y)) / 64.0;
            const double brightness = std::clamp(0.35 + slope, 0.02, 1.0);
            // Exponential intensity speckle: amplitude = sqrt(-ln(u)).
            const double u = std::max(Unit(Hash(x, y, seed)), 1e-6);
            const double amplitude = 6000.0 * brightness * std::sqrt(-std::log(u));
            const double phase = kTwoPi * Unit(Hash(x, y, seed ^ 0x9e3779b9u));
            const std::size_t i = (std::size_t{y} * w + x) * 2;
            scene.samples[i] = static_cast<std::int16_t>(
                std::clamp(amplitude * std::cos(phase), -32768.0, 32767.0));
            scene.samples[i + 1] = static_cast<std::int16_t>(
                std::clamp(amplitude * std::sin(phase), -32768.0, 32767.0));
        }
    }
    return scene;
}

}  // namespace demo
