#ifndef MCOBNQRT_LABELLEDVALUES_H
#define MCOBNQRT_LABELLEDVALUES_H

#include "base/growth.h"

#include <cstddef>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

// The single values of a user-missing object, numbers or strings, and their labels: two vectors in step.

/// Appends to both, or to none if the memory doesn't suffice. Value and label may be elements of the vectors.
template<class Value>
void AppendLabelled(std::vector<Value>& values, std::vector<std::string>& labels, Value value, std::string label)
{
    ReserveOneMore(values);
    ReserveOneMore(labels);
    values.push_back(std::move(value));
    labels.push_back(std::move(label));
}

/// Writes a heading and one line for each value; nothing without values.
template<class Value>
void DisplayLabelled(std::ostream& os, const std::vector<Value>& values, const std::vector<std::string>& labels)
{
    if (values.empty())
        return;
    os << "Discrete missing values:" << std::endl;
    for (std::size_t i = 0; i < values.size(); ++i)
        os << '\t' << i << '\t' << values[i] << ", label = " << labels[i] << std::endl;
}

#endif
