#ifndef MCOBNQRT_BINS_CUTROUNDING_H
#define MCOBNQRT_BINS_CUTROUNDING_H

#include "bins/bins.h"
#include "bins/evaluation.h"

/// The decimal with the fewest digits between two neighbouring values, `below` and `above`. Of several, as of 30 and 40
/// between 26 and 41, it is the one that is nearest to `cutPoint`, which lies between the two itself; of two equally
/// near ones the lower. A value `below` may be the cut point itself where bins are closed on the right, and one `above`
/// where they are closed on the left. Without such a decimal, and beside an infinite value, it is `cutPoint`.
double FindShortestDecimal(double below, double above, double cutPoint, bool isRightClosed);

/// The first bins of an evaluation with the shortest decimals as cut points, by which no record that was counted comes
/// into another bin. The evaluation has counted the records of which the bins were made. Cut points between categories,
/// booleans, dates and timestamps stay as they are.
Bins RoundCutPoints(const Evaluation& evaluation);

#endif
