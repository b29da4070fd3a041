// Scalar interpretations of a complex sample as one real value.
#ifndef VRKFRAMEWORK_PLATFORM_INTERPRETATION_H
#define VRKFRAMEWORK_PLATFORM_INTERPRETATION_H

#include "vrkframework/platform/platformapi.h"

/// Framework core services the library uses: the complex interpretations.
namespace kora::core {

/// How a complex sample (re, im) is read as one real value.
enum KORAInterpretationTypes {
    INTERPRETATION_REAL = 0,       ///< real part
    INTERPRETATION_IMAGINARY = 1,  ///< imaginary part
    INTERPRETATION_AMPLITUDE = 2,  ///< sqrt(re^2 + im^2)
    INTERPRETATION_PHASE = 3,      ///< atan2(im, re)
    INTERPRETATION_INTENSITY = 4,  ///< re^2 + im^2
    INTERPRETATION_DB = 5          ///< 10 * log10(re^2 + im^2)
};

/// An interpretation: the real value of the complex sample (real, imaginary).
using InterpretationFunction = double (*)(double real, double imaginary);

/// Returns the function of an interpretation code; never null.
/// @throws kora::Exception for a code outside KORAInterpretationTypes.
KORA_PLATFORM_API InterpretationFunction FindInterpretation(KORAInterpretationTypes type);

}  // namespace kora::core

#endif  // VRKFRAMEWORK_PLATFORM_INTERPRETATION_H
