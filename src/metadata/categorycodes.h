#ifndef MCOBNQRT_CATEGORYCODES_H
#define MCOBNQRT_CATEGORYCODES_H

#include "base/growth.h"

#include <iosfwd>
#include <map>
#include <string>
#include <vector>

class IBINUserMissing;

// What the two categorical encoders share. Both hold a map from value to code and a table from code to value, and give
// the codes 0 to lastCode in the order of first sight.

/// The code of a missing category.
inline constexpr double kMissingCode = -1.0;

/// The code of `value`; a new value gets the next one, and `entryOf` makes its entry of the table from the map's key.
/// If the memory doesn't suffice, nothing has changed.
template<class Value, class Entry, class EntryOf>
double FindOrAddCode(std::map<Value, int>& codes, std::vector<Entry>& table, int& lastCode, const Value& value,
                     EntryOf entryOf)
{
    const auto found = codes.lower_bound(value);
    if (found != codes.end() && found->first == value)
        return found->second;
    ReserveOneMore(table);
    const auto added = codes.emplace_hint(found, value, lastCode + 1);
    // From here on nothing can fail: map, table and last code stay in step.
    table.push_back(entryOf(added->first));
    return ++lastCode;
}

/// The code of `value`, kMissingCode if it has none.
template<class Value>
double FindCode(const std::map<Value, int>& codes, const Value& value)
{
    const auto found = codes.find(value);
    return found == codes.end() ? kMissingCode : found->second;
}

/// Replaces all labels.
void ReplaceLabels(std::vector<std::string>& labels, const std::vector<std::string>& replacement);

/// Fills `labels` up to the number of categories with empty ones and sets the one of `code`, if there is such a
/// category.
void StoreLabel(std::vector<std::string>& labels, int numberOfCategories, int code, const std::string& label);

/// Writes an encoder's user-missing object under its heading, nothing without one. The weight's encoder does so too.
void DisplayUserMissingOfEncoder(std::ostream& os, const IBINUserMissing* userMissing);

#endif
