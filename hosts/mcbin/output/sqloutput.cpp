#include "hosts/mcbin/output/sqloutput.h"

#include "bins/numbers.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/findings.h"
#include "hosts/mcbin/text.h"

#include <cmath>
#include <limits>
#include <ostream>
#include <string>
#include <vector>

namespace
{

/// The text between two of `quote`, where one that is part of it is doubled.
std::string Enclose(const std::string& text, char quote)
{
    std::string enclosed(1, quote);
    for (const char c : text) enclosed += c == quote ? std::string(2, c) : std::string(1, c);
    return enclosed + quote;
}

std::string MakeLiteral(const Variable& variable, const std::string& category)
{
    return variable.kind == VariableKind::kNumericCategorical ? category : Enclose(category, '\'');
}

std::string MakeList(const std::vector<std::string>& literals)
{
    return "(" + Join(literals, ", ") + ")";
}

/// Not every database has a literal for an infinity, but for all it lies beyond the largest finite number.
constexpr double kLargest = std::numeric_limits<double>::max();

/// The condition that the value is the infinity.
std::string MakeInfinityCondition(const std::string& name, double infinity)
{
    return name + (infinity > 0.0 ? " > " : " < ") + FormatNumber(std::copysign(kLargest, infinity));
}

/// The condition that the value is declared missing; empty without such a declaration.
std::string MakeMissingCondition(const std::string& name, const Variable& variable)
{
    std::vector<std::string> values;
    std::string condition;
    for (const double number : variable.missingNumbers)
    {
        if (std::isinf(number))
            condition += " OR " + MakeInfinityCondition(name, number);
        else
            values.push_back(FormatNumber(number));
    }
    // A column of numbers can't hold the texts that stand for a missing value in a file.
    if (variable.kind == VariableKind::kStringCategorical)
        for (const std::string& text : variable.missingTexts) values.push_back(Enclose(text, '\''));
    condition = (values.empty() ? "" : " OR " + name + " IN " + MakeList(values)) + condition;
    if (!variable.missingInterval)
        return condition;
    const auto [low, high] = *variable.missingInterval;
    if (std::isfinite(low) && std::isfinite(high))
        condition += " OR " + name + " BETWEEN " + FormatNumber(low) + " AND " + FormatNumber(high);
    else if (std::isfinite(high))
        condition += " OR " + name + " <= " + FormatNumber(high);
    else
        condition += " OR " + name + " >= " + FormatNumber(low);
    return condition;
}

/// By code: which bin each category is in.
void PrintCategories(std::ostream& os, const Findings& findings, const Result& result, const std::string& name)
{
    const Variable& variable = findings.GetAttribute(result);
    for (std::size_t place = 0; place < result.bins.size(); ++place)
    {
        std::vector<std::string> literals;
        for (std::size_t code = 0; code < variable.categories.size(); ++code)
            if (FindBin(result.cutPoints, findings.settings.isRightClosed, static_cast<double>(code)) == place)
                literals.push_back(MakeLiteral(variable, variable.categories[code]));
        if (!literals.empty())
            os << "  WHEN " << name << " IN " << MakeList(literals) << " THEN " << place << '\n';
    }
    os << "  ELSE NULL\n";
}

/// The condition that a value that isn't missing lies left of the cut point. A cut point that is infinite is the negative
/// infinity with the right end of the bins closed, and the positive one with the left end closed.
std::string MakeLeftOf(const std::string& name, double cutPoint, bool isRightClosed)
{
    if (std::isinf(cutPoint))
        return name + (isRightClosed ? " < " : " <= ") + FormatNumber(std::copysign(kLargest, cutPoint));
    return name + (isRightClosed ? " <= " : " < ") + FormatNumber(cutPoint);
}

void PrintNumbers(std::ostream& os, const Findings& findings, const Result& result, const std::string& name)
{
    const bool isRightClosed = findings.settings.isRightClosed;
    for (std::size_t place = 0; place < result.cutPoints.size(); ++place)
        os << "  WHEN " << MakeLeftOf(name, result.cutPoints[place], isRightClosed) << " THEN " << place << '\n';
    os << "  ELSE " << result.cutPoints.size() << '\n';
}

void PrintCase(std::ostream& os, const Findings& findings, const Result& result, const std::string& binColumn)
{
    const Variable& variable = findings.GetAttribute(result);
    const std::string name = Enclose(variable.name, '"');
    os << "CASE\n  WHEN " << name << " IS NULL" << MakeMissingCondition(name, variable) << " THEN NULL\n";
    if (variable.IsCategorical())
        PrintCategories(os, findings, result, name);
    else
        PrintNumbers(os, findings, result, name);
    os << "END AS " << Enclose(binColumn, '"');
}

} // namespace

void PrintSql(std::ostream& os, const Findings& findings)
{
    bool isFirst = true;
    for (const Result& result : findings.results)
    {
        if (result.cutPoints.empty())
            continue;
        os << (isFirst ? "" : ",\n");
        isFirst = false;
        PrintCase(os, findings, result, GetBinColumn(findings, result));
    }
    os << (isFirst ? "" : "\n");
}
