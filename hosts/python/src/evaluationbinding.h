#ifndef MCBINNING_EVALUATIONBINDING_H
#define MCBINNING_EVALUATIONBINDING_H

#include <nanobind/nanobind.h>

/// Defines the class Evaluation of the module.
void BindEvaluation(nanobind::module_& module);

#endif
