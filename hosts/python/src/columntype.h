#ifndef MCBINNING_COLUMNTYPE_H
#define MCBINNING_COLUMNTYPE_H

#include "hosts/python/src/arrowabi.h"

#include <string>

/// How a column of a stream is stored, and what its values are to a user.
struct ColumnType
{
    enum class Storage
    {
        kNone, ///< a type that can't be binned, such as a nested one
        kNull, ///< all values are missing
        kBit,
        kInt8,
        kInt16,
        kInt32,
        kInt64,
        kUint8,
        kUint16,
        kUint32,
        kUint64,
        kHalf,
        kFloat,
        kDouble,
        kDecimal128,
        kText,      ///< offsets of 32 bits
        kLargeText, ///< offsets of 64 bits
        kTextView
    };

    Storage storage = Storage::kNone;
    /// "float", "integer", "boolean", "decimal", "date", "timestamp", "text" or "null"; of others, words for a message.
    std::string kind;
    /// Of a timestamp: the name of its time zone, empty without one.
    std::string timeZone;
    /// A number is the stored one times `factor`, divided by `divisor`: days of dates, microseconds of timestamps.
    double factor = 1.0;
    double divisor = 1.0;
    /// The stored numbers are indices in a dictionary, and what is told above is about its values.
    bool isDictionary = false;
    Storage indexStorage = Storage::kNone; ///< of a dictionary
    bool isOrdered = false;                ///< the order of the dictionary is that of its values

    bool IsText() const
    {
        return storage == Storage::kText || storage == Storage::kLargeText || storage == Storage::kTextView;
    }
};

ColumnType ReadColumnType(const ArrowSchema& schema);

#endif
