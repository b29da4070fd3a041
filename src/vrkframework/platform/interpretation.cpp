// The six complex-to-real interpretations.
#include "vrkframework/platform/interpretation.h"

#include <cmath>  // std::sqrt, std::atan2, std::log10

#include "vrkframework/platform/exception.h"

namespace kora::core {
namespace {

constexpr char kSourcePath[] = "vrkframework/platform/interpretation";
constexpr char kFindSignature[] =
    "kora::core::InterpretationFunction kora::core::FindInterpretation("
    "kora::core::KORAInterpretationTypes)";

double Real(double real, double /*imaginary*/) { return real; }
double Imaginary(double /*real*/, double imaginary) { return imaginary; }
double Intensity(double real, double imaginary) { return real * real + imaginary * imaginary; }
double Amplitude(double real, double imaginary) { return std::sqrt(Intensity(real, imaginary)); }
double Phase(double real, double imaginary) { return std::atan2(imaginary, real); }
double Decibel(double real, double imaginary) {
    return 10.0 * std::log10(Intensity(real, imaginary));
}

}  // namespace

InterpretationFunction FindInterpretation(KORAInterpretationTypes type) {
    switch (type) {
        case INTERPRETATION_REAL:
            return &Real;
        case INTERPRETATION_IMAGINARY:
            return &Imaginary;
        case INTERPRETATION_AMPLITUDE:
            return &Amplitude;
        case INTERPRETATION_PHASE:
            return &Phase;
        case INTERPRETATION_INTENSITY:
            return &Intensity;
        case INTERPRETATION_DB:
            return &Decibel;
    }
    throw Exception("Unknown interpretation requested.", kSourcePath, kFindSignature, 44);
}

}  // namespace kora::core
