#include "hosts/mcbin/input/jsoninput.h"

#include "bins/json.h"
#include "bins/jsonbuilder.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/inputfile.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <limits>

namespace
{

using Json = nlohmann::json;

std::string ReadAll(const std::string& path)
{
    InputFile file(path);
    std::string text;
    for (;;)
    {
        constexpr std::size_t kBlockSize = 1 << 16;
        const std::size_t size = text.size();
        text.resize(size + kBlockSize);
        text.resize(size + file.Read(text.data() + size, kBlockSize));
        if (text.size() < size + kBlockSize)
            return text;
    }
}

/// Hands what the parser meets to the builder. The operations are the parser's, and return whether it shall go on.
class Handler : public nlohmann::json_sax<Json>
{
public:
    explicit Handler(const std::string& text) : fText(text) {}

    const JsonValue& GetValue() const { return fBuilder.GetValue(); }

    bool null() override { return fBuilder.AddNull(), true; }
    bool boolean(bool value) override { return fBuilder.AddBoolean(value), true; }
    bool number_integer(number_integer_t value) override { return fBuilder.AddInteger(value), true; }
    bool number_unsigned(number_unsigned_t value) override
    {
        if (value > static_cast<number_unsigned_t>(std::numeric_limits<std::int64_t>::max()))
            return number_float(static_cast<double>(value), "");
        return number_integer(static_cast<number_integer_t>(value));
    }
    bool number_float(number_float_t value, const string_t&) override { return fBuilder.AddNumber(value), true; }
    bool string(string_t& value) override { return fBuilder.AddString(std::move(value)), true; }
    bool binary(binary_t&) override { return false; } // JSON has none
    bool start_object(std::size_t) override { return fBuilder.BeginObject(), true; }
    bool key(string_t& value) override { return fBuilder.AddKey(std::move(value)), true; }
    bool end_object() override { return fBuilder.End(), true; }
    bool start_array(std::size_t) override { return fBuilder.BeginArray(), true; }
    bool end_array() override { return fBuilder.End(), true; }

    bool parse_error(std::size_t position, const std::string&, const Json::exception&) override
    {
        const auto end = fText.begin() + static_cast<std::ptrdiff_t>(std::min(position, fText.size()));
        throw MakeNotJson(1 + std::count(fText.begin(), end, '\n'));
    }

private:
    const std::string& fText;
    JsonBuilder fBuilder;
};

} // namespace

Bins ReadJson(const std::string& path, Edits edits)
{
    const std::string text = ReadAll(path);
    try
    {
        Handler handler(text);
        Json::sax_parse(text, &handler);
        return ReadBins(handler.GetValue(), edits);
    }
    catch (const JsonFault& fault)
    {
        throw Failure(path + ": " + fault.what());
    }
}
