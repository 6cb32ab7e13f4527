#include "hosts/python/src/runs.h"

#include <mcobnqrt/mcobnqrt.h>

#include <memory>
#include <optional>

namespace
{

/// Neither of the named options: the library counts a weight as it comes, rounded by then.
constexpr auto kUnrounded = static_cast<IBINVariable::BINWRoundingOption>(2);

/// The list wants names that differ, and a table may have two alike or an empty one: here each is its number. What is
/// missing comes as a number that says so already.
BINVarList MakeList(const std::vector<Variable>& variables)
{
    BINVarList list;
    for (std::size_t i = 0; i < variables.size(); ++i)
    {
        const Variable& variable = variables[i];
        const std::string name = std::to_string(i);
        switch (variable.use)
        {
        case Variable::Use::kAttribute:
            list.AddContVar(name, variable.name, IBINVariable::RoleAttribute);
            break;
        case Variable::Use::kWeight:
            list.AddWeightVar(name, variable.name, kUnrounded);
            break;
        case Variable::Use::kCategory:
        case Variable::Use::kCode:
            list.AddCatVar(name, variable.name, static_cast<int>(variable.GetNumCategories()),
                           IBINVariable::MeasureNumericCategorical, IBINVariable::RoleAttribute);
            break;
        }
    }
    return list;
}

/// The host's objects that an algorithm points to; they outlive it.
class Host
{
public:
    Host(BlockSource& blocks, std::size_t numFields, const nanobind::object& progress, Interrupts& interrupts)
        : fRecords(blocks, numFields, interrupts), fCancel(fRecords, interrupts)
    {
        if (!progress.is_none())
            fListener.emplace(fRecords, progress);
    }

    template<class Settings>
    Settings MakeSettings(const RunOptions& options)
    {
        Settings settings;
        settings.SetNumberOfBins(options.numBins);
        settings.SetRightBorderClosed(options.isRightClosed);
        if (!options.tempDir.empty())
            settings.SetTempDirName(options.tempDir);
        settings.SetCancelPointer(&fCancel);
        if (fListener)
            settings.SetProgressListener(&*fListener);
        return settings;
    }

    /// Runs the algorithm, on further arguments for its Run, and takes all that it has to tell.
    template<class Result, class Algorithm, class... Arguments>
    Outcome<Result> Run(Algorithm& algorithm, Arguments... arguments)
    {
        Outcome<Result> outcome;
        outcome.status = algorithm.Run(&fRecords, arguments...);
        algorithm.GetOutput()->GetAllCutPoints(outcome.results); // its only complaint is that there are none
        outcome.numRecords = fRecords.GetNumRecords();
        outcome.version = algorithm.GetVersionString();
        return outcome;
    }

private:
    BlockRecords fRecords;
    CancelOnInterrupt fCancel;
    std::optional<ProgressToPython> fListener;
};

} // namespace

Outcome<BINAttributeTargetResults> RunSupervised(BlockSource& blocks, const std::vector<Variable>& variables,
                                                 const std::vector<int>& attributes, const std::vector<int>& targets,
                                                 const RunOptions& options, const nanobind::object& progress,
                                                 Interrupts& interrupts)
{
    Host host(blocks, variables.size(), progress, interrupts);
    auto settings = host.MakeSettings<BINSettings>(options);
    settings.SetNumDistinctValueThreshold(options.maxDistinct);
    settings.SetSmallBinDetectionThreshold(options.smallBinRatio);
    BINVarList list = MakeList(variables);

    BINFactory factory;
    const std::unique_ptr<IBINAlgorithm> algorithm(factory.CreateBINAlgorithm(settings, list));
    if (!algorithm)
        return {factory.GetStatus(), {}, 0, {}};
    return host.Run<BINAttributeTargetResults>(*algorithm, &attributes, &targets);
}

Outcome<BINAttributeResults> RunEqualFrequency(BlockSource& blocks, const std::vector<Variable>& variables,
                                               const std::vector<int>& attributes, const RunOptions& options,
                                               const nanobind::object& progress, Interrupts& interrupts)
{
    Host host(blocks, variables.size(), progress, interrupts);
    auto settings = host.MakeSettings<EFBINSettings>(options);
    BINVarList list = MakeList(variables);

    EFBINFactory factory;
    const std::unique_ptr<IEFBINAlgorithm> algorithm(factory.CreateEFBINAlgorithm(settings, list));
    if (!algorithm)
        return {factory.GetStatus(), {}, 0, {}};
    return host.Run<BINAttributeResults>(*algorithm, &attributes);
}
