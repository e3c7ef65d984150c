#include "function.h"
#include "interface/detection_tests.h"

#include <algorithm>

namespace ingester {

/// The head of the file, behind its name and a line end.
void Try_Function(std::string_view, std::string_view text)
{
    const std::size_t line = std::min(text.find('\n'), text.size());
    Detection_Head head{text.substr(0, line)};
    text.remove_prefix(std::min(line + 1, text.size()));
    head.length = text.copy(head.bytes.data(), head.bytes.size());
    const std::int32_t code = Code_Of_Head(head);
    Must(code >= 0 && code <= 82, "no such type of file");
}

}  // namespace ingester
