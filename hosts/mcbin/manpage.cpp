#include "hosts/mcbin/manpage.h"

#include "hosts/mcbin/text.h"

#include <CLI/CLI.hpp>

#include <cctype>
#include <ostream>
#include <string>
#include <vector>

namespace
{

/// Text that is not taken for a request: no line begins with a dot or an apostrophe, and backslashes and dashes are
/// what they are.
std::string Escape(const std::string& text)
{
    std::string escaped;
    for (const char c : text)
    {
        if ((c == '.' || c == '\'') && (escaped.empty() || escaped.back() == '\n'))
            escaped += "\\&";
        escaped += c == '\\' ? "\\e" : c == '-' ? "\\-" : std::string(1, c);
    }
    return escaped;
}

std::string ToUpper(std::string text)
{
    for (char& c : text) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    return text;
}

void PrintOption(std::ostream& os, const CLI::Option& option)
{
    os << ".TP\n.B " << Escape(option.get_name(false, true)) << " \\fI" << Escape(option.get_option_text()) << "\\fR\n"
       << Escape(option.get_description()) << '\n';
}

/// Options without a group are hidden ones.
void PrintOptions(std::ostream& os, const CLI::App& app)
{
    for (const std::string& group : app.get_groups())
    {
        const auto isInGroup = [&](const CLI::Option* option) { return option->get_group() == group; };
        const std::vector<const CLI::Option*> options = app.get_options(isInGroup);
        if (group.empty() || options.empty())
            continue;
        os << ".SS " << Escape(app.get_name() + ": " + group) << '\n';
        for (const CLI::Option* const option : options) PrintOption(os, *option);
    }
}

/// A footer is made of parts, "Title:" with lines below it, or text alone.
void PrintFooter(std::ostream& os, const CLI::App& app)
{
    os << ".PP\n.nf\n" << Escape(app.get_footer()) << "\n.fi\n";
}

} // namespace

void PrintManPage(std::ostream& os, const CLI::App& app)
{
    const std::string& name = app.get_name();
    os << ".TH " << ToUpper(name) << " 1\n.SH NAME\n"
       << name << " \\- " << Escape(app.get_description()) << "\n.SH SYNOPSIS\n";
    const std::vector<const CLI::App*> commands = app.get_subcommands([](const CLI::App*) { return true; });
    for (const CLI::App* const command : commands)
    {
        os << ".B " << name << ' ' << Escape(command->get_name()) << "\\fR";
        for (const CLI::Option* const option : command->get_options())
            if (option->get_positional())
                os << " \\fI" << Escape(option->get_name(true)) << "\\fR";
        os << " [\\fIoptions\\fR]\n.br\n";
    }
    for (const CLI::App* const command : commands)
    {
        os << ".SH " << Escape(ToUpper(command->get_name())) << '\n' << Escape(command->get_description()) << ".\n";
        PrintOptions(os, *command);
        PrintFooter(os, *command);
    }
    os << ".SH NOTES\n";
    PrintFooter(os, app);
}
