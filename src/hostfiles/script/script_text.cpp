#include "hostfiles/script/script_text.h"

#include "model/calendar.h"
#include "model/sheet.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace ingester {

void Script_Buffer::Empty_For(std::size_t count)
{
    if (used_ > 0)
        file_.Write(bytes_.get(), used_);
    used_ = 0;
    const std::size_t wanted = std::max(count + longest_break, first_capacity);
    if (wanted <= capacity_)
        return;
    bytes_ = std::make_unique_for_overwrite<char[]>(wanted);
    capacity_ = wanted;
}

/// What must come before a piece. A line that nothing stands on is not broken: the piece is longer
/// than any line. A single mark and the end of data stay on the line they belong to; a digit is data.
std::string_view Script_Buffer::Break_Before(std::string_view piece, bool keep_whole) const
{
    const std::size_t first_line = std::min(piece.find('\n'), piece.size());
    const bool fits = column_ + static_cast<std::int64_t>(first_line) < Script_Line_Limit;
    if (verbatim_ || fits || column_ == 0 || first_line == 0)
        return {};
    if (keep_whole)
        return "\\\n";
    const bool mark = piece.size() == 1 && !Is_Digit(piece.front());
    return mark || piece.front() == ':' ? "" : "\n";
}

void Script_Buffer::Take(const char* end, bool keep_whole)
{
    char* const start = bytes_.get() + used_;
    const std::string_view piece(start, static_cast<std::size_t>(end - start));
    const std::size_t size = piece.size();
    const std::string_view line_break = Break_Before(piece, keep_whole);
    if (!line_break.empty()) {
        std::memmove(start + line_break.size(), start, size);
        std::memcpy(start, line_break.data(), line_break.size());
        used_ += line_break.size();
        column_ = 0;
    }
    const std::string_view placed(bytes_.get() + used_, size);
    const std::size_t last_feed = placed.rfind('\n');
    column_ = last_feed == std::string_view::npos ? column_ + static_cast<std::int64_t>(size)
                                                  : static_cast<std::int64_t>(size - last_feed - 1);
    used_ += size;
}

void Script_Buffer::Flush()
{
    if (column_ > 0) {
        *Reserve(1) = '\n';
        ++used_;
    }
    column_ = 0;
    if (used_ > 0)
        file_.Write(bytes_.get(), used_);
    used_ = 0;
}

void Write_Script_Text(std::string_view text, bool keep_whole, bool flush, Script_Buffer& script)
{
    if (!text.empty()) {
        text = script.Texts().Cross(text);
        char* const target = script.Reserve(text.size());
        std::memcpy(target, text.data(), text.size());
        script.Take(target + text.size(), keep_whole);
    }
    if (flush)
        script.Flush();
}

char* Escape_Script_Text(char* target, std::string_view text, std::size_t limit)
{
    for (const char c : text.substr(0, limit)) {
        if (c == '"' || c == '\'' || c == '\\' || c == '`')
            *target++ = c;
        *target++ = static_cast<unsigned char>(c) < ' ' ? ' ' : c;
    }
    return target;
}

namespace {

char* Copy_Text(char* target, std::string_view text)
{
    return std::copy(text.begin(), text.end(), target);
}

}  // namespace

void Write_Quoted(std::string_view before, std::string_view text, std::size_t limit, std::string_view after,
                  bool keep_whole, Script_Buffer& script)
{
    constexpr std::size_t quotes = 2;
    text = script.Texts().Cross(text).substr(0, limit);
    char* target = script.Reserve(before.size() + 2 * text.size() + quotes + after.size());
    target = Copy_Text(target, before);
    *target++ = '\'';
    target = Escape_Script_Text(target, text, limit);
    *target++ = '\'';
    script.Take(Copy_Text(target, after), keep_whole);
}

char* Format_Script_Number(char* target, double value, double missing, bool to_day_count)
{
    constexpr int digits = 12;
    constexpr double greatest_general = 1e9;
    // Where a Sheet's missing value is no negative number, the offset would make it a date.
    if (to_day_count && value > missing)
        Serial_To_Day_Count(value, missing);
    if (!(value > missing)) {
        *target = '*';
        return target + 1;
    }
    if (value > Greatest_Number)
        return Copy_Text(target, "9.99999E+307");
    return std::fabs(value) > greatest_general ? Print_Exponent(target, value, digits)
                                               : Print_General(target, value, digits);
}

void Write_Statement_Number(std::string_view before, double value, const Script_Number_Form& form,
                            Script_Buffer& script)
{
    char* const target = Copy_Text(script.Reserve(before.size() + Number_Text_Room), before);
    script.Take(Format_Script_Number(target, value, form.missing, form.to_day_count), true);
}

void Write_Data_Number(double value, const Script_Number_Form& form, Script_Buffer& script)
{
    char* end = script.Reserve(Number_Text_Room);
    end = Format_Script_Number(end, value, form.missing, form.to_day_count);
    *end++ = ' ';
    script.Take_Data(end);
}

void Write_Data_Numbers(const Cell_Node* first, const Script_Number_Form& form, Script_Buffer& script)
{
    for (const Cell_Node* cell = first; cell != nullptr; cell = cell->next)
        Write_Data_Number(cell->value.number, form, script);
}

}  // namespace ingester
