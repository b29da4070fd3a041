// The largest extent a mask can describe, checked by the mask and its builders before any
// work (private to the library).
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKEXTENT_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKEXTENT_H

namespace kora::kubo {
class RasterContext;
class RasterInfo;
}  // namespace kora::kubo

namespace kora::kubo::detail {

/// Throws kora::OutOfBoundsException, reported from `sourcePath` and `function`, unless the
/// full width and height (margins included) each fit a signed 32-bit int and their product,
/// the bit count, an unsigned one: the mask's sizes are 32-bit fields.
void CheckMaskExtent(const RasterInfo& info, const RasterContext& context, const char* sourcePath,
                     const char* function);

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_MASKEXTENT_H
