// A sample value with one more bit of state: the storage of listed channels for the
// 64-bit element types, which have no wider type to hold an out-of-range marker.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_ONEMOREBIT_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_ONEMOREBIT_H

/// A no-data value of type T and a tag saying how samples compare with it.
template <class T>
struct OneMoreBit {
    enum Tag : unsigned char {
        kCompared = 0,     ///< a sample matches when it equals `value`
        kUntested = 1,     ///< the channel is not tested
        kMatchesNone = 2,  ///< no sample matches (never made by the factory)
        kMatchesAll = 3    ///< every sample matches (never made by the factory)
    };

    T value;
    unsigned char tag;
};

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_ONEMOREBIT_H
