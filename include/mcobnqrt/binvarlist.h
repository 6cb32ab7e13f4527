#ifndef MCOBNQRT_BINVARLIST_H
#define MCOBNQRT_BINVARLIST_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinvariable.h>

#include <iosfwd>
#include <memory>
#include <string>
#include <vector>

class IBINEncoder;

/// The host's description of its data: variables in the order of the fields of its records.
///
/// A variable's index, from 0, is its position in the list and its field in a record. The list makes its variables and
/// owns them; what it hands out by pointer stays its own. The factories copy the list, so an algorithm doesn't see
/// what is changed afterwards.
///
/// Names are unique, compared byte by byte, among all but the weight variable. The list has one target index and one
/// weight index, -1 where there is none. The role is a property of each variable, and more than one may be a target by
/// role; the target index names one of them. An algorithm is made only from a list in which they agree.
class MCOBNQRT_EXPORT BINVarList
{
public:
    BINVarList();

    /// Copies deeply: each list has variables, encoders and user-missing objects of its own.
    BINVarList(const BINVarList& other);
    BINVarList& operator=(const BINVarList& other);
    virtual ~BINVarList();

    /// Appends a continuous variable. \return its index, or -1, and nothing is added, if the name is empty or taken
    /// or the role is RoleTarget or RoleFrequencyWeight.
    int AddContVar(const std::string& name, const std::string& label, IBINVariable::VariableRole role);

    /// Appends a categorical variable with this number of categories, the values of which the host encodes later. With
    /// RoleTarget it becomes the list's target, also if there was one.
    ///
    /// \return its index, or -1, and nothing is added, if the name is empty or taken or the role is
    ///         RoleFrequencyWeight.
    /// \throw std::length_error, and nothing is added, if `numberOfCategories` is negative.
    int AddCatVar(const std::string& name, const std::string& label, int numberOfCategories,
                  IBINVariable::MeasureLevel level, IBINVariable::VariableRole role);

    /// Appends a categorical variable of numbers or strings and encodes its values, so that each one's code is its
    /// rank among the distinct ones. The number of categories is that of `values`, repeated ones included. `labels`
    /// are in the order of the codes.
    ///
    /// \return its index, or -1, and nothing is added, if the name is empty or taken, the role is RoleFrequencyWeight
    ///         or there are fewer than 2 values.
    int AddCatVar(const std::string& name, const std::string& label, const std::vector<double>& values,
                  IBINVariable::VariableRole role);
    int AddCatVar(const std::string& name, const std::string& label, const std::vector<std::string>& values,
                  IBINVariable::VariableRole role);
    int AddCatVar(const std::string& name, const std::string& label, const std::vector<double>& values,
                  const std::vector<std::string>& labels, IBINVariable::VariableRole role);
    int AddCatVar(const std::string& name, const std::string& label, const std::vector<std::string>& values,
                  const std::vector<std::string>& labels, IBINVariable::VariableRole role);

    /// Appends the frequency weight. Its name may be empty or taken. \return its index, or -1, and nothing is added, if
    /// the list has a weight already.
    int AddWeightVar(const std::string& name, const std::string& label, IBINVariable::BINWRoundingOption option);

    unsigned int Size() const;

    /// How many variables were added as continuous or as categorical; a weight is neither.
    int GetNumContVar() const { return fNumContVars; }
    int GetNumCatVar() const { return fNumCatVars; }

    int GetTargetIndex() const { return fTargetIndex; }
    int GetWeightIndex() const { return fWeightIndex; }

    /// The variable, or null if there is no such index.
    IBINVariable* GetVarAt(int index);
    const IBINVariable* GetVarAt(int index) const;

    /// The variable's encoder, or null if there is no such index or the variable is continuous.
    IBINEncoder* GetEncoderAt(int index);
    const IBINEncoder* GetEncoderAt(int index) const;

    /// The variable at the target index, or null if there is none.
    IBINVariable* GetTargetVariable() const;

    /// The index of the first variable of exactly this name, or -1.
    int FindVariable(const std::string& name) const;

