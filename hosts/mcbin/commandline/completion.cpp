#include "hosts/mcbin/commandline/completion.h"

#include "bins/text.h"
#include "hosts/mcbin/commandline/toolhelp.h"

#include <fmt/format.h>

#include <vector>

namespace
{

std::vector<std::string> Split(const std::string& text, char separator)
{
    std::vector<std::string> parts(1);
    for (const char c : text)
    {
        if (c == separator)
            parts.emplace_back();
        else
            parts.back() += c;
    }
    return parts;
}

/// The words that can follow an option: those of small letters, as "rate" and "text" of "rate|text|COLUMN=a,b,c".
/// Nothing if it is followed by nothing, or by what the user knows.
std::string FindChoices(const OptionHelp& option)
{
    std::vector<std::string> choices;
    for (const std::string& word : Split(option.argument, '|'))
    {
        if (!word.empty() && word.find_first_not_of("abcdefghijklmnopqrstuvwxyz") == std::string::npos)
            choices.push_back(word);
    }
    return Join(choices, " ");
}

bool IsFile(const OptionHelp& option)
{
    return option.argument.rfind("FILE", 0) == 0;
}

bool IsDirectory(const OptionHelp& option)
{
    return option.argument == "DIR";
}

/// "-o" and "--output" of "-o,--output"; none of what is given by its position.
std::vector<std::string> FindNames(const OptionHelp& option)
{
    std::vector<std::string> names;
    for (const std::string& name : Split(option.name, ','))
    {
        if (name[0] == '-')
            names.push_back(name);
    }
    return names;
}

/// All names of all options, with blanks between them.
std::string ListOptions(const CommandHelp& command)
{
    std::vector<std::string> names;
    for (const OptionGroup& group : command.groups)
    {
        for (const OptionHelp& option : group.options)
        {
            for (const std::string& name : FindNames(option)) names.push_back(name);
        }
    }
    return Join(names, " ");
}

std::string ListCommands(const ToolHelp& tool)
{
    std::vector<std::string> names;
    for (const CommandHelp& command : tool.commands) names.push_back(command.name);
    return Join(names, " ");
}

/// The cases of `COMMAND OPTION` in which the word behind an option is no file, which would be completed as one.
std::string MakeBashCases(const CommandHelp& command)
{
    std::string cases;
    for (const OptionGroup& group : command.groups)
    {
        for (const OptionHelp& option : group.options)
        {
            if (option.argument.empty() || IsFile(option))
                continue;
            const std::string how = IsDirectory(option) ? "-d" : "-W '" + FindChoices(option) + "'";
            for (const std::string& name : FindNames(option))
                cases += fmt::format("        '{} {}') _mcbin_offer {}; return ;;\n", command.name, name, how);
        }
    }
    return cases;
}

/// Text within single quotes.
std::string EscapeQuotes(const std::string& text)
{
    std::string escaped;
    for (const char c : text) escaped += c == '\'' ? "'\\''" : std::string(1, c);
    return escaped;
}

/// Text in a specification of zsh's, where brackets and colons end a part.
std::string EscapeZsh(const std::string& text)
{
    std::string escaped;
    for (const char c : text)
    {
        if (c == '[' || c == ']' || c == ':' || c == '\\')
            escaped += '\\';
        escaped += c;
    }
    return EscapeQuotes(escaped);
}

/// What zsh is to do for the word behind an option.
std::string MakeZshAction(const OptionHelp& option)
{
    const std::string choices = FindChoices(option);
    if (!choices.empty())
        return "(" + choices + ")";
    return IsFile(option) ? "_files" : IsDirectory(option) ? "_files -/" : " ";
}

std::string MakeZshOptions(const CommandHelp& command)
{
    std::string options;
    for (const OptionGroup& group : command.groups)
    {
        for (const OptionHelp& option : group.options)
        {
            const bool isFlag = option.argument.empty();
            for (const std::string& name : FindNames(option))
            {
                const bool isLong = name.rfind("--", 0) == 0;
                options += " \\\n        '*" + name +
                           (isFlag   ? ""
                            : isLong ? "="
                                     : "+") +
                           "[" + EscapeZsh(option.description) + "]" +
                           (isFlag ? "" : ":" + EscapeZsh(option.argument) + ":" + MakeZshAction(option)) + "'";
            }
        }
    }
    return options;
}

} // namespace

std::string MakeBashCompletion(const ToolHelp& tool)
{
    std::string script = "# Completes the commands and options of " + tool.name + R"( in bash.

# Offers what compgen makes of the options. A word behind an option that takes no file is not completed as one.
_mcbin_offer()
{
    compopt +o default 2>/dev/null
    mapfile -t COMPREPLY < <(compgen "$@" -- "$word")
}

_mcbin()
{
    local word=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD - 1]} command=${COMP_WORDS[1]}
    COMPREPLY=()
    # bash takes "--option=word" for three words.
    if [[ $word == = ]]; then
        word=
    elif [[ $before == = ]]; then
        before=${COMP_WORDS[COMP_CWORD - 2]}
    fi
    if ((COMP_CWORD == 1)); then
        _mcbin_offer -W ')" +
                         ListCommands(tool) +
                         R"( --help --version --completion'
        return
    fi
    case "$command $before" in
)";
    for (const CommandHelp& command : tool.commands) script += MakeBashCases(command);
    script += "    esac\n    [[ $word == -* ]] || return\n    case $command in\n";
    for (const CommandHelp& command : tool.commands)
        script += "        " + command.name + ") _mcbin_offer -W '" + ListOptions(command) + "' ;;\n";
    return script + "    esac\n}\n\ncomplete -o default -F _mcbin " + tool.name + "\n";
}

std::string MakeZshCompletion(const ToolHelp& tool)
{
    std::string script = "#compdef " + tool.name + "\n\nlocal -a commands=(\n";
    for (const CommandHelp& command : tool.commands)
        script += "    '" + command.name + ":" + EscapeQuotes(command.description) + "'\n";
    script += ")\n\n_arguments -C '--help[print the help]' '--version[print the version]' '1:command:->command' "
              "'*::argument:->argument'\ncase $state in\ncommand)\n    _describe command commands\n    "
              ";;\nargument)\n    case $words[1] in\n";
    for (const CommandHelp& command : tool.commands)
    {
        script += "    " + command.name + ")\n        _arguments" + MakeZshOptions(command) +
                  " \\\n        '*:file:_files'\n        ;;\n";
    }
    return script + "    esac\n    ;;\nesac\n";
}
