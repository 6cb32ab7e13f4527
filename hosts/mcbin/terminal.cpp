#include "hosts/mcbin/terminal.h"

#include <algorithm>
#include <cstdlib>
#include <string_view>

#include <sys/ioctl.h>
#include <unistd.h>

bool IsTerminal(int descriptor)
{
    return isatty(descriptor) == 1;
}

std::optional<std::size_t> GetTerminalWidth(int descriptor)
{
    constexpr std::size_t kLeast = 40;
    winsize size = {};
    if (!IsTerminal(descriptor))
        return std::nullopt;
    if (ioctl(descriptor, TIOCGWINSZ, &size) != 0 || size.ws_col == 0)
        return 80;
    return std::max<std::size_t>(kLeast, size.ws_col);
}

bool HasColours(int descriptor)
{
    const char* const noColour = std::getenv("NO_COLOR");
    const char* const kind = std::getenv("TERM");
    const bool isUnwanted = (noColour && *noColour) || (kind && std::string_view(kind) == "dumb");
    return IsTerminal(descriptor) && !isUnwanted;
}
