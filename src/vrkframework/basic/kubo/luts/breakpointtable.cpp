// Construction of the breakpoints the lookup and pseudocolour tables share: their order and
// the layout of their inputs for the search.
#include "vrkframework/basic/kubo/luts/breakpointtable.h"

#include <utility>  // std::move

#include "vrkframework/basic/kubo/luts/breakpoints.h"
#include "vrkframework/basic/kubo/luts/pct.h"

namespace kora::kubo::detail {

template <class Value>
BreakpointTable<Value>::BreakpointTable(std::vector<Entry> entries)
    : m_entries(std::move(entries)) {
    SortByInput(m_entries);
    m_inputBlocks = InputBlocks(m_entries);
}

template class BreakpointTable<double>;
template class BreakpointTable<PCT::Colour>;

}  // namespace kora::kubo::detail
