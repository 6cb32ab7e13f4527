// `mcbin apply` with a file of bins that somebody has changed. It has to end in an output of which every row is whole,
// or in words.

#include "tests/fuzz/check.h"
#include "tests/fuzz/mcbin.h"
#include "tests/support/tempdir.h"

#include "hosts/mcbin/apply.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/jsoninput.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/options.h"
#include "hosts/mcbin/progress.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <random>
#include <string>
#include <string_view>
#include <vector>

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t* data, std::size_t size, std::size_t maxSize);

namespace
{

using Json = nlohmann::json;

constexpr int kNumRows = 12;

/// The columns that the corpus has bins of, and fields of every kind.
constexpr const char* kTable = "x,y,colour,kind,weight,\"a,b\"\n"
                               "1,-5,red,a,1,0.1\n"
                               "2,1e300,green,b,2,\n"
                               "3,-1e300,blue,a,0.5,1.0\n"
                               "4.5,inf,red,b,1,1\n"
                               "-inf,0,unknown,a,1,2\n"
                               "NA,NA,NA,NA,NA,NA\n"
                               ",,,,,\n"
                               "1.7976931348623157e308,5e-324,red,b,1,-0\n"
                               "abc,99,\"a \"\"quoted\"\" one\",c,1,3\n"
                               "90,999,green,a,1,4\n"
                               "nan,-0,green,b,1,5\n"
                               "0x10,1_000,green,b,1,6\n";

/// All values of the document, and those of them that hold others.
struct Nodes
{
    std::vector<Json*> all;
    std::vector<Json*> containers;
};

void CollectNodes(Json& json, Nodes& nodes)
{
    nodes.all.push_back(&json);
    if (!json.is_structured())
        return;
    if (!json.empty())
        nodes.containers.push_back(&json);
    for (Json& child : json) CollectNodes(child, nodes);
}

Json MakeOddValue(unsigned int choice)
{
    static const std::vector<Json> kValues{nullptr,
                                           true,
                                           0,
                                           -1,
                                           1,
                                           2.5,
                                           1e308,
                                           -1e308,
                                           5e-324,
                                           9223372036854775807,
                                           18446744073709551615U,
                                           "inf",
                                           "nan",
                                           "-inf",
                                           "",
                                           "x",
                                           "y",
                                           "kind",
                                           "red",
                                           "NA",
                                           Json::array(),
                                           Json::object(),
                                           {1, 2, 3},
                                           {""},
                                           "left",
                                           "right",
                                           "weight",
                                           "target",
                                           4294967296,
                                           -2147483649,
                                           120016};
    return kValues[choice % kValues.size()];
}

/// Takes an element out, puts one in a second time, or changes the order.
void ChangeContainer(Json& container, std::mt19937& dice)
{
    const auto position = static_cast<std::ptrdiff_t>(dice() % container.size());
    switch (dice() % 3)
    {
    case 0:
        container.erase(std::next(container.begin(), position));
        break;
    case 1:
        if (container.is_array())
            container.push_back(Json(*std::next(container.begin(), position)));
        break;
    default:
        if (container.is_array())
            std::shuffle(container.begin(), container.end(), dice);
    }
}

void ChangeDocument(Json& document, std::mt19937& dice)
{
    Nodes nodes;
    CollectNodes(document, nodes);
    Json& node = *nodes.all[dice() % nodes.all.size()];
    const Json other = *nodes.all[dice() % nodes.all.size()];
    switch (dice() % 4)
    {
    case 0:
        node = other;
        break;
    case 1:
        node = MakeOddValue(static_cast<unsigned int>(dice()));
        break;
    default:
        if (!nodes.containers.empty())
            ChangeContainer(*nodes.containers[dice() % nodes.containers.size()], dice);
    }
}

/// \return whether there is an output.
bool Apply(const ApplyOptions& options)
{
    Progress progress(false);
    try
    {
        ApplyBins(options, progress);
        return true;
    }
    catch (const Failure& failure)
    {
        Check(*failure.what() != '\0', "a failure without words");
        return false;
    }
}

/// The output has a row for each of the input, and fields as its header says, which the reader looks after.
void CheckOutput(const ApplyOptions& options)
{
    TableOptions tableOptions;
    tableOptions.file = options.output;
    tableOptions.delimiter = ',';
    TableReader table(tableOptions);
    int numRows = 0;
    while (table.NextRow()) ++numRows;
    Check(numRows == kNumRows, "rows of the output");
}

} // namespace

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t* data, std::size_t size, std::size_t maxSize,
                                               unsigned int seed)
{
    std::mt19937 dice(seed);
    Json document = Json::parse(data, data + size, nullptr, false);
    if (document.is_discarded() || dice() % 8 == 0)
        return LLVMFuzzerMutate(data, size, maxSize);
    for (unsigned int i = 1 + dice() % 3; i > 0; --i) ChangeDocument(document, dice);
    const std::string text = document.dump(-1, ' ', false, Json::error_handler_t::replace);
    if (text.size() > maxSize)
        return LLVMFuzzerMutate(data, size, maxSize);
    std::memcpy(data, text.data(), text.size());
    return text.size();
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size)
{
    static const TempDir directory;
    ApplyOptions options;
    options.bins = directory.File("bins.json");
    options.table.file = directory.File("table.csv");
    options.output = directory.File("binned.csv");
    WriteFile(options.table.file, kTable);
    WriteFile(options.bins, std::string_view(reinterpret_cast<const char*>(bytes), size));

    options.isBadMissing = true;
    const bool isWhole = Apply(options);
    if (isWhole)
        CheckOutput(options);
    options.encoding = Encoding::kLabel;
    Check(Apply(options) == isWhole, "labels fail where numbers don't, or the other way round");
    if (isWhole)
        CheckOutput(options);
    options.isInPlace = true;
    options.isBadMissing = false;
    Apply(options);
    return 0;
}
