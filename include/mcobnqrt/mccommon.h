#ifndef MCOBNQRT_MCCOMMON_H
#define MCOBNQRT_MCCOMMON_H

#include <cstddef>
#include <vector>

namespace MCMV
{

/// The system-missing double: stands in a record where there is no value, and in a result for a figure that was not
/// found. It is always tested by equality. It is the most negative finite double, so no data can hold it as a value.
inline constexpr double gMissingValue = -1.7976931348623157e308;

} // namespace MCMV

namespace MCCommon
{

/// One record: an array of doubles of a size fixed at construction, one field for each variable of the host's
/// BINVarList. Field i belongs to variable i. A copy shares nothing with its source.
class Record
{
public:
    /// A record of `size` fields, all 0.0. A negative size counts as 0.
    explicit Record(int size) : fFields(size > 0 ? static_cast<std::size_t>(size) : 0, 0.0) {}

    /// The field at `index`. \throw std::out_of_range if there is no such field.
    double& operator[](int index) { return fFields.at(static_cast<std::size_t>(index)); }

    /// The field at `index`, or gMissingValue if there is no such field: what a record does not hold is missing.
    double operator[](int index) const
    {
        return index >= 0 && index < GetSize() ? fFields[static_cast<std::size_t>(index)] : MCMV::gMissingValue;
    }

    int GetSize() const { return static_cast<int>(fFields.size()); }

private:
    std::vector<double> fFields;
};

} // namespace MCCommon

#endif
