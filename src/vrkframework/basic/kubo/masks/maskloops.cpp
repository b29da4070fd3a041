// The mask loops in use and the filling of a variant's gaps.
#include "vrkframework/basic/kubo/masks/maskloops.h"

#include "vrkframework/basic/core/kernels/kerneltables.h"

namespace kora::kubo::detail {

const MaskLoops& ActiveMaskLoops() { return ActiveKernelTables().masks; }

void FillGaps(MaskLoops& loops, const MaskLoops& before) {
    for (std::size_t rule = 0; rule < loops.flag.size(); ++rule) {
        for (std::size_t stride = 0; stride < loops.flag[rule].size(); ++stride) {
            for (std::size_t type = 0; type < typeconv::detail::kComponentCount; ++type) {
                for (std::size_t kind = 0; kind < 2; ++kind) {
                    FlagLoop& loop = loops.flag[rule][stride][type][kind];
                    loop = loop != nullptr ? loop : before.flag[rule][stride][type][kind];
                }
            }
        }
    }
    loops.pack = loops.pack != nullptr ? loops.pack : before.pack;
}

}  // namespace kora::kubo::detail
