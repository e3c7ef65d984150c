#include "spreadsheet/text/text_manner.h"

#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/dialect/text_dialect.h"
#include "support/text.h"

#include <algorithm>
#include <string>

namespace ingester {

namespace {

constexpr std::string_view Separators = ",;\t|";

/// Whether one of the names has a mark at its end.
bool Names_Are_Marked(std::string_view names)
{
    while (!names.empty()) {
        const std::size_t end = std::min(names.find_first_of(Separators), names.size());
        const std::string_view name = Trim_Copy(names.substr(0, end));
        if (name.size() > 1 && (name.ends_with('!') || name.ends_with(":D") || name.ends_with(":T")))
            return true;
        names.remove_prefix(std::min(end + 1, names.size()));
    }
    return false;
}

/// Whether a star fills a field of a line.
bool Holds_Star(std::string_view lines)
{
    const auto ends_field = [](char c) {
        return c == '\n' || c == '\r' || Separators.find(c) != Separators.npos;
    };
    for (std::size_t at = lines.find('*', 1); at < lines.size(); at = lines.find('*', at + 1))
        if (ends_field(lines[at - 1]) && (at + 1 == lines.size() || ends_field(lines[at + 1])))
            return true;
    return false;
}

}  // namespace

Text_Manner Manner_Of_Text(std::string_view bytes)
{
    constexpr std::size_t head_size = 1 << 16;
    Text_Manner manner;
    std::size_t mark_length = 0;
    const Text_Code marked = Code_Of_Mark(bytes, mark_length);
    manner.code = marked != nullptr ? marked : Code_Of_Bytes(bytes, nullptr);
    manner.code_mark = marked != nullptr;
    Text_Converter converter = Sure_Converter(manner.code, Utf_8_Code());
    const std::string_view head = converter.Convert(bytes.substr(mark_length, head_size));
    const std::size_t line = std::min(head.find('\n'), head.size());
    manner.separator = Find_Dialect(head, {}).dialect.separator;
    manner.crlf = line < head.size() && line > 0 && head[line - 1] == '\r';
    manner.marks = Names_Are_Marked(head.substr(0, line));
    manner.stars = Holds_Star(head.substr(line));
    return manner;
}

void Keep_Manner_Of_Text(std::string_view bytes, const char* name)
{
    const Text_Manner manner = Manner_Of_Text(bytes);
    request.Write_Crlf = request.Write_Crlf || manner.crlf;
    request.Write_Marks = request.Write_Marks || manner.marks;
    request.Write_Separator = manner.separator;
    if (manner.stars && !request.Missing_Text_Given) {
        request.Missing_Text = "*";
        request.Missing_Text_Given = true;
    }
    if (!request.Output_Encoding.empty())
        return;
    request.Write_Code_Mark = request.Write_Code_Mark || manner.code_mark;
    if (Is_Unicode(manner.code))
        request.Output_Encoding = manner.code == Code_Of_Letters() ? std::string_view() : manner.code->name;
    else if (manner.code != Code_Of_Letters())
        Warn("Note: %.300s was a text in %s and is one in UTF-8 now; a declared code of the output keeps "
             "it.\n",
             name, std::string(manner.code->name).c_str());
}

}  // namespace ingester
