#include <mcobnqrt/binvarlist.h>

#include <mcobnqrt/bincatnumencoder.h>
#include <mcobnqrt/bincatvar.h>
#include <mcobnqrt/bincontvar.h>
#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/binstringencoder.h>
#include <mcobnqrt/binstringusermissing.h>
#include <mcobnqrt/binweightvar.h>

#include "base/growth.h"
#include "metadata/nameindex.h"
#include "metadata/ownership.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <ostream>
#include <utility>

namespace
{

/// Stands for no index.
constexpr int kNone = -1;

/// A categorical variable whose encoder knows the values and the labels.
template<class Encoder, class Value>
std::unique_ptr<BINCatVar> MakeFilledCatVar(const std::string& name, const std::string& label,
                                            const std::vector<Value>& values, const std::vector<std::string>& labels,
                                            IBINVariable::MeasureLevel level, IBINVariable::VariableRole role)
{
    auto variable = std::make_unique<BINCatVar>(name, label, static_cast<int>(values.size()), level, role);
    auto& encoder = static_cast<Encoder&>(*variable->GetEncoder());
    for (const Value& value : values) encoder.Encode(value);
    encoder.SetValueLabels(labels);
    return variable;
}

/// Applies `declare` to the variable's user-missing object, or to a new one that the variable then owns. False, with
/// nothing changed, if the variable holds or takes only the other data type, or if `declare` gives false.
///
/// The level doesn't tell the data type: any level but the numeric one goes with an encoder that takes strings.
template<class UserMissing, class Declare>
bool DeclareUserMissing(IBINVariable& variable, IBINUserMissing::DataType type, Declare declare)
{
    if (IBINUserMissing* held = variable.GetUserMissingInfo())
        return held->GetDataType() == type && declare(static_cast<UserMissing&>(*held));

    // The object is filled before it is handed over, so that a failure on the way leaves the variable without an
    // object.
    auto made = std::make_unique<UserMissing>();
    if (!declare(*made) || !variable.SetUserMissingInfo(made.get()))
        return false;
    made.release();
    return true;
}

} // namespace

BINVarList::BINVarList() = default;

BINVarList::BINVarList(const BINVarList& other)
    : fNumContVars(other.fNumContVars), fNumCatVars(other.fNumCatVars), fTargetIndex(other.fTargetIndex),
      fWeightIndex(other.fWeightIndex)
{
    fVars.reserve(other.fVars.size());
    for (const auto& variable : other.fVars) fVars.push_back(CloneOf(variable));
}

BINVarList& BINVarList::operator=(const BINVarList& other)
{
    if (this == &other)
        return *this;
    // The copy is made first, so that a failure doesn't leave half a list.
    BINVarList copy(other);
    fVars.swap(copy.fVars);
    fNames.swap(copy.fNames);
    fNumContVars = copy.fNumContVars;
    fNumCatVars = copy.fNumCatVars;
    fTargetIndex = copy.fTargetIndex;
    fWeightIndex = copy.fWeightIndex;
    return *this;
}

BINVarList::~BINVarList() = default;

int BINVarList::AddContVar(const std::string& name, const std::string& label, IBINVariable::VariableRole role)
{
    if (role == IBINVariable::RoleTarget || !MayAdd(name, role))
        return kNone;
    const int index = Append(std::make_unique<BINContVar>(name, label, role));
    ++fNumContVars;
    return index;
}

int BINVarList::AddCatVar(const std::string& name, const std::string& label, int numberOfCategories,
                          IBINVariable::MeasureLevel level, IBINVariable::VariableRole role)
{
    if (!MayAdd(name, role))
        return kNone;
    return AppendCategorical(std::make_unique<BINCatVar>(name, label, numberOfCategories, level, role));
}

int BINVarList::AddCatVar(const std::string& name, const std::string& label, const std::vector<double>& values,
                          IBINVariable::VariableRole role)
{
    return AddCatVar(name, label, values, std::vector<std::string>(), role);
}

int BINVarList::AddCatVar(const std::string& name, const std::string& label, const std::vector<std::string>& values,
                          IBINVariable::VariableRole role)
{
    return AddCatVar(name, label, values, std::vector<std::string>(), role);
}

int BINVarList::AddCatVar(const std::string& name, const std::string& label, const std::vector<double>& values,
                          const std::vector<std::string>& labels, IBINVariable::VariableRole role)
{
    if (values.size() < 2 || !MayAdd(name, role))
        return kNone;
    return AppendCategorical(
        MakeFilledCatVar<BINCatNumEncoder>(name, label, values, labels, IBINVariable::MeasureNumericCategorical, role));
}

