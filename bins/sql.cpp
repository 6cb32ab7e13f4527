#include "bins/sql.h"

#include "bins/labels.h"
#include "bins/lookup.h"
#include "bins/numbers.h"
#include "bins/text.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <stdexcept>

namespace
{

/// Not every database has a literal for an infinity, but for all it lies beyond the largest finite number.
constexpr double kLargest = std::numeric_limits<double>::max();

/// Writes the expression of one result.
class Expression
{
public:
    Expression(const AttributeBins& bins, const SqlOptions& options, const std::vector<std::string>& missingTexts)
        : fBins(bins), fVariable(*bins.attribute), fOptions(options), fName(Enclose(fVariable.name, '"'))
    {
        if (options.isCast && fVariable.kind != VariableKind::kStringCategorical)
        {
            fMissingTexts = &missingTexts;
            fText = fName;
            fName = "CAST(" + fText + " AS DOUBLE PRECISION)";
        }
    }

    /// Gives what the encoding of the options has for each bin.
    std::string Make()
    {
        const Codes codes = MakeCodes(fBins, fOptions.encoding);
        if (fOptions.encoding == Encoding::kWeightOfEvidence || fOptions.encoding == Encoding::kRate)
            return Make(codes);
        fMissing = "NULL";
        if (fOptions.encoding == Encoding::kLabel)
        {
            for (const std::string& label : MakeLabels(fBins)) fResults.push_back(Enclose(label, '\''));
        }
        else
        {
            for (const double code : codes.bins) fResults.push_back(FormatNumber(code));
        }
        return MakeCase();
    }

    /// Gives the codes, as doubles.
    std::string Make(const Codes& codes)
    {
        fMissing = codes.missing ? MakeDouble(*codes.missing) : "NULL";
        for (const double code : codes.bins) fResults.push_back(MakeDouble(code));
        return MakeCase();
    }

private:
    std::string MakeCase() const
    {
        return "CASE\n" + MakeTextBranch() + "  WHEN " + MakeMissingCondition() + " THEN " + fMissing + "\n" +
               MakeBranches() + "END";
    }

    std::string MakeBranches() const
    {
        if (fVariable.IsCategorical())
            return MakeCategoryBranches();
        return fVariable.valueKind == ValueKind::kBoolean ? MakeBooleanBranches() : MakeNumberBranches();
    }

    /// With an exponent, without which some databases take a number for a decimal.
    std::string MakeDouble(double value) const
    {
        if (!std::isfinite(value))
        {
            throw std::invalid_argument(Quote(fVariable.name) +
                                        " has an infinite weight of evidence, for which there is no number in SQL; "
                                        "smoothing makes it finite");
        }
        const std::string text = FormatNumber(value);
        return text.find('e') == std::string::npos ? text + "e0" : text;
    }

    const std::string& MakeResult(std::size_t bin) const { return fResults[bin]; }

    /// The texts that stand for a missing value have to be told before the cast, which would fail or give 0.
    std::string MakeTextBranch() const
    {
        if (!fMissingTexts)
            return "";
        std::vector<std::string> texts{"''"};
        for (const std::string& text : *fMissingTexts) texts.push_back(Enclose(text, '\''));
        for (const std::string& text : fVariable.missingTexts) texts.push_back(Enclose(text, '\''));
        return "  WHEN " + fText + " IN (" + Join(texts, ", ") + ") THEN " + fMissing + "\n";
    }

    std::string MakeLiteral(double value) const
    {
        std::string text = FormatValue(value, fVariable);
        switch (fVariable.valueKind)
        {
        case ValueKind::kNumber:
            break;
        case ValueKind::kBoolean:
            return text == "true" ? "TRUE" : "FALSE";
        case ValueKind::kDate:
            return "CAST(" + Enclose(text, '\'') + " AS DATE)";
        case ValueKind::kTimestamp:
            return "CAST(" + Enclose(text, '\'') + " AS " +
                   (fVariable.timeZone.empty() ? "TIMESTAMP" : "TIMESTAMP WITH TIME ZONE") + ")";
        }
        return text;
    }

    std::string MakeCategoryLiteral(const std::string& category) const
    {
        return fVariable.kind == VariableKind::kStringCategorical ? Enclose(category, '\'')
                                                                  : MakeLiteral(ParseNumberOrNaN(category));
    }

    /// The condition that the value is the infinity.
    std::string MakeInfinityCondition(double infinity) const
    {
        return fName + (infinity > 0.0 ? " > " : " < ") + FormatNumber(std::copysign(kLargest, infinity));
    }

