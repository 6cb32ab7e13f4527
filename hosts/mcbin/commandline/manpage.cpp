#include "hosts/mcbin/commandline/manpage.h"

#include "hosts/mcbin/commandline/toolhelp.h"

#include <cctype>

namespace
{

/// Escapes text for man: a line that begins with a dot or an apostrophe would be a request, and backslashes and dashes
/// have meanings of their own.
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

std::string MakeOptions(const CommandHelp& command)
{
    std::string page;
    for (const OptionGroup& group : command.groups)
    {
        page += ".SS " + Escape(command.name + ": " + group.title) + "\n";
        for (const OptionHelp& option : group.options)
        {
            page += ".TP\n.B " + Escape(option.name) + " \\fI" + Escape(option.argument) + "\\fR\n" +
                    Escape(option.description) + "\n";
        }
    }
    return page;
}

std::string MakeFooter(const std::string& footer)
{
    return ".PP\n.nf\n" + Escape(footer) + "\n.fi\n";
}

std::string MakeSynopsis(const std::string& tool, const CommandHelp& command)
{
    std::string line = ".B " + tool + " " + Escape(command.name) + "\\fR";
    for (const std::string& positional : command.positionals) line += " \\fI" + Escape(positional) + "\\fR";
    return line + " [\\fIoptions\\fR]\n.br\n";
}

} // namespace

std::string MakeManPage(const ToolHelp& tool)
{
    std::string page = ".TH " + ToUpper(tool.name) + " 1\n.SH NAME\n" + tool.name + " \\- " + Escape(tool.description) +
                       "\n.SH SYNOPSIS\n";
    for (const CommandHelp& command : tool.commands) page += MakeSynopsis(tool.name, command);
    for (const CommandHelp& command : tool.commands)
    {
        page += ".SH " + Escape(ToUpper(command.name)) + "\n" + Escape(command.description) + ".\n" +
                MakeOptions(command) + MakeFooter(command.footer);
    }
    return page + ".SH NOTES\n" + MakeFooter(tool.footer);
}
