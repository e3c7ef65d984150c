// Fields as people mean them: words for missing values, dates, numbers that are names.
#include "model/cell_text.h"
#include "model/column_names.h"
#include "model/date_format.h"
#include "model/names.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/dialect/sample_rows.h"
#include "spreadsheet/text/text_filler.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <vector>

namespace ingester {

/// Names that stand in several lines are joined.
void Sheet_Filler::Fill_Names_In_Lines()
{
    std::vector<std::string> names;
    for (std::int32_t line = 0; line < dialect_->names_lines && walker_.At_Row(); ++line) {
        std::size_t index = dialect_->rows_are_named ? 1 : 0;
        do {
            const Field_Content content = walker_.Content(walker_.Next());
            const std::string_view name = Trim_Copy(Said_By(content));
            bare_texts_ = bare_texts_ || (content.quote == '\0' && !name.empty());
            if (index >= columns_.size()) {
                if (!name.empty())
                    Refuse_Extra_Columns();
                walker_.Skip_Line();
                break;
            }
            names.resize(std::max(names.size(), index + 1));
            std::string& joined = names[index++];
            if (!joined.empty() && !name.empty())
                joined += ' ';
            joined += name;
        } while (walker_.Has_More());
    }
    for (std::size_t index = 0; index < names.size(); ++index)
        if (!names[index].empty())
            Name_Column(index, names[index]);
}

/// A missing word counts among numbers and dates; one that was told counts everywhere.
bool Sheet_Filler::Says_Nothing(std::string_view text) const
{
    if (text.empty() || Is_Missing_Text(text))
        return true;
    return request.Missing_Words.empty()
               ? Is_Missing_Word(text)
               : std::ranges::find(request.Missing_Words, text) != request.Missing_Words.end();
}

/// A field among numbers that is not simply one.
void Sheet_Filler::Fill_For_People(const Text_Field& field, Column_Filling& state)
{
    const Field_Content content = walker_.Content(field);
    const std::string_view text = Trim_Copy(content.text);
    Cell_Node& cell = state.cells.Last();
    Field_Number number;
    if (Says_Nothing(text)) {
        ++state.gaps;
    } else if (Read_Number(text, marks_, number)) {
        cell.value.number = number.value;
        state.quoted += content.quote != '\0' ? 1 : 0;
        if (number.clipped)
            Note_Field(Loss_Kind::number_clipped, *state.column, field);
        Watch_Spelling(text, state);
    } else if (const Iso_Moment moment = Read_Iso_Moment(text); moment.sense != Field_Sense::text
                                                                && state.filling == Filling::numbers_so_far
                                                                && state.gaps == row_) {
        state.quoted += content.quote != '\0' ? 1 : 0;
        Begin_Moments(state, moment);
    } else {
        if (state.filling == Filling::numbers_so_far)
            Turn_To_Text(state);
        Fill_Text(field, *state.column, cell);
        if (state.filling == Filling::numbers)
            Note_Field(Loss_Kind::text_not_number, *state.column, field);
    }
}

namespace {

/// The display code of moments.
std::int32_t Display_Of(Field_Sense sense, bool fractions)
{
    switch (sense) {
    case Field_Sense::time:
        return time_format;
    case Field_Sense::date_time:
        return fractions ? date_time_format : full_date_time_format;
    default:
        return dashed_year_month_day_format;
    }
}

}  // namespace

/// The first field that says anything is a date or time.
void Sheet_Filler::Begin_Moments(Column_Filling& state, const Iso_Moment& moment)
{
    state.filling = Filling::moments;
    state.sense = moment.sense;
    Take_Moment(state, moment);
}

void Sheet_Filler::Take_Moment(Column_Filling& state, const Iso_Moment& moment)
{
    state.cells.Last().value.number = moment.value;
    state.fractions += moment.fraction ? 1 : 0;
    if (moment.finer)
        Note_Loss(Loss_Kind::date_part_dropped, state.column->name, row_ + 1,
                  "less than a thousandth of a second");
}

void Sheet_Filler::Fill_Moment(const Text_Field& field, Column_Filling& state)
{
    state.cells.Append(missing_);
    const Field_Content content = walker_.Content(field);
    const std::string_view text = Trim_Copy(content.text);
    if (Says_Nothing(text)) {
        ++state.gaps;
        return;
    }
    const Iso_Moment moment = Read_Iso_Moment(text);
    state.quoted += content.quote != '\0' ? 1 : 0;
    if (moment.sense == state.sense)
        return Take_Moment(state, moment);
    Turn_To_Text(state);
    Fill_Text(field, *state.column, state.cells.Last());
}

namespace {

/// How many fields a line has by another separator.
std::int32_t Count_Fields(std::string_view line, const Text_Dialect& dialect)
{
    const Sample_Rows cut({{line}, true}, dialect);
    return cut.Rows().empty() ? 0 : cut.Rows().front().count;
}

/// Puts one separator in the place of another, but in quotes.
void Exchange(char* first, const char* last, char from, const Text_Dialect& dialect)
{
    bool quoted = false;
    for (char* at = first; at != last; ++at) {
        quoted = quoted != (dialect.quote != '\0' && *at == dialect.quote);
        if (!quoted && *at == from)
            *at = dialect.separator;
    }
}

}  // namespace

/// A line that is one field by the text's separator, and has the right number of them by another, is taken by
/// that one. In narrow tables, and by blanks, too many texts would be cut that only hold such a sign.
bool Sheet_Filler::Rewrite_Line(const Text_Field& field)
{
    constexpr std::size_t fewest_columns = 3;
    if (dialect_ == nullptr || columns_.size() < fewest_columns || dialect_->runs || field.first == field.last
        || !request.Told_Separators.empty() || !request.Custom_Separators.empty())
        return false;
    const std::string_view line(field.first, static_cast<std::size_t>(field.last - field.first));
    if (line.size() > Greatest_Line || line.find_first_of("\r\n") != std::string_view::npos)
        return false;
    const auto named =
        std::ranges::find_if(columns_.rbegin(), columns_.rend(),
                             [](const Column_Filling& state) { return !state.column->input_name.empty(); });
    const auto wanted = static_cast<std::int32_t>(columns_.rend() - named);
    const std::int32_t right_counts[] = {static_cast<std::int32_t>(columns_.size()),
                                         std::max(wanted, static_cast<std::int32_t>(fewest_columns))};
    for (const char separator : {',', ';', '\t', '|'}) {
        Text_Dialect other = *dialect_;
        other.separator = separator;
        if (line.find(separator) == std::string_view::npos
            || std::ranges::count(right_counts, Count_Fields(line, other)) == 0)
            continue;
        Note_Loss(Loss_Kind::input_unread, {}, row_ + 1, "separators of a line that no other line has");
        char* const first = buffer_.first + (field.first - buffer_.first);
        Exchange(first, first + line.size(), separator, *dialect_);
        edited_ = true;
        walker_.Go_To(field.first);
        return true;
    }
    return false;
}

/// Behind an empty line another table may begin. A text with many such lines is one table.
bool Sheet_Filler::Ends_Table()
{
    constexpr int most_looks = 64;
    if (looks_at_tables_ == most_looks)
        return false;
    ++looks_at_tables_;
    const std::string_view rest(walker_.Place(), static_cast<std::size_t>(buffer_.last - walker_.Place()));
    if (!Begins_Other_Table(rest, *dialect_))
        return false;
    Text_Dialect found = *dialect_;
    const std::string_view before(buffer_.first, static_cast<std::size_t>(walker_.Place() - buffer_.first));
    found.next_table = buffer_.lines_before + std::ranges::count(before, '\n') + 1;
    Set_Found_Dialect(found);
    request.losses.Note_Unread(Format_Text("another table from its line %lld on; --table %d reads it",
                                           static_cast<long long>(found.next_table), found.table + 1));
    return true;
}

/// Digits and dates that all stand in quotes, where other fields don't, are texts.
void Sheet_Filler::Settle_Quoted_Columns()
{
    const auto bare_data = [this](const Column_Filling& state) {
        return state.filling < Filling::texts && state.quoted + state.gaps < row_;
    };
    if (!bare_texts_ && std::ranges::none_of(columns_, bare_data))
        return;
    for (Column_Filling& state : columns_)
        if ((state.filling == Filling::numbers_so_far || state.filling == Filling::moments)
            && state.quoted > 0 && !bare_data(state))
            Turn_To_Text(state);
}

void Sheet_Filler::Settle_Moments()
{
    for (const Column_Filling& state : columns_) {
        if (state.filling != Filling::moments)
            continue;
        state.column->format = date_format_mark;
        state.column->date_format = Display_Of(state.sense, state.fractions > 0);
        state.column->date_form = 1;
    }
}

/// Numbers that print otherwise than they were spelled are looked at once more.
void Sheet_Filler::Settle_Spellings()
{
    for (Column_Filling& state : columns_) {
        if (state.filling > Filling::numbers || state.gaps == row_)
            continue;
        if (state.spelling.fewest < Spelling_Watch{}.fewest)
            Keep_Decimals(*state.column, state.spelling.fewest);
        if (!state.spelling.All_Are_Usual()) {
            if (state.column->spellings != nullptr)
                state.column->spellings->kept.clear();
            state.rows_to_redo = row_;
        }
    }
}

namespace {

/// How many decimals a number has that is spelled plainly, as "-12.50"; below 0 for any other.
std::int32_t Plain_Decimals(std::string_view text)
{
    if (text.starts_with('-'))
        text.remove_prefix(1);
    const std::size_t point = text.find('.');
    if (text.find_first_not_of("0123456789.") != std::string_view::npos || point == 0
        || point + 1 == text.size())
        return -1;
    return point == std::string_view::npos ? 0 : static_cast<std::int32_t>(text.size() - point - 1);
}

/// Without the zeros behind a point.
std::string_view Without_Zeros(std::string_view text, std::int32_t decimals)
{
    if (decimals <= 0)
        return text;
    while (text.back() == '0')
        text.remove_suffix(1);
    if (text.back() == '.')
        text.remove_suffix(1);
    return text;
}

}  // namespace

/// The first time that a number is read, zeros are left to the watch; the second time they are known.
void Sheet_Filler::Watch_Spelling(std::string_view text, Column_Filling& state)
{
    constexpr std::size_t surely_exact = 15;
    const std::string_view plain = Plain_Number(text, marks_, undoubled_);
    const std::int32_t decimals = Plain_Decimals(plain);
    char room[Number_Text_Room];
    const Cell_Node& cell = state.cells.Last();
    const std::string_view printed(room, Print_Shortest(room, cell.value.number));
    if (decimals >= 0)
        state.spelling.Take(decimals, plain.back());
    if (printed == Without_Zeros(plain, decimals))
        return;
    const bool sampled = plain.size() > surely_exact || plain.find_first_of("eE") != std::string_view::npos;
    state.spelling.strange = state.spelling.strange || sampled;
    Keep_Spelling(*state.column, cell, plain);
}

void Sheet_Filler::Redo_Spelling(const Text_Field& field, Column_Filling& state)
{
    const Cell_Node& cell = *state.cell_to_redo;
    if (!Is_Present(sheet_, cell.value.number))
        return;
    const std::string_view text = Trim_Copy(walker_.Content(field).text);
    const std::string_view plain = Plain_Number(text, marks_, undoubled_);
    char room[Number_Text_Room];
    if (std::string_view(room, Print_Usually(room, *state.column, cell.value.number)) != plain)
        Keep_Spelling(*state.column, cell, plain);
}

/// For people a table of no rows is one.
bool Sheet_Filler::Names_Alone() const
{
    return dialect_ != nullptr && shape_.has_names;
}

/// Separators at the ends of lines make no column.
void Sheet_Filler::Leave_Out_Last_Columns()
{
    for (std::size_t index = columns_.size(); index-- > 1;) {
        const Column_Filling& state = columns_[index];
        if (state.filling == Filling::left_out)
            continue;
        if (state.gaps < sheet_.row_count || !state.column->input_name.empty())
            break;
        Leave_Out(index);
    }
}

}  // namespace ingester
