// The value range of a sample type.
#ifndef VRKFRAMEWORK_BASIC_KUBO_RASTER_DATATYPECONSTRAINTS_H
#define VRKFRAMEWORK_BASIC_KUBO_RASTER_DATATYPECONSTRAINTS_H

#include "vrkframework/basic/kubo/kuboapi.h"

namespace kora::kubo {

struct DataType;

/// A closed value range [min, max] with a resolution (epsilon).
class KUBO_API IDataTypeConstraints {
public:
    virtual ~IDataTypeConstraints();
    /// True when the natural range of `type` is not contained in this range.
    virtual bool IsBounded(const DataType& type) const = 0;
    /// Lower bound of the range.
    virtual double GetMin() const = 0;
    /// Upper bound of the range.
    virtual double GetMax() const = 0;
    /// Resolution: the step between neighbouring values.
    virtual double GetEpsilon() const = 0;

protected:
    IDataTypeConstraints() = default;

    /// @name Copying
    ///@{

    /// Only implementations copy; the interface holds no data.
    IDataTypeConstraints(const IDataTypeConstraints&) = default;
    IDataTypeConstraints& operator=(const IDataTypeConstraints&) = default;
    IDataTypeConstraints(IDataTypeConstraints&&) = default;
    IDataTypeConstraints& operator=(IDataTypeConstraints&&) = default;
    ///@}
};

/// A stored range: either given, or the natural range of a type (of one component for
/// complex types).
class KUBO_API DataTypeConstraints : public IDataTypeConstraints {
public:
    /// min = max = epsilon = 0.
    DataTypeConstraints();
    /// Stores the three values as given; they are not checked.
    DataTypeConstraints(double min, double max, double epsilon);
    /// Natural range: [0, 2^n - 1] step 1 for unsigned, the float or double range for
    /// floating types, [-2^(n-1), 2^(n-1) - 1] step 1 for signed integers.
    explicit DataTypeConstraints(const DataType& type);

    /// @name Copying
    ///@{

    /// Copies min, max and epsilon.
    DataTypeConstraints(const DataTypeConstraints& other);
    DataTypeConstraints& operator=(const DataTypeConstraints& other);
    DataTypeConstraints(DataTypeConstraints&&) = default;
    DataTypeConstraints& operator=(DataTypeConstraints&&) = default;
    ///@}

    /// Takes min, max and epsilon through the other range's getters, in that order.
    DataTypeConstraints& operator=(const IDataTypeConstraints& other);
    ~DataTypeConstraints() override;

    bool IsBounded(const DataType& type) const override;
    double GetMin() const override;
    double GetMax() const override;
    double GetEpsilon() const override;

private:
    double m_min;
    double m_max;
    double m_epsilon;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_RASTER_DATATYPECONSTRAINTS_H