    std::string MakeMissingCondition() const
    {
        std::string condition = fName + " IS NULL";
        const bool canBeNaN = fVariable.kind == VariableKind::kContinuous && fVariable.valueKind == ValueKind::kNumber;
        if (canBeNaN && fOptions.dialect == SqlDialect::kDuckDb)
            condition += " OR isnan(" + fName + ")";
        std::vector<std::string> values;
        std::string infinities;
        for (const double number : fVariable.missingNumbers)
        {
            if (std::isinf(number))
                infinities += " OR " + MakeInfinityCondition(number);
            else
                values.push_back(MakeLiteral(number));
        }
        // A column of numbers can't hold the texts that stand for a missing value in a file.
        if (fVariable.kind == VariableKind::kStringCategorical)
        {
            for (const std::string& text : fVariable.missingTexts) values.push_back(Enclose(text, '\''));
        }
        if (!values.empty())
            condition += " OR " + fName + " IN (" + Join(values, ", ") + ")";
        return condition + infinities + (fVariable.missingInterval ? " OR " + MakeIntervalCondition() : "");
    }

    /// An infinite end takes in the infinity, too.
    std::string MakeIntervalCondition() const
    {
        const auto [low, high] = *fVariable.missingInterval;
        if (std::isinf(low) && std::isinf(high))
            return "1 = 1";
        if (std::isinf(low))
            return fName + " <= " + MakeLiteral(high);
        if (std::isinf(high))
            return fName + " >= " + MakeLiteral(low);
        return fName + " BETWEEN " + MakeLiteral(low) + " AND " + MakeLiteral(high);
    }

    /// Rare categories share a bin with those that were never seen, and so with all others.
    std::string MakeCategoryBranches() const
    {
        std::string branches;
        std::string others = fMissing;
        const auto isRare = [this](std::size_t code) { return fVariable.rare && fVariable.rare->code == code; };
        const std::vector<std::vector<std::size_t>> codes = FindCodes(fBins);
        for (std::size_t bin = 0; bin < codes.size(); ++bin)
        {
            if (std::any_of(codes[bin].begin(), codes[bin].end(), isRare))
            {
                others = MakeResult(bin);
                continue;
            }
            std::vector<std::string> literals;
            for (const std::size_t code : codes[bin])
                literals.push_back(MakeCategoryLiteral(fVariable.categories[code]));
            if (!literals.empty())
                branches += "  WHEN " + fName + " IN (" + Join(literals, ", ") + ") THEN " + MakeResult(bin) + "\n";
        }
        return branches + "  ELSE " + others + "\n";
    }

    /// The condition that a value that isn't missing lies left of the cut point. A cut point that is infinite is the
    /// negative infinity with the right end of the bins closed, and the positive one with the left end closed.
    std::string MakeLeftOf(double cutPoint) const
    {
        if (std::isinf(cutPoint))
            return fName + (fBins.isRightClosed ? " < " : " <= ") + FormatNumber(std::copysign(kLargest, cutPoint));
        return fName + (fBins.isRightClosed ? " <= " : " < ") + MakeLiteral(cutPoint);
    }

    std::string MakeNumberBranches() const
    {
        std::string branches;
        const std::vector<double> borders = MakeBorders(fBins);
        for (std::size_t i = 0; i < borders.size(); ++i)
            branches += "  WHEN " + MakeLeftOf(borders[i]) + " THEN " + MakeResult(i) + "\n";
        return branches + "  ELSE " + MakeResult(borders.size()) + "\n";
    }

    /// A boolean can be compared with a number only in some databases.
    std::string MakeBooleanBranches() const
    {
        std::string branches;
        for (const double value : {0.0, 1.0})
        {
            branches += "  WHEN " + fName + " = " + MakeLiteral(value) + " THEN " +
                        MakeResult(FindBin(fBins.cutPoints, fBins.isRightClosed, value)) + "\n";
        }
        return branches + "  ELSE " + fMissing + "\n";
    }

    const AttributeBins& fBins;
    const Variable& fVariable;
    const SqlOptions& fOptions;
    std::string fName;
    std::string fText;                                       ///< of a column that is cast: the column itself
    const std::vector<std::string>* fMissingTexts = nullptr; ///< of a column that is cast
    std::vector<std::string> fResults;                       ///< by bin
    std::string fMissing;                                    ///< of a missing value
};

} // namespace

std::string ToSql(const Bins& bins, const SqlOptions& options)
{
    std::vector<std::string> names;
    for (const auto& variable : bins.variables) names.push_back(variable->name);
    std::vector<std::string> expressions;
    for (const BinColumn& column : MakeBinColumns(bins, names, options.encoding))
    {
        const std::string expression = Expression(*column.bins, options, bins.missingTexts).Make();
        expressions.push_back(expression + " AS " + Enclose(column.name, '"'));
    }
    if (options.table.empty())
        return Join(expressions, ",\n") + (expressions.empty() ? "" : "\n");
    expressions.insert(expressions.begin(), "*");
    return "SELECT " + Join(expressions, ",\n") + "\nFROM " + options.table + "\n";
}

std::string ToSql(const AttributeBins& bins, const Codes& codes, const SqlOptions& options,
                  const std::vector<std::string>& missingTexts)
{
    return Expression(bins, options, missingTexts).Make(codes);
}
