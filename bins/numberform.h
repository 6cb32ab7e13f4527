#ifndef MCOBNQRT_BINS_NUMBERFORM_H
#define MCOBNQRT_BINS_NUMBERFORM_H

#include "bins/numbers.h"

#include <string_view>

/// How the numbers in a text file are written.
class NumberForm
{
public:
    /// As in 1234.5.
    NumberForm() = default;

    /// \param decimal what separates whole numbers from fractions: a point or a comma.
    /// \param thousands what may stand between groups of three digits in front of that; '\0' for nothing. A blank
    ///        stands for the two no-break spaces of UTF-8, too.
    /// \throw std::invalid_argument if the two are equal, or one can't be what it is for.
    NumberForm(char decimal, char thousands);

    /// As ParseNumberOrNaN(), for numbers in this form. 1.5 is none where a comma is the decimal sign, unless it had
    /// points between its thousands, and 1.50 is none then, either.
    double Parse(std::string_view text) const { return fIsPlain ? ParseNumberOrNaN(text) : ParseForeign(text); }

    /// Whether commas may stand in numbers.
    bool HasCommas() const { return fDecimal == ',' || fThousands == ','; }

private:
    double ParseForeign(std::string_view text) const;

    char fDecimal = '.';
    char fThousands = '\0';
    bool fIsPlain = true;
};

#endif
