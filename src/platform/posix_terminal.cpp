#include "platform/terminal.h"

#include <sys/ioctl.h>
#include <unistd.h>

namespace ingester {

std::size_t Terminal_Width()
{
    constexpr std::size_t usual = 80;
    struct winsize size {};
    if (::isatty(STDOUT_FILENO) == 0)
        return 0;
    return ::ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0 ? size.ws_col : usual;
}

}  // namespace ingester
