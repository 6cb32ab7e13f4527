// Sequences of calls of the library: a variable list, its encoders and missing values, settings, an algorithm of either
// kind, several runs, and callbacks that interfere. What comes out is counted again from the records.

#include "tests/fuzz/check.h"
#include "tests/fuzz/recount.h"
#include "tests/support/hostdata.h"
#include "tests/support/tempdir.h"

#include <mcobnqrt/mcobnqrt.h>

#include <fuzzer/FuzzedDataProvider.h>

#include <cstddef>
#include <cstdint>
#include <functional>
#include <limits>
#include <memory>
#include <ostream>
#include <stdexcept>
#include <streambuf>
#include <string>
#include <vector>

using MCMV::gMissingValue;
using Input = FuzzedDataProvider;

namespace
{

constexpr unsigned int kMaxVariables = 8;
constexpr int kMaxRecords = 300;

class HostError : public std::runtime_error
{
public:
    HostError() : std::runtime_error("thrown by the host") {}
};

/// Takes all and keeps nothing.
class NullBuffer : public std::streambuf
{
    int overflow(int character) override { return character; }
};

template<class Displayed>
void Display(Displayed&& object)
{
    NullBuffer buffer;
    std::ostream os(&buffer);
    object.Display(os);
}

std::string TakeName(Input& input)
{
    static const char* const kNames[] = {"", "a", "b", "c", "d", "e", "f", "g", "h", "weight"};
    return input.PickValueInArray(kNames);
}

IBINVariable::VariableRole TakeRole(Input& input)
{
    return static_cast<IBINVariable::VariableRole>(input.ConsumeIntegralInRange(0, 3));
}

double TakeNumber(Input& input)
{
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    constexpr double kLargest = std::numeric_limits<double>::max();
    static const double kSpecial[] = {
        0.0,        -0.0,      gMissingValue,     std::numeric_limits<double>::quiet_NaN(),
        1.0,        5e-324,    -5e-324,           std::numeric_limits<double>::min(),
        1e300,      -1e300,    1.0 + 0x1p-52,     1.0 - 0x1p-53,
        1.7e308,    -1.7e308,  kLargest,          9007199254740993.0,
        -kInfinity, kInfinity, 1.0 + 2 * 0x1p-52,
    };
    switch (input.ConsumeIntegralInRange(0, 7))
    {
    case 0:
        return input.PickValueInArray(kSpecial);
    case 1:
        return input.ConsumeFloatingPoint<double>();
    case 2:
        return gMissingValue;
    default:
        return input.ConsumeIntegralInRange(-40, 40) * 0.25;
    }
}

double TakeWeight(Input& input)
{
    static const double kSpecial[] = {
        0.0, -1.0,  gMissingValue,     std::numeric_limits<double>::quiet_NaN(), 0.7, 1e-300, 0.5,
        0.1, 1e300, 4503599627370497.5};
    switch (input.ConsumeIntegralInRange(0, 7))
    {
    case 0:
        return input.PickValueInArray(kSpecial);
    default:
        return input.ConsumeIntegralInRange(0, 64) / 16.0;
    }
}

/// A categorical field: nearly always a code that the variable may have.
double TakeCode(Input& input, int numCategories)
{
    static const double kSpecial[] = {
        -1.0, gMissingValue, 255.0, 256.0, -5.0, 1e300, std::numeric_limits<double>::quiet_NaN()};
    if (input.ConsumeIntegralInRange(0, 15) == 0)
        return input.PickValueInArray(kSpecial);
    return input.ConsumeIntegralInRange(0, numCategories > 0 ? numCategories - 1 : 0);
}

std::vector<double> TakeNumbers(Input& input)
{
    std::vector<double> numbers(input.ConsumeIntegralInRange<std::size_t>(0, 5));
    for (double& number : numbers) number = TakeNumber(input);
    return numbers;
}

std::vector<std::string> TakeNames(Input& input)
{
    std::vector<std::string> names(input.ConsumeIntegralInRange<std::size_t>(0, 5));
    for (std::string& name : names) name = TakeName(input);
    return names;
}

/// Encodes a value, and looks whether the encoder knows it again.
template<class Encoder, class Value>
void EncodeAndDecode(Encoder& encoder, const Value& value)
{
    const double code = encoder.Encode(value);
    Check(encoder.EncodeConst(value) == code, "a value has two codes");
    Check(code < encoder.GetNumberOfCategories(), "a code beyond the number of categories");
    if (code >= 0.0)
        Check(encoder.Decode(static_cast<int>(code)) == value, "a code stands for another value");
}

void Encode(Input& input, IBINEncoder* encoder)
{
    if (auto* const numbers = dynamic_cast<BINCatNumEncoder*>(encoder))
        EncodeAndDecode(*numbers, TakeNumber(input));
    else if (auto* const strings = dynamic_cast<BINStringEncoder*>(encoder))
        EncodeAndDecode(*strings, TakeName(input));
    else if (encoder != nullptr)
        Check(static_cast<BINRoundEncoder*>(encoder)->Encode(TakeWeight(input)) != 0.0, "a weight of 0");
    if (encoder == nullptr)
        return;
    if (input.ConsumeBool())
        encoder->SetValueLabel(input.ConsumeIntegralInRange(0, 5), TakeName(input));
    const std::unique_ptr<IBINEncoder> copy(encoder->Clone());
    Check(copy->GetNumberOfCategories() == encoder->GetNumberOfCategories(), "a clone has other categories");
}

void AddWeight(Input& input, HostData& data, const std::string& name)
{
    const auto rounding = static_cast<IBINVariable::BINWRoundingOption>(input.ConsumeIntegralInRange(0, 2));
    if (data.list.AddWeightVar(name, "", rounding) >= 0)
        data.rounding = rounding;
}

void AddVariable(Input& input, HostData& data)
{
    const std::string name = TakeName(input);
    const IBINVariable::VariableRole role = TakeRole(input);
    switch (input.ConsumeIntegralInRange(0, 5))
    {
    case 0:
        data.list.AddCatVar(name, "", TakeNumbers(input), role);
        break;
    case 1:
        data.list.AddCatVar(name, "", TakeNames(input), TakeNames(input), role);
        break;
    case 2:
        data.list.AddCatVar(name, "", input.ConsumeIntegralInRange(0, 8),
                            static_cast<IBINVariable::MeasureLevel>(input.ConsumeIntegralInRange(2, 3)), role);
        break;
    case 3:
        AddWeight(input, data, name);
        break;
    default:
        data.list.AddContVar(name, "", role);
    }
}

void ReplaceMissing(Input& input, IBINVariable& variable)
{
    auto missing = std::make_unique<BINNumericUserMissing>();
    missing->AddValue(TakeNumber(input), "");
    if (input.ConsumeBool())
        missing->SetInterval(BINNumericInterval(TakeNumber(input), input.ConsumeBool()));
    if (variable.SetUserMissingInfo(missing.get()))
        missing.release(); // the variable's now
}

/// One call on the list.
void ChangeList(Input& input, HostData& data)
{
    BINVarList& list = data.list;
    const int index = input.ConsumeIntegralInRange(-1, static_cast<int>(list.Size()));
    switch (input.ConsumeIntegralInRange(0, 9))
    {
    case 0:
        list.SetVariableRole(index, TakeRole(input));
        break;
    case 1:
        list.AddDiscreteUserMissing(index, TakeNumber(input), "");
        break;
    case 2:
        list.AddDiscreteUserMissing(index, TakeName(input), "");
        break;
    case 3:
        list.SetMissingInterval(index, TakeNumber(input), TakeNumber(input));
        break;
    case 4:
        Encode(input, list.GetEncoderAt(index));
        break;
    case 5:
        if (list.GetVarAt(index) != nullptr)
            ReplaceMissing(input, *list.GetVarAt(index));
        break;
    case 6:
        if (index != list.GetWeightIndex()) // its rounding option can't be asked for
            list.RemoveVar(index);
        break;
    case 7:
    {
        const BINVarList copy = list;
        int badIndex = -1;
        list = copy;
        copy.CanMergeWith(list, badIndex);
        Display(list);
        break;
    }
    default:
        if (list.Size() < kMaxVariables)
            AddVariable(input, data);
    }
}

/// The usual list: some attributes, then a target, then perhaps a weight.
void MakeUsualList(Input& input, HostData& data)
{
    for (const char* const name : {"x", "y", "z"}) data.list.AddContVar(name, "", IBINVariable::RoleAttribute);
    data.list.AddCatVar("t", "", input.ConsumeIntegralInRange(2, 5), IBINVariable::MeasureStringCategorical,
                        IBINVariable::RoleTarget);
    if (input.ConsumeBool())
        AddWeight(input, data, "w");
}

double TakeField(Input& input, const IBINVariable& variable)
{
    switch (variable.GetMeasureLevel())
    {
    case IBINVariable::MeasureNumericCategorical:
    case IBINVariable::MeasureStringCategorical:
        return TakeCode(input, variable.GetNumberOfCategories());
    case IBINVariable::MeasureFrequencyWeight:
        return TakeWeight(input);
    default:
        return TakeNumber(input);
    }
}

void MakeRecords(Input& input, HostData& data)
{
    // More records than the input has bytes for, so that buffers fill: the whole once more, with each field as it was.
    const int numCopies = input.ConsumeIntegralInRange(0, 9) == 0 ? input.ConsumeIntegralInRange(1, 20) : 1;
    const int numRecords = input.ConsumeIntegralInRange(0, kMaxRecords);
    for (int i = 0; i < numRecords && input.remaining_bytes() > 16; ++i)
    {
        std::vector<double> record;
        const bool isWhole = input.ConsumeIntegralInRange(0, 31) != 0;
        const auto size = isWhole ? data.list.Size() : input.ConsumeIntegralInRange(0U, data.list.Size() + 1);
        for (unsigned int field = 0; field < size; ++field)
        {
            const IBINVariable* const variable = data.list.GetVarAt(static_cast<int>(field));
            record.push_back(variable != nullptr ? TakeField(input, *variable) : 0.0);
        }
        data.records.push_back(record);
    }
    const std::vector<std::vector<double>> once = data.records;
    for (int copy = 1; copy < numCopies; ++copy) data.records.insert(data.records.end(), once.begin(), once.end());
}

/// The host's callbacks. The one whose turn has come does something to the run that it is called from.
class Callbacks : public ProgressListener, public MCQueryCancel
{
public:
    void ReportProgress(ProgressReport& report) override
    {
        report.DiscreteMeasure("IndexVar");
        report.ScaleMeasure("elapsedTime");
        Count();
    }

