#include <mcobnqrt/mcobnqrt.h>

#include <iostream>
#include <memory>
#include <string>
#include <vector>

namespace
{

/// Ages from 1 to 12; those above 6 have bought.
class Records : public IBINRecordSource
{
public:
    bool HasNext() override { return fNumRead < 12; }

    const MCCommon::Record* Next() override
    {
        ++fNumRead;
        fRecord[0] = fNumRead;
        fRecord[1] = fNumRead > 6 ? 1.0 : 0.0;
        return &fRecord;
    }

private:
    MCCommon::Record fRecord{2};
    int fNumRead = 0;
};

} // namespace

int main()
{
    BINVarList list;
    const int age = list.AddContVar("age", "", IBINVariable::RoleAttribute);
    const int bought = list.AddCatVar("bought", "", std::vector<std::string>{"no", "yes"}, IBINVariable::RoleTarget);
    BINSettings settings;
    settings.SetNumberOfBins(10);

    BINFactory factory;
    const std::unique_ptr<IBINAlgorithm> algorithm(factory.CreateBINAlgorithm(settings, list));
    Records records;
    BINAttributeTargetResults results;
    if (algorithm && algorithm->Run(&records, nullptr, nullptr).IsOK())
        algorithm->GetOutput()->GetAttributeTargetCutPoints(age, bought, results);

    if (results.GetCutPoints() != std::vector<double>{6.0})
    {
        std::cerr << "expected one cut point, 6, and found " << results.GetCutPoints().size() << '\n';
        return 1;
    }
    return 0;
}
