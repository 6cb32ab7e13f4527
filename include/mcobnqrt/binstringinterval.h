#ifndef MCOBNQRT_BINSTRINGINTERVAL_H
#define MCOBNQRT_BINSTRINGINTERVAL_H

#include <mcobnqrt/export.h>

#include <iosfwd>
#include <string>

/// An interval of strings, each end of which belongs to it or not. Strings are compared byte by byte, so case matters.
///
/// It is there for the host's own use: user-missing strings are always single values, never an interval.
class MCOBNQRT_EXPORT BINStringInterval
{
public:
    /// The interval that holds just ".".
    BINStringInterval();

    /// The interval from `left` to `right`, in whatever order they are.
    BINStringInterval(const std::string& left, bool leftIncluded, const std::string& right, bool rightIncluded);

    BINStringInterval(const BINStringInterval& other);
    BINStringInterval& operator=(const BINStringInterval& other);
    ~BINStringInterval();

    bool Contains(const std::string& value) const;

    /// Whether the ends are in the wrong order, or equal without both being included.
    bool IsEmpty() const;

    /// Equal ends and equal flags; two empty intervals may differ.
    bool operator==(const BINStringInterval& other) const;

    /// Sets an end and its flag, in any case. \return whether the interval is now well-formed, that is not empty.
    bool SetLeftEnd(const std::string& value, bool included);
    bool SetRightEnd(const std::string& value, bool included);

    const std::string& GetLeftEnd() const { return fLeftEnd; }
    const std::string& GetRightEnd() const { return fRightEnd; }
    bool IsLeftEndIncluded() const { return fLeftIncluded; }
    bool IsRightEndIncluded() const { return fRightIncluded; }

    /// Writes one line, such as "BINStringInterval: [ a, f )".
    void Display(std::ostream& os) const;

private:
    std::string fLeftEnd;
    bool fLeftIncluded;
    std::string fRightEnd;
    bool fRightIncluded;
};

#endif