    bool QueryCancel() override
    {
        Count();
        return false;
    }

    void Count()
    {
        if (turnsLeft-- == 0 && action)
            action();
    }

    int turnsLeft = -1;
    std::function<void()> action;
};

/// What both kinds of algorithm have in common, for a host that doesn't care which it has.
class Session
{
public:
    virtual ~Session() = default;
    virtual bool IsMade() const = 0;
    virtual void Run(Input& input, IBINRecordSource* source) = 0;
    virtual void SetNumberOfBins(int number) = 0;
    virtual void Cancel() = 0;
    virtual void Display() = 0;
    virtual void SetListener(ProgressListener* listener) = 0;
    virtual void CheckResults(const HostData& data) = 0;
};

std::vector<int> TakeIndices(Input& input, std::size_t size)
{
    std::vector<int> indices(size);
    for (int& index : indices) index = input.ConsumeIntegralInRange(-1, static_cast<int>(kMaxVariables));
    return indices;
}

/// With the data handling settings and the callbacks.
template<class Settings>
Settings TakeSettings(Input& input, const TempDir& directory, Callbacks& callbacks, HostData& data)
{
    Settings settings;
    data.isRightClosed = input.ConsumeBool();
    settings.SetRightBorderClosed(data.isRightClosed);
    settings.SetNumberOfBins(input.ConsumeIntegralInRange(-1, 30));
    settings.SetNSkippedAttReports(input.ConsumeIntegralInRange(-1, 2));
    settings.SetNSkippedCasesReports(input.ConsumeIntegralInRange(-1, 3));
    settings.SetTempDirName(directory.Path());
    if (input.ConsumeBool())
        settings.SetCancelPointer(&callbacks);
    if (input.ConsumeBool())
        settings.SetProgressListener(&callbacks);
    Display(settings);
    return settings;
}

template<class Algorithm>
class SessionOf : public Session
{
public:
    bool IsMade() const override { return fAlgorithm != nullptr; }
    void SetNumberOfBins(int number) override { fAlgorithm->GetSettings()->SetNumberOfBins(number); }
    void Cancel() override { fAlgorithm->Cancel(); }
    void SetListener(ProgressListener* listener) override { fAlgorithm->SetProgressListener(listener); }

