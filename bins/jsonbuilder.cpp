#include "bins/jsonbuilder.h"

#include "bins/json.h"

void JsonBuilder::BeginObject()
{
    Begin(JsonValue::Object());
}

void JsonBuilder::BeginArray()
{
    Begin(JsonValue::Array());
}

void JsonBuilder::Begin(JsonValue value)
{
    constexpr std::size_t kDeepest = 100;
    if (fOpen.size() == kDeepest)
        throw JsonFault("this is not a document of bins");
    // The element stays where it is until it is ended: nothing is added beside it before that.
    fOpen.push_back(&Add(std::move(value)));
}

JsonValue& JsonBuilder::Add(JsonValue value)
{
    if (fOpen.empty())
        return fValue = std::move(value);
    if (auto* const array = std::get_if<JsonValue::Array>(&fOpen.back()->held))
        return array->emplace_back(std::move(value));
    auto& object = std::get<JsonValue::Object>(fOpen.back()->held);
    object.push_back({std::move(fKey), std::move(value)});
    return object.back().value;
}
