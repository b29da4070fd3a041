// The rules that decide when a pixel's samples make it background.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_BKGDRULE_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_BKGDRULE_H

namespace kora::kubo {

/// When a pixel is background (no data), judged on its tested channels. The underlying
/// type is fixed so that any 32-bit value may be stored; values other than the three
/// below yield no decision kernel.
enum BkgdRule : int {
    BkgdAllChans = 0,  ///< every tested channel equals its no-data value
    BkgdAnyChan = 1,   ///< at least one tested channel equals its no-data value
    BkgdChanPairs = 2  ///< both channels of at least one adjacent pair do (complex data)
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_BKGDRULE_H
