#ifndef MCOBNQRT_BINS_JSONBUILDER_H
#define MCOBNQRT_BINS_JSONBUILDER_H

#include "bins/jsonvalue.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

/// Makes a JsonValue of what a parser meets, in the order of the text. The caller sees to it that each object and array
/// is ended, and that a key stands in front of each value in an object.
class JsonBuilder
{
public:
    void AddNull() { Add(JsonValue()); }
    void AddBoolean(bool value) { Add(value); }
    void AddInteger(std::int64_t value) { Add(value); }
    void AddNumber(double value) { Add(value); }
    void AddString(std::string value) { Add(std::move(value)); }

    /// \throw JsonFault if arrays and objects are nested deeper than any document of bins.
    void BeginObject();
    void BeginArray();
    void End() { fOpen.pop_back(); }

    void AddKey(std::string key) { fKey = std::move(key); }

    /// The first value, once it is complete.
    const JsonValue& GetValue() const { return fValue; }

private:
    JsonValue& Add(JsonValue value);
    void Begin(JsonValue value);

    JsonValue fValue;
    std::vector<JsonValue*> fOpen; ///< the last element of each is the next one, as far as there is one
    std::string fKey;
};

#endif
