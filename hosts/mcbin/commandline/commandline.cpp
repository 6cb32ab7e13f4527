#include "hosts/mcbin/commandline/commandline.h"

#include "bins/text.h"
#include "hosts/mcbin/commandline/commands.h"
#include "hosts/mcbin/commandline/completion.h"
#include "hosts/mcbin/commandline/manpage.h"
#include "hosts/mcbin/commandline/toolhelp.h"
#include "hosts/mcbin/helptexts.h"
#include "hosts/mcbin/spelling.h"

#include <mcobnqrt/binfactory.h>
#include <mcobnqrt/binsettings.h>
#include <mcobnqrt/binvarlist.h>
#include <mcobnqrt/ibinalgorithm.h>

#include <CLI/CLI.hpp>

#include <algorithm>
#include <memory>
#include <optional>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

namespace
{

/// The version of the tool, which is the library's.
std::string GetVersion()
{
    BINSettings settings;
    BINVarList list;
    list.AddContVar("x", "", IBINVariable::RoleAttribute);
    const std::unique_ptr<IBINAlgorithm> algorithm(BINFactory().CreateBINAlgorithm(settings, list));
    return "mcbin " MCBIN_VERSION " with " + (algorithm ? algorithm->GetVersionString() : "");
}

/// The options of a command by group; those without one are hidden.
std::vector<OptionGroup> DescribeOptions(const CLI::App& command)
{
    std::vector<OptionGroup> groups;
    for (const std::string& title : command.get_groups())
    {
        OptionGroup group{title, {}};
        for (const CLI::Option* const option : command.get_options())
        {
            if (option->get_group() == title)
            {
                group.options.push_back(
                    {option->get_name(false, true), option->get_option_text(), option->get_description()});
            }
        }
        if (!title.empty() && !group.options.empty())
            groups.push_back(group);
    }
    return groups;
}

ToolHelp DescribeTool(const CLI::App& app)
{
    ToolHelp tool{app.get_name(), app.get_description(), {}, app.get_footer()};
    for (const CLI::App* const command : app.get_subcommands([](const CLI::App*) { return true; }))
    {
        CommandHelp help{
            command->get_name(), command->get_description(), {}, DescribeOptions(*command), command->get_footer()};
        for (const CLI::Option* const option : command->get_options())
        {
            if (option->get_positional())
                help.positionals.push_back(option->get_name(true));
        }
        tool.commands.push_back(help);
    }
    return tool;
}

std::unique_ptr<CLI::App> MakeApp(Request& request)
{
    auto app =
        std::make_unique<CLI::App>("Finds bins in the columns of a text file, shows them, and applies them.", "mcbin");
    app->require_subcommand(0, 1);
    app->set_version_flag("--version", GetVersion);
    const auto print = [&request](std::string text)
    {
        request.command = Request::Command::kText;
        request.text = std::move(text);
    };
    app->add_flag_callback(
           "--man", [print, tool = app.get()] { print(MakeManPage(DescribeTool(*tool))); },
           "Print this as a manual page, for man")
        ->group("");
    app->add_option_function<std::string>(
           "--completion",
           [print, tool = app.get()](const std::string& shell)
           {
               const ToolHelp help = DescribeTool(*tool);
               print(shell == "bash" ? MakeBashCompletion(help) : MakeZshCompletion(help));
           },
           "Print a script by which the shell completes commands and options")
        ->check(CLI::IsMember({"bash", "zsh"}))
        ->option_text("bash|zsh");
    app->footer(std::string("'mcbin COMMAND --help' tells of the options of a command.\n\n") + kExitCodes);
    AddSupervised(*app, request);
    AddEqualFrequency(*app, request);
    AddShow(*app, request);
    AddEvaluate(*app, request);
    AddApply(*app, request);
    app->final_callback(
        [&request]
        {
            if (request.command == Request::Command::kNone)
                throw CLI::RequiredError("A command");
        });
    return app;
}

/// The first argument is an option or the name of a command. Without this check it would be told to be one too many.
void ThrowUnlessCommand(const CLI::App& app, int argc, const char* const* argv)
{
    const std::string word = argc > 1 ? argv[1] : "-";
    if (!word.empty() && word.front() == '-')
        return;
    std::vector<std::string> names;
    for (const CLI::App* const command : app.get_subcommands([](const CLI::App*) { return true; }))
        names.push_back(command->get_name());
    if (std::find(names.begin(), names.end(), word) != names.end())
        return;
    const std::optional<std::string> near = FindNear(word, names);
    throw UsageError("no such command: " + Quote(word) + "; " +
                     (near ? "did you mean '" + *near + "'?" : "there are " + Join(names, ", ")));
}

} // namespace

Request ParseCommandLine(int argc, const char* const* argv)
{
    Request request;
    const std::unique_ptr<CLI::App> app = MakeApp(request);
    ThrowUnlessCommand(*app, argc, argv);
    try
    {
        app->parse(argc, argv);
    }
    catch (const CLI::Success& help)
    {
        std::ostringstream text;
        app->exit(help, text, text);
        request.command = Request::Command::kText;
        request.text = text.str();
    }
    catch (const CLI::ParseError& error)
    {
        throw UsageError(error.what());
    }
    return request;
}
