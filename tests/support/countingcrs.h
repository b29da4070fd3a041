// A coordinate reference system double that records the life of itself and its clones.
#ifndef KUBO_TESTS_SUPPORT_COUNTINGCRS_H
#define KUBO_TESTS_SUPPORT_COUNTINGCRS_H

#include <algorithm>
#include <cstddef>
#include <memory>
#include <utility>
#include <vector>

#include "vrkframework/platform/crs.h"

namespace kubo_test {

/// Shared by an original CountingCRS and all its clones.
struct CRSLedger {
    /// Reported by every member of the family, so changing it changes held clones too.
    unsigned int dimension = 3;
    /// Destructor runs per object, indexed by serial number (the order of creation).
    std::vector<int> destructions;

    std::size_t Created() const { return destructions.size(); }
    std::size_t Alive() const {
        return static_cast<std::size_t>(std::count(destructions.begin(), destructions.end(), 0));
    }
    bool NoneDestroyedTwice() const {
        return std::all_of(destructions.begin(), destructions.end(), [](int n) { return n <= 1; });
    }
};

class CountingCRS : public kora::ogc::cs::ICRS {
public:
    explicit CountingCRS(std::shared_ptr<CRSLedger> ledger)
        : m_ledger(std::move(ledger)), m_serial(m_ledger->destructions.size()) {
        m_ledger->destructions.push_back(0);
    }
    CountingCRS(const CountingCRS&) = delete;
    CountingCRS& operator=(const CountingCRS&) = delete;
    ~CountingCRS() override { ++m_ledger->destructions[m_serial]; }

    unsigned int GetDimension() const override { return m_ledger->dimension; }
    ICRS* Clone() const override { return new CountingCRS(m_ledger); }
    std::size_t GetSerial() const { return m_serial; }

private:
    std::shared_ptr<CRSLedger> m_ledger;
    std::size_t m_serial;
};

/// Serial number of the CountingCRS that `crs` points at; the largest size_t for null.
inline std::size_t SerialOf(const kora::ogc::cs::ICRS* crs) {
    return crs ? dynamic_cast<const CountingCRS&>(*crs).GetSerial() : static_cast<std::size_t>(-1);
}

}  // namespace kubo_test

#endif  // KUBO_TESTS_SUPPORT_COUNTINGCRS_H
