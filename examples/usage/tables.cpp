// Lookup and pseudocolour tables: breakpoints, interpolation and clamping.
#include <vrkframework/basic/kubo/kubo.h>

using namespace kora::kubo;

int main() {
    // Stretch 16-bit heights 200..3800 onto 0..255.
    const LUT stretch({{200.0, 0.0}, {3800.0, 255.0}});

    // Colours interpolate per component and truncate toward zero.
    using Colour = RGBTuple<unsigned char>;
    const PCT palette({{0.0, Colour{0, 0, 0}}, {10.0, Colour{255, 100, 7}}});
    const Colour middle = palette.GetValue(5.0);

    const bool ok = stretch.GetValue(2000.0) == 127.5 && stretch.GetValue(9999.0) == 255.0 &&
                    middle.r == 127 && middle.g == 50 && middle.b == 3;
    return ok ? 0 : 1;
}
