#include "hosts/mcbin/cutpoints.h"

#include "bins/edit.h"
#include "bins/numbers.h"
#include "bins/text.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/tableprofile.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/input/variables.h"
#include "hosts/mcbin/options.h"
#include "hosts/mcbin/text.h"

#include <algorithm>
#include <map>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace
{

/// The cut points of one attribute, as in "age=18,25,40".
std::pair<std::string, std::vector<double>> ParseCuts(const std::string& text)
{
    const std::size_t equals = text.rfind('=');
    const std::string name = text.substr(0, equals);
    std::vector<double> cuts;
    for (const std::string& field : Split(equals == std::string::npos ? "" : text.substr(equals + 1), ','))
    {
        const std::optional<double> cut = ParseNumber(field);
        if (!cut)
            throw Failure("--cuts: " + Quote(text) + " is not of the form COLUMN=18,25,40");
        cuts.push_back(*cut);
    }
    return {name, cuts};
}

/// \throw Failure if the cut points do not rise.
AttributeBins Cut(const AttributeBins& uncut, const std::vector<double>& cutPoints)
{
    try
    {
        return Recut(uncut, cutPoints);
    }
    catch (const std::invalid_argument& fault)
    {
        throw Failure("--cuts: " + Quote(uncut.attribute->name) + ": " + fault.what());
    }
}

} // namespace

Bins MakeBinsOfCutPoints(TableReader& table, const EvaluateOptions& options, Progress& progress)
{
    ColumnOptions columns = options.columns;
    std::map<std::string, std::vector<double>> cuts;
    for (const std::string& text : options.cuts)
    {
        auto [name, points] = ParseCuts(text);
        columns.attributes.push_back(EscapePattern(name));
        columns.continuous.push_back(EscapePattern(name));
        cuts[name] = std::move(points);
    }
    ColumnPlan plan = PlanColumns(table, columns);
    ProfileTable(table, plan, progress, Care::kThorough);
    const Variables variables = MakeVariables(plan);
    table.Rewind();

    Bins bins;
    bins.settings = options.settings;
    bins.settings.method = columns.target.empty() ? Method::kEqualFrequency : Method::kSupervised;
    bins.variables = DescribeVariables(plan, variables);
    const auto isTarget = [](const auto& variable) { return variable->role == VariableRole::kTarget; };
    const auto target = std::find_if(bins.variables.begin(), bins.variables.end(), isTarget);
    for (const std::shared_ptr<const Variable>& variable : bins.variables)
    {
        if (variable->role != VariableRole::kAttribute)
            continue;
        AttributeBins uncut;
        uncut.attribute = variable;
        uncut.target = target == bins.variables.end() ? nullptr : *target;
        uncut.isRightClosed = bins.settings.isRightClosed;
        uncut.smoothing = bins.settings.smoothing;
        bins.results.push_back(Cut(uncut, cuts.at(variable->name)));
    }
    return bins;
}
