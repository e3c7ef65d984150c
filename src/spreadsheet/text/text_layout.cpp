#include "spreadsheet/text/text_layout.h"

#include "request/request.h"
#include "spreadsheet/dialect/field_kind.h"
#include "support/text.h"

#include <algorithm>
#include <limits>

namespace ingester {

namespace {

/// The marks of a text for other programs are asked for; those of hosts may be asked away.
bool Marks_Are_Wanted(bool plain)
{
    return !request.No_Name_Marks && (!plain || request.Write_Marks);
}

Text_Layout Host_Layout(bool tab_mode)
{
    Text_Layout layout = {Layout::fixed, true, false, ' '};
    if (tab_mode)
        layout = {Layout::tabs, false, false, '\t'};
    else if (request.CSV_Output)
        layout = {Layout::commas, !request.Packed_Csv_Output, Get_Settings().csv_quote_text != 0, ','};
    layout.marked = Marks_Are_Wanted(false);
    layout.missing = request.Missing_Text.view();
    return layout;
}

void Make_Plain(Text_Layout& layout)
{
    constexpr std::string_view known_separators = ";|\t";
    layout.plain = true;
    if (layout.layout == Layout::commas
        && known_separators.find(request.Write_Separator) != known_separators.npos)
        layout.separator = request.Write_Separator;
    layout.quoted = false;
    layout.tells_texts = Get_Settings().csv_quote_text != 0;
    layout.marked = Marks_Are_Wanted(true);
    if (!request.Missing_Text_Given && !request.Write_Marks)
        layout.missing.clear();
    layout.line_end = request.Write_Crlf ? "\r\n" : "\n";
    layout.longest_line = std::numeric_limits<std::size_t>::max();
}

/// No program reads UTF-16 that has no mark.
bool Needs_Mark(Text_Code code)
{
    return code != nullptr && code->kind != Code_Kind::utf_8 && Is_Unicode(code);
}

}  // namespace

Text_Layout Layout_Of_Request(bool tab_mode)
{
    Text_Layout layout = Host_Layout(tab_mode);
    if (For_People(People_Rule::plain_texts) && layout.layout != Layout::fixed)
        Make_Plain(layout);
    if (!request.Output_Encoding.empty())
        layout.code = Find_Text_Code(request.Output_Encoding);
    layout.code_mark = request.Write_Code_Mark || Needs_Mark(layout.code);
    return layout;
}

bool Looks_Missing(std::string_view text)
{
    constexpr std::string_view words_of_others[] = {"*", "#N/A", "None", "Inf", "-Inf"};
    constexpr std::size_t longest = 4;
    const auto is_text = [text](std::string_view word) { return Equal_Ignoring_Case(word, text); };
    return text.empty()
           || (text.size() <= longest
               && (std::ranges::any_of(Missing_Words, is_text)
                   || std::ranges::any_of(words_of_others, is_text)));
}

bool Looks_Like_Data(std::string_view text)
{
    constexpr std::string_view signs = "0123456789+-.:,/eETZ ";
    const auto is_digit = [](char c) { return Is_Digit(c); };
    return Looks_Missing(text)
           || (text.find_first_not_of(signs) == std::string_view::npos
               && std::ranges::any_of(text, is_digit));
}

bool Name_Looks_Like_Data(std::string_view name)
{
    bool starts = true;
    for (const char c : name) {
        if (starts && (Is_Digit(c) || c == '-' || c == '+' || c == '*'))
            return true;
        starts = c == ' ' || (starts && c == '.');
    }
    return name.empty();
}

}  // namespace ingester