    void Display() override
    {
        ::Display(*fAlgorithm);
        fAlgorithm->GetStatus();
    }

protected:
    template<class Results>
    void CheckAll(const HostData& data)
    {
        std::vector<Results> results;
        fAlgorithm->GetOutput()->GetAllCutPoints(results);
        for (const Results& result : results) CheckResult(data, result);
    }

    std::unique_ptr<Algorithm> fAlgorithm;
};

class Supervised : public SessionOf<IBINAlgorithm>
{
public:
    Supervised(Input& input, const TempDir& directory, Callbacks& callbacks, HostData& data)
    {
        auto settings = TakeSettings<BINSettings>(input, directory, callbacks, data);
        settings.SetNumDistinctValueThreshold(input.ConsumeIntegralInRange(-1, 20));
        data.distinctThreshold = settings.GetNumDistinctValueThreshold();
        settings.SetSmallBinDetectionThreshold(input.ConsumeIntegralInRange(0, 8) / 8.0);
        BINFactory factory;
        fAlgorithm.reset(factory.CreateBINAlgorithm(settings, data.list));
        Check((fAlgorithm == nullptr) == factory.GetStatus().IsError(), "the factory's status");
    }

    void Run(Input& input, IBINRecordSource* source) override
    {
        const auto attributes = TakeIndices(input, input.ConsumeIntegralInRange<std::size_t>(0, 6));
        const bool isOfOneLength = input.ConsumeIntegralInRange(0, 7) != 0;
        const auto targets = TakeIndices(input, isOfOneLength ? attributes.size() : 2);
        const int lists = input.ConsumeIntegralInRange(0, 4);
        fAlgorithm->Run(source, lists > 1 ? &attributes : nullptr, lists > 2 ? &targets : nullptr);
    }

