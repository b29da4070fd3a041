// Value ranges of sample types.
#include "vrkframework/basic/kubo/raster/datatypeconstraints.h"

#include <cmath>  // std::pow
#include <limits>

#include "vrkframework/basic/kubo/raster/datatype.h"

namespace kora::kubo {
namespace {

struct Range {
    double min;
    double max;
    double epsilon;
};

// The range of one component; powers of two go through std::pow in double, so 64U
// gets 2^64 - 1 rounded to 2^64.
Range NaturalRange(const DataType& type) {
    const double n = type.bits;
    if (!type.isSigned) {
        return {0.0, std::pow(2.0, n) - 1.0, 1.0};
    }
    if (type.isFloat) {
        if (type.bits <= 32) {
            constexpr auto kFloatMax = static_cast<double>(std::numeric_limits<float>::max());
            return {-kFloatMax, kFloatMax, std::pow(2.0, -23.0)};
        }
        constexpr double kDoubleMax = std::numeric_limits<double>::max();
        return {-kDoubleMax, kDoubleMax, std::pow(2.0, -52.0)};
    }
    const double half = std::pow(2.0, n - 1.0);
    return {-half, half - 1.0, 1.0};
}

}  // namespace

IDataTypeConstraints::~IDataTypeConstraints() = default;

DataTypeConstraints::DataTypeConstraints() : m_min(0.0), m_max(0.0), m_epsilon(0.0) {}

DataTypeConstraints::DataTypeConstraints(double min, double max, double epsilon)
    : m_min(min), m_max(max), m_epsilon(epsilon) {}

DataTypeConstraints::DataTypeConstraints(const DataType& type) {
    const Range range = NaturalRange(type);
    m_min = range.min;
    m_max = range.max;
    m_epsilon = range.epsilon;
}

DataTypeConstraints::DataTypeConstraints(const DataTypeConstraints& other) = default;

DataTypeConstraints& DataTypeConstraints::operator=(const DataTypeConstraints& other) = default;

DataTypeConstraints& DataTypeConstraints::operator=(const IDataTypeConstraints& other) {
    // Read in this order through the interface, so any implementation can be assigned.
    const double min = other.GetMin();
    const double max = other.GetMax();
    const double epsilon = other.GetEpsilon();
    m_min = min;
    m_max = max;
    m_epsilon = epsilon;
    return *this;
}

DataTypeConstraints::~DataTypeConstraints() = default;

bool DataTypeConstraints::IsBounded(const DataType& type) const {
    const Range range = NaturalRange(type);
    return range.min < m_min || range.max > m_max;
}

double DataTypeConstraints::GetMin() const { return m_min; }
double DataTypeConstraints::GetMax() const { return m_max; }
double DataTypeConstraints::GetEpsilon() const { return m_epsilon; }

}  // namespace kora::kubo
