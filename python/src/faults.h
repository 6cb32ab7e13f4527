#ifndef MCBINNING_FAULTS_H
#define MCBINNING_FAULTS_H

#include <cstdint>
#include <stdexcept>
#include <string>

/// The data can't be used. Becomes the package's DataError.
class DataFault : public std::runtime_error
{
public:
    /// `row` counts from 0; -1 where the fault is not one of a row. The column may be empty, too.
    DataFault(const std::string& message, std::string column = {}, std::int64_t row = -1)
        : std::runtime_error(message), fColumn(std::move(column)), fRow(row)
    {
    }

    const std::string& GetColumn() const { return fColumn; }
    std::int64_t GetRow() const { return fRow; }

private:
    std::string fColumn;
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