int BINVarList::AddCatVar(const std::string& name, const std::string& label, const std::vector<std::string>& values,
                          const std::vector<std::string>& labels, IBINVariable::VariableRole role)
{
    if (values.size() < 2 || !MayAdd(name, role))
        return kNone;
    return AppendCategorical(
        MakeFilledCatVar<BINStringEncoder>(name, label, values, labels, IBINVariable::MeasureStringCategorical, role));
}

int BINVarList::AddWeightVar(const std::string& name, const std::string& label, IBINVariable::BINWRoundingOption option)
{
    if (fWeightIndex != kNone)
        return kNone;
    fWeightIndex = Append(std::make_unique<BINWeightVar>(name, label, option));
    return fWeightIndex;
}

unsigned int BINVarList::Size() const
{
    return static_cast<unsigned int>(fVars.size());
}

IBINVariable* BINVarList::GetVarAt(int index)
{
    return At(index);
}

const IBINVariable* BINVarList::GetVarAt(int index) const
{
    return At(index);
}

IBINEncoder* BINVarList::GetEncoderAt(int index)
{
    IBINVariable* variable = At(index);
    return variable ? variable->GetEncoder() : nullptr;
}

const IBINEncoder* BINVarList::GetEncoderAt(int index) const
{
    const IBINVariable* variable = At(index);
    return variable ? variable->GetEncoder() : nullptr;
}

IBINVariable* BINVarList::GetTargetVariable() const
{
    return At(fTargetIndex);
}

int BINVarList::FindVariable(const std::string& name) const
{
    if (fNames != nullptr && fNames->IsUpToDate())
        return fNames->Find(name);
    const auto found = std::find_if(fVars.begin(), fVars.end(),
                                    [&name](const auto& variable) { return variable->GetVariableName() == name; });
    return found == fVars.end() ? kNone : static_cast<int>(found - fVars.begin());
}

int BINVarList::GetNumAttributeVars() const
{
    return static_cast<int>(std::count_if(fVars.begin(), fVars.end(),
                                          [](const auto& variable)
                                          { return variable->GetVariableRole() == IBINVariable::RoleAttribute; }));
}

int BINVarList::GetNTargetCats() const
{
    for (const auto& variable : fVars)
    {
        if (variable->GetVariableRole() == IBINVariable::RoleTarget)
            return variable->GetNumberOfCategories();
    }
    return 0;
}

IBINVariable::VariableRole BINVarList::GetVariableRole(int index) const
{
    const IBINVariable* variable = At(index);
    return variable ? variable->GetVariableRole() : IBINVariable::RoleUndefined;
}

bool BINVarList::SetVariableRole(int index, IBINVariable::VariableRole role)
{
    IBINVariable* variable = At(index);
    if (!variable)
        return false;
    // The encoder of this role's variable rounds when the records are read, and only a weight variable has one that
    // can.
    if (role == IBINVariable::RoleFrequencyWeight && index != fWeightIndex)
        return false;

    if (role == IBINVariable::RoleTarget)
    {
        if (fTargetIndex == kNone)
            fTargetIndex = index;
    }
    else if (variable->GetVariableRole() == IBINVariable::RoleTarget)
        fTargetIndex = kNone;
    variable->SetVariableRole(role);
    return true;
}

int BINVarList::UpdateNumbersOfCategories()
{
    std::int64_t sum = 0; // a host may declare any numbers
    for (const auto& variable : fVars) sum += variable->UpdateNumberOfCategories();
    using Limits = std::numeric_limits<int>;
    return static_cast<int>(std::clamp<std::int64_t>(sum, Limits::min(), Limits::max()));
}

void BINVarList::GetVarNames(std::vector<std::string>& attributes, std::string& target) const
{
    attributes.clear();
    for (const auto& variable : fVars)
    {
        if (variable->GetVariableRole() == IBINVariable::RoleAttribute)
            attributes.push_back(variable->GetVariableName());
        else if (variable->GetVariableRole() == IBINVariable::RoleTarget)
            target = variable->GetVariableName();
    }
}

bool BINVarList::RemoveVar(int index)
{
    const IBINVariable* variable = At(index);
    if (!variable)
        return false;
    const bool isContinuous = variable->GetMeasureLevel() == IBINVariable::MeasureContinuous;
    const bool isTarget = variable->GetVariableRole() == IBINVariable::RoleTarget;
    const bool isWeight = index == fWeightIndex;

    if (fNames != nullptr)
        fNames->Remove(index);
    fVars.erase(fVars.begin() + index);
    if (isContinuous)
        --fNumContVars;
    else if (!isWeight)
        --fNumCatVars;
    // The target index goes with any variable of RoleTarget, and with no other. One that SetVariableRole() has put on
    // the weight stays, and FindVariableWithoutPosition() sees to it that such a list is not analysed.
    if (isTarget)
        fTargetIndex = kNone;
    else if (index < fTargetIndex)
        --fTargetIndex;
    if (isWeight)
        fWeightIndex = kNone;
    else if (index < fWeightIndex)
        --fWeightIndex;
    return true;
}

