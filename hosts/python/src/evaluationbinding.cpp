#include "hosts/python/src/evaluationbinding.h"

#include "bins/evaluation.h"
#include "hosts/python/src/rowtuples.h"

#include <nanobind/stl/optional.h>
#include <nanobind/stl/pair.h>
#include <nanobind/stl/string.h>
#include <nanobind/stl/vector.h>

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

} // namespace

void BindEvaluation(nb::module_& module)
{
    using Self = const Evaluation&;
    nb::class_<Evaluation>(module, "Evaluation")
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
        .def("to_json", [](Self self) { return ToJson(self); })
        .def("to_csv", [](Self self) { return ToCsv(self); });
}
