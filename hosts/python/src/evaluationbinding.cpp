#include "hosts/python/src/evaluationbinding.h"

#include "bins/cutrounding.h"
#include "bins/evaluation.h"
#include "bins/run.h"
#include "hosts/python/src/rowtuples.h"

#include <nanobind/stl/optional.h>
#include <nanobind/stl/pair.h>
#include <nanobind/stl/string.h>
#include <nanobind/stl/vector.h>

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace nb = nanobind;
using namespace nb::literals;

namespace
{

/// Of each row the tuples of the first and the second population, and its part of the index or None.
nb::list GetRows(const Evaluation& evaluation, std::size_t index)
{
    nb::list rows;
    for (const EvaluationRow& row : MakeRows(evaluation, index))
        rows.append(nb::make_tuple(ToTuple(row.first), ToTuple(row.second), row.stability));
    return rows;
}

/// The whole of an evaluation whose results were found one by one.
Evaluation Join(Bins first, const std::vector<Evaluation>& parts, const std::optional<std::string>& dataName,
                std::int64_t numRecords, std::optional<std::int64_t> numWithoutWeight, std::optional<double> step,
                double weightOfUnseenTargets)
{
    Evaluation whole = BeginEvaluation(std::move(first));
    for (const Evaluation& part : parts) AddResults(whole, part);
    whole.second.dataName = dataName;
    whole.second.numRecords = numRecords;
    whole.second.numRecordsWithoutWeight = numWithoutWeight;
    SetWeightGrid(whole.second, step);
    whole.weightOfUnseenTargets = weightOfUnseenTargets;
    return whole;
}

} // namespace

void BindEvaluation(nb::module_& module)
{
    using Self = const Evaluation&;
    nb::class_<Evaluation>(module, "Evaluation")
        .def_static("join", &Join, "first"_a, "parts"_a, "data_name"_a.none(), "records"_a,
                    "records_without_weight"_a.none(), "step"_a.none(), "weight_of_unseen_targets"_a)
        .def_ro("first", &Evaluation::first, nb::rv_policy::copy)
        .def_ro("second", &Evaluation::second, nb::rv_policy::copy)
        .def_ro("indices", &Evaluation::indices)
        .def_ro("weight_of_unseen_targets", &Evaluation::weightOfUnseenTargets)
        .def("rows", &GetRows, "index"_a)
        .def("flags", &FindFlags, "index"_a)
        .def(
            "outside",
            [](Self self, std::size_t index)
            { return std::pair(self.strangers.at(index).below, self.strangers.at(index).above); },
            "index"_a)
        .def(
            "unseen",
            [](Self self, std::size_t index)
            { return std::pair(self.strangers.at(index).unseen.weight, self.strangers.at(index).unseenCategories); },
            "index"_a)
        .def("round_cut_points", &RoundCutPoints)
        .def("to_json", [](Self self) { return ToJson(self); })
        .def("to_csv", [](Self self) { return ToCsv(self); });
}
