#ifndef MCBINNING_FAULTS_H
#define MCBINNING_FAULTS_H

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>

/// The data can't be used. Becomes the package's DataError.
class DataFault : public std::runtime_error
{
public:
    /// `row` counts from 0; -1 where the fault is not one of a row. A column's name may be empty; none is nullopt.
    explicit DataFault(const std::string& message, std::optional<std::string> column = std::nullopt,
                       std::int64_t row = -1)
        : std::runtime_error(message), fColumn(std::move(column)), fRow(row)
    {
    }

    const std::optional<std::string>& GetColumn() const { return fColumn; }
    std::int64_t GetRow() const { return fRow; }

private:
    std::optional<std::string> fColumn;
    std::int64_t fRow;
};

/// The stream of batches failed behind `row` rows. Becomes the package's StreamError.
class StreamFault : public std::runtime_error
{
public:
    StreamFault(const std::string& message, std::int64_t row) : std::runtime_error(message), fRow(row) {}

    std::int64_t GetRow() const { return fRow; }

private:
    std::int64_t fRow;
};

#endif