    int GetNumAttributeVars() const;

    /// The number of categories of the first variable of RoleTarget, which need not be the one at the target index; 0
    /// if there is none.
    int GetNTargetCats() const;

    /// RoleUndefined if there is no such index.
    IBINVariable::VariableRole GetVariableRole(int index) const;

    /// Sets the role of any kind of variable but the weight, which keeps its own.
    ///
    /// With RoleTarget the variable becomes the list's target only if there is none. To take RoleTarget from a variable
    /// leaves the list without a target, even if it is another one: the list never picks a successor.
    ///
    /// \return false, and nothing has changed, if there is no such index, or if `role` is RoleFrequencyWeight and the
    ///         variable is not the list's weight.
    bool SetVariableRole(int index, IBINVariable::VariableRole role);

    /// Raises each variable's number of categories to what its encoder has seen. \return their sum, no further than an
    /// int goes.
    int UpdateNumbersOfCategories();

    /// Gives the names of all attributes, in order, and that of the last variable of RoleTarget; `target` is left
    /// alone if there is none.
    void GetVarNames(std::vector<std::string>& attributes, std::string& target) const;

    /// Removes the variable. Every later one moves down by one, and with it the field of the host's record that belongs
    /// to it; the target and weight indices follow their variables.
    ///
    /// To remove the target or any variable of RoleTarget leaves the list without a target, even if another variable
    /// has that role. A target index that SetVariableRole() has put on the weight stays where it is when the weight
    /// goes; a factory refuses such a list. The counter that goes down is the one that the measure level names.
    /// Pointers to the removed variable dangle, those to the others stay good.
    ///
    /// \return false, and nothing has changed, if there is no such variable.
    bool RemoveVar(int index);
    bool RemoveVar(std::string name);

    /// Declares one value of the variable to be missing, beside those declared before: a number for any variable but
    /// one of MeasureStringCategorical, a string for that one only.
    ///
    /// \return false, and nothing has changed, if there is no such index or the variable doesn't take such a value.
    bool AddDiscreteUserMissing(int index, double value, const std::string& label);
    bool AddDiscreteUserMissing(int index, const std::string& value, const std::string& label);

    /// Declares the numbers from `left` to `right`, both included, to be missing, beside the values declared before.
    ///
    /// \return false, and nothing has changed, if there is no such index, if the variable takes no numbers, or if it
    ///         has an interval already.
    bool SetMissingInterval(int index, double left, double right);

    /// Whether the list can be worked with: at least one attribute, and no categorical variable with fewer than 2
    /// categories. The indices of the latter go into the two lists, what these held before is gone; both are empty
    /// for a list without an attribute. Raises the numbers of categories first, as UpdateNumbersOfCategories does.
    bool IsValidList(std::vector<int>& oneCategory, std::vector<int>& noCategories) const;

    /// Whether `other` describes the same variables in the same way: names, labels, roles and levels, and for
    /// attributes and targets the user-missing values; the categorical ones among these must know as many categories
    /// as their encoders have seen, on both sides. The categories themselves are not compared.
    ///
    /// \param badIndex set only if the result is false: to the first variable that differs, or to the smaller size or
    ///        target index if these differ.
    bool CanMergeWith(const BINVarList& other, int& badIndex) const;

    /// Writes the counters and each variable, line by line, for the programmer's eye.
    void Display(std::ostream& os) const;

private:
    class NameIndex;

    IBINVariable* At(int index) const;
    bool MayAdd(const std::string& name, IBINVariable::VariableRole role) const;
    int Append(std::unique_ptr<IBINVariable> variable);
    int AppendCategorical(std::unique_ptr<IBINVariable> variable);

    std::vector<std::unique_ptr<IBINVariable>> fVars;
    std::unique_ptr<NameIndex> fNames; ///< null or of all of fVars; may be out of date
    int fNumContVars = 0;
    int fNumCatVars = 0;
    int fTargetIndex = -1;
    int fWeightIndex = -1;
};

#endif
