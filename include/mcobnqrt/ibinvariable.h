#ifndef MCOBNQRT_IBINVARIABLE_H
#define MCOBNQRT_IBINVARIABLE_H

#include <mcobnqrt/export.h>

#include <iosfwd>
#include <string>

class IBINEncoder;
class IBINUserMissing;

/// One column of the host's data: its name, level, part in the analysis, categories and user-missing values.
///
/// Variables are made and owned by a BINVarList, which hands them out by pointer.
class MCOBNQRT_EXPORT IBINVariable
{
public:
    enum MeasureLevel : int
    {
        MeasureUnknown = 0,
        MeasureContinuous = 1,         ///< a number to be measured; BINContVar
        MeasureNumericCategorical = 2, ///< categories that are numbers; BINCatVar with a BINCatNumEncoder
        MeasureStringCategorical = 3,  ///< categories that are strings; BINCatVar with a BINStringEncoder
        MeasureFrequencyWeight = 4     ///< how many cases a record stands for; BINWeightVar
    };

    enum VariableRole : int
    {
        RoleUndefined = 0,      ///< takes no part in the analysis
        RoleAttribute = 1,      ///< is to be binned
        RoleTarget = 2,         ///< its categories supervise the binning
        RoleFrequencyWeight = 3 ///< weights the records
    };

    enum BINWRoundingOption : int
    {
        RoundTruncate = 0, ///< down to the whole number below
        RoundClosest = 1   ///< to the closest whole number, halves up; with any other value a weight stays as it is
    };

    enum VarStatus : int
    {
        VarStatusOK = 0,
        VarStatusOneCategory = 1, ///< categorical, with exactly one category
        VarStatusNoCategories = 2 ///< categorical, with none
    };

    IBINVariable() = default;
    IBINVariable(const IBINVariable&) = default;
    IBINVariable& operator=(const IBINVariable&) = default;
    virtual ~IBINVariable() = default;

    virtual MeasureLevel GetMeasureLevel() const = 0;
    virtual std::string GetVariableName() const = 0;
    virtual std::string GetVariableLabel() const = 0;
    virtual void SetVariableLabel(const std::string& label) = 0;

    /// How many categories the variable is known to have, which may be fewer than its encoder has seen; 0 for a
    /// variable that isn't categorical.
    virtual int GetNumberOfCategories() const = 0;

    virtual VariableRole GetVariableRole() const = 0;

    /// Sets the role; a weight variable keeps its own. For a variable in a list use BINVarList::SetVariableRole, which
    /// keeps the list's target index in step.
    virtual void SetVariableRole(VariableRole role) = 0;

    /// Raises the number of categories to what the encoder has seen; it never falls. \return the number.
    virtual int UpdateNumberOfCategories() = 0;

    /// Declares the values that count as missing, and owns the object from now on; what was declared before is gone.
    /// Null declares that there are none. To hand over the object that is held already changes nothing.
    ///
    /// \return false if the object is of the wrong data type: nothing has changed, and it stays the caller's.
    virtual bool SetUserMissingInfo(IBINUserMissing* userMissing) = 0;

    /// The declared values, or null. The object is the variable's.
    virtual IBINUserMissing* GetUserMissingInfo() const = 0;

    /// \return a new deep copy, which the caller owns.
    virtual IBINVariable* Clone() const = 0;

    /// The variable's encoder, or null for a continuous variable. It is the variable's.
    virtual IBINEncoder* GetEncoder() = 0;
    virtual const IBINEncoder* GetEncoder() const = 0;

    /// Whether the variable has enough categories. Raises their number first, as UpdateNumberOfCategories does.
    virtual VarStatus GetVarStatus() = 0;

    /// Writes what is known of the variable, line by line, for the programmer's eye.
    virtual void Display(std::ostream& os) const = 0;
};

#endif