    void CheckResults(const HostData& data) override { CheckAll<BINAttributeTargetResults>(data); }
};

class EqualFrequency : public SessionOf<IEFBINAlgorithm>
{
public:
    EqualFrequency(Input& input, const TempDir& directory, Callbacks& callbacks, HostData& data)
    {
        auto settings = TakeSettings<EFBINSettings>(input, directory, callbacks, data);
        EFBINFactory factory;
        fAlgorithm.reset(factory.CreateEFBINAlgorithm(settings, data.list));
        Check((fAlgorithm == nullptr) == factory.GetStatus().IsError(), "the factory's status");
    }

    void Run(Input& input, IBINRecordSource* source) override
    {
        const auto attributes = TakeIndices(input, input.ConsumeIntegralInRange<std::size_t>(0, 6));
        fAlgorithm->Run(source, input.ConsumeBool() ? &attributes : nullptr);
    }

    void CheckResults(const HostData& data) override { CheckAll<BINAttributeResults>(data); }
};

/// Prepares what the callbacks will do. `nested` is the input of a run that one of them makes.
void ArmCallbacks(Input& input, Callbacks& callbacks, Session& session, const HostData& data, Input& nested)
{
    callbacks.turnsLeft = input.ConsumeIntegralInRange(-1, 60);
    switch (input.ConsumeIntegralInRange(0, 6))
    {
    case 0:
        callbacks.action = [] { throw HostError(); };
        break;
    case 1:
        callbacks.action = [&session] { session.Cancel(); };
        break;
    case 2:
        callbacks.action = [&session] { session.SetListener(nullptr); };
        break;
    case 3:
        callbacks.action = [&session] { session.Display(); };
        break;
    case 4:
        callbacks.action = [&session, &nested] { session.Run(nested, nullptr); };
        break;
    case 5:
        callbacks.action = [&session, &data] { session.CheckResults(data); };
        break;
    default:
        callbacks.action = nullptr;
    }
}

void CallAlgorithm(Input& input, Session& session, Callbacks& callbacks, const HostData& data)
{
    std::vector<std::uint8_t> nestedBytes = input.ConsumeBytes<std::uint8_t>(24);
    Input nested(nestedBytes.data(), nestedBytes.size());
    RecordTable source;
    source.fRows = data.records;
    source.fBeforeNext = [&callbacks](std::size_t) { callbacks.Count(); };
    ArmCallbacks(input, callbacks, session, data, nested);
    try
    {
        session.Run(input, input.ConsumeIntegralInRange(0, 15) != 0 ? &source : nullptr);
    }
    catch (const HostError&)
    {
        // It passes through, as it should.
    }
    callbacks.action = nullptr;
    session.CheckResults(data);
    if (input.ConsumeBool())
        session.SetNumberOfBins(input.ConsumeIntegralInRange(-1, 30));
}

std::unique_ptr<Session> MakeSession(Input& input, const TempDir& directory, Callbacks& callbacks, HostData& data)
{
    if (input.ConsumeBool())
        return std::make_unique<Supervised>(input, directory, callbacks, data);
    return std::make_unique<EqualFrequency>(input, directory, callbacks, data);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size)
{
    static const TempDir directory;
    Input input(bytes, size);
    HostData data;
    if (input.ConsumeBool())
        MakeUsualList(input, data);
    for (int i = input.ConsumeIntegralInRange(0, 20); i > 0; --i) ChangeList(input, data);

    Callbacks callbacks;
    const int numRuns = input.ConsumeIntegralInRange(1, 3);
    const std::unique_ptr<Session> session = MakeSession(input, directory, callbacks, data);
    if (!session->IsMade())
        return 0;
    std::vector<std::uint8_t> runBytes = input.ConsumeBytes<std::uint8_t>(120);
    Input runs(runBytes.data(), runBytes.size());
    MakeRecords(input, data);
    for (int i = 0; i < numRuns; ++i) CallAlgorithm(runs, *session, callbacks, data);
    return 0;
}
