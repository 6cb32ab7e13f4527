#include "bins/csv.h"
#include "bins/evaluation.h"
#include "bins/json.h"
#include "bins/jsonnames.h"
#include "bins/jsonvalue.h"
#include "bins/numbers.h"
#include "bins/text.h"

#include <utility>

namespace
{

using Array = JsonValue::Array;
using Object = JsonValue::Object;

constexpr const char* kEvaluationSchema = "mcobnqrt-evaluation";
constexpr int kEvaluationVersion = 1;

JsonValue MakeAttribute(const Evaluation& evaluation, std::size_t index)
{
    const AttributeBins& bins = evaluation.GetFirst(index);
    const Strangers& strangers = evaluation.strangers[index];
    Array parts;
    const std::vector<EvaluationRow> rows = MakeRows(evaluation, index);
    for (std::size_t i = 0; i + 1 < rows.size(); ++i)
    {
        parts.push_back(Object{{"row", GetName(kRowNames, rows[i].first.kind)},
                               {"label", rows[i].first.label},
                               {"stability", rows[i].stability}});
    }
    return Object{{"attribute", bins.attribute->name},
                  {"target", bins.target ? JsonValue(bins.target->name) : JsonValue()},
                  {"stability", rows.back().stability},
                  {"parts", parts},
                  {"weight_below", strangers.below},
                  {"weight_above", strangers.above},
                  {"unseen", Object{{"weight", strangers.unseen.weight}, {"categories", strangers.unseenCategories}}},
                  {"flags", FindFlags(evaluation, index)}};
}

void AppendPopulation(std::vector<std::string>& fields, const BinRow& row)
{
    fields.push_back(FormatNumber(row.bin.weight));
    fields.push_back(FormatNumber(row.share));
    fields.push_back(row.evidence ? FormatNumber(row.evidence->rate) : "");
    const bool hasEvidence = row.evidence && row.kind != BinRow::Kind::kUnseen;
    fields.push_back(hasEvidence ? FormatNumber(row.evidence->weightOfEvidence) : "");
    fields.push_back(hasEvidence ? FormatNumber(row.evidence->informationValue) : "");
}

std::string MakeLine(std::vector<std::string> fields)
{
    for (std::string& field : fields) field = QuoteField(field, ',');
    return Join(fields, ",") + "\n";
}

} // namespace

std::string ToJson(const Evaluation& evaluation)
{
    Array attributes;
    for (std::size_t i = 0; i < evaluation.second.results.size(); ++i)
        attributes.push_back(MakeAttribute(evaluation, i));
    return WriteJson(Object{{"schema", kEvaluationSchema},
                            {"schema_version", kEvaluationVersion},
                            {"attributes", attributes},
                            {"weight_of_unseen_targets", evaluation.weightOfUnseenTargets},
                            {"first", MakeDocument(evaluation.first)},
                            {"second", MakeDocument(evaluation.second)}});
}

std::string ToCsv(const Evaluation& evaluation)
{
    std::string csv = "attribute,target,bin,label,first_weight,first_share,first_rate,first_woe,first_iv,second_weight,"
                      "second_share,second_rate,second_woe,second_iv,stability\n";
    for (std::size_t i = 0; i < evaluation.second.results.size(); ++i)
    {
        const AttributeBins& bins = evaluation.GetFirst(i);
        const std::vector<EvaluationRow> rows = MakeRows(evaluation, i);
        for (std::size_t j = 0; j < rows.size(); ++j)
        {
            const BinRow::Kind kind = rows[j].second.kind;
            const std::string number = kind == BinRow::Kind::kBin ? std::to_string(j) : GetName(kRowNames, kind);
            std::vector<std::string> fields{bins.attribute->name, bins.target ? bins.target->name : "", number,
                                            rows[j].first.label};
            AppendPopulation(fields, rows[j].first);
            AppendPopulation(fields, rows[j].second);
            fields.push_back(rows[j].stability ? FormatNumber(*rows[j].stability) : "");
            csv += MakeLine(std::move(fields));
        }
    }
    return csv;
}
