// A kernel request in its final form: complex samples spread over two channels each,
// and the choices that follow from the lists.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_NODATAREQUEST_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_NODATAREQUEST_H

#include <cstdint>  // std::uint64_t
#include <vector>

#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/imaskdecisionimpl.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/nativedatatype.h"

namespace kora::kubo::detail {

struct NoDataRequest {
    NativeDataTypeCode code;     ///< element type; complex types are split into parts
    std::uint64_t channelCount;  ///< channels of the element type
    BkgdRule rule;
    std::vector<double> noData;
    std::vector<std::uint64_t> channels;  ///< 64-bit, so doubling for complex cannot wrap
    bool nothingTested;                   ///< no channel listed, or no value to compare with
    bool single;                          ///< one channel: tested alone whatever the rule and list
    bool listed;  ///< fewer list entries than channels: entries address channels
    bool same;    ///< every value equal (never when listed)

    /// Samples the kernel reads per pixel.
    std::uint64_t Stride() const;
    /// Whether the kernel pairs a pixel's last sample with the next pixel's first: the pair
    /// rule over an odd stride.
    bool ReachesNextPixel() const {
        return !nothingTested && !single && rule == BkgdChanPairs && Stride() % 2 == 1;
    }
};

/// Spreads complex samples over (real, imaginary) channel pairs with 0 as imaginary no-data
/// value and the pair rule for the any-channel rule, and settles the kernel choices.
NoDataRequest MakeNoDataRequest(DataType type, std::uint64_t channelCount, BkgdRule rule,
                                std::vector<double> noData, std::vector<unsigned int> channels);

/// The kernel for a request, or null for an unknown element type or rule.
IMaskDecisionImpl* MakeMaskDecisionImpl(const NoDataRequest& request);

}  // namespace kora::kubo::detail

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_NODATAREQUEST_H
