#ifndef MCOBNQRT_BINVALUETUPLE_H
#define MCOBNQRT_BINVALUETUPLE_H

/// One usable record of an attribute that is binned without a target.
struct BINValueTuple
{
    double fValue;
    double fWeight; ///< above 0; 1.0 in a list without a weight variable
};

#endif
