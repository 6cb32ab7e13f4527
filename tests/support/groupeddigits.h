#ifndef MCOBNQRT_TESTS_GROUPEDDIGITS_H
#define MCOBNQRT_TESTS_GROUPEDDIGITS_H

#include <locale>
#include <string>

/// The numbers of a locale that writes 1.234,5. It is on every system, unlike the locales that users have.
class GroupedDigits : public std::numpunct<char>
{
protected:
    char do_decimal_point() const override { return ','; }
    char do_thousands_sep() const override { return '.'; }
    std::string do_grouping() const override { return "\3"; }
};

inline std::locale LocaleWithGroupedDigits()
{
    return std::locale(std::locale::classic(), new GroupedDigits); // the locale owns its facets
}

/// Has a program write the numbers of its streams like this, as one does that asks for the locale of its user.
class GroupedDigitsEverywhere
{
public:
    GroupedDigitsEverywhere() : fFormer(std::locale::global(LocaleWithGroupedDigits())) {}
    GroupedDigitsEverywhere(const GroupedDigitsEverywhere&) = delete;
    GroupedDigitsEverywhere& operator=(const GroupedDigitsEverywhere&) = delete;
    ~GroupedDigitsEverywhere() { std::locale::global(fFormer); }

private:
    std::locale fFormer;
};

#endif