bool BINVarList::RemoveVar(std::string name)
{
    return RemoveVar(FindVariable(name));
}

bool BINVarList::AddDiscreteUserMissing(int index, double value, const std::string& label)
{
    IBINVariable* variable = At(index);
    if (!variable || variable->GetMeasureLevel() == IBINVariable::MeasureStringCategorical)
        return false;
    return DeclareUserMissing<BINNumericUserMissing>(*variable, IBINUserMissing::DataTypeNumeric,
                                                     [&](BINNumericUserMissing& userMissing)
                                                     {
                                                         userMissing.AddValue(value, label);
                                                         return true;
                                                     });
}

bool BINVarList::AddDiscreteUserMissing(int index, const std::string& value, const std::string& label)
{
    IBINVariable* variable = At(index);
    if (!variable || variable->GetMeasureLevel() != IBINVariable::MeasureStringCategorical)
        return false;
    return DeclareUserMissing<BINStringUserMissing>(*variable, IBINUserMissing::DataTypeString,
                                                    [&](BINStringUserMissing& userMissing)
                                                    {
                                                        userMissing.AddValue(value, label);
                                                        return true;
                                                    });
}

bool BINVarList::SetMissingInterval(int index, double left, double right)
{
    IBINVariable* variable = At(index);
    if (!variable || variable->GetMeasureLevel() == IBINVariable::MeasureStringCategorical)
        return false;
    return DeclareUserMissing<BINNumericUserMissing>(*variable, IBINUserMissing::DataTypeNumeric,
                                                     [&](BINNumericUserMissing& userMissing)
                                                     {
                                                         if (userMissing.HasInterval())
                                                             return false;
                                                         userMissing.SetInterval(BINNumericInterval(left, right));
                                                         return true;
                                                     });
}

bool BINVarList::IsValidList(std::vector<int>& oneCategory, std::vector<int>& noCategories) const
{
    oneCategory.clear();
    noCategories.clear();
    const int size = static_cast<int>(fVars.size());
    for (int i = 0; i < size; ++i)
    {
        const IBINVariable::VarStatus status = At(i)->GetVarStatus();
        if (status == IBINVariable::VarStatusOneCategory)
            oneCategory.push_back(i);
        else if (status == IBINVariable::VarStatusNoCategories)
            noCategories.push_back(i);
    }
    return oneCategory.empty() && noCategories.empty() && GetNumAttributeVars() > 0;
}

void BINVarList::Display(std::ostream& os) const
{
    // The text is promised to the letter, with its odd beginning: a backspace, and then "INegin".
    os << "\bINegin display of BINVarList object.\n";
    os << "Total variables: " << Size() << std::endl;
    os << "Number of Continuous Variables = " << fNumContVars << std::endl;
    os << "Number of Categorical Variables  = " << fNumCatVars << std::endl;
    if (fTargetIndex >= 0)
        os << "Target Index  = " << fTargetIndex << std::endl;
    for (std::size_t i = 0; i < fVars.size(); ++i)
    {
        os << "Variable " << i << std::endl;
        fVars[i]->Display(os);
    }
    os << "End of display for BINVarList object.\n";
}

/// The variable, null if there is no such index.
IBINVariable* BINVarList::At(int index) const
{
    return index >= 0 && index < static_cast<int>(fVars.size()) ? fVars[static_cast<std::size_t>(index)].get()
                                                                : nullptr;
}

/// Whether a variable other than the weight may be added under this name and with this role.
bool BINVarList::MayAdd(const std::string& name, IBINVariable::VariableRole role) const
{
    return !name.empty() && role != IBINVariable::RoleFrequencyWeight && FindVariable(name) == kNone;
}

int BINVarList::Append(std::unique_ptr<IBINVariable> variable)
{
    if (fNames == nullptr || !fNames->IsUpToDate())
        fNames = std::make_unique<NameIndex>(fVars);
    ReserveOneMore(fVars);
    fNames->Append(*variable); // the last step that can fail
    fVars.push_back(std::move(variable));
    return static_cast<int>(fVars.size()) - 1;
}

int BINVarList::AppendCategorical(std::unique_ptr<IBINVariable> variable)
{
    const bool isTarget = variable->GetVariableRole() == IBINVariable::RoleTarget;
    const int index = Append(std::move(variable));
    ++fNumCatVars;
    if (isTarget)
        fTargetIndex = index;
    return index;
}
