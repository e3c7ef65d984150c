#include "model/text_columns.h"

#include "model/calendar.h"
#include "model/cell_text.h"
#include "model/date_format.h"
#include "model/date_text.h"
#include "model/factors.h"
#include "model/text_number.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/people_rules.h"
#include "request/request.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <string>
#include <vector>

namespace ingester {

namespace {

/// The cells of a text-like column are numbers now: the texts go.
void Become_Variate(Column& column)
{
    Set_Column_Type(column, variate_column);
    column.format = significant_digits_format;
    column.decimals = -1;
    column.nlevels = 0;
    column.text_cell_width = Text_Cell_Width;
    column.texts = Text_Arena{};
    Mark_Column_Changed(&column, true);
}

/// The words in front of the first warning of their kind.
void Begin_Warnings(bool& begun, std::string_view title)
{
    if (!begun)
        Report_Message(title);
    begun = true;
}

void Warn_Of_Number(const Column& column, long row, std::string_view text, double number)
{
    if (!Is_Present(*column.sheet, number))
        Note_Loss(Loss_Kind::text_not_number, column.name, row, text);
    Begin_Warnings(request.Number_Warnings_Begun, "Text to Number Conversion Warnings\n \n");
    const std::string words(text);
    if (Is_Present(*column.sheet, number))
        Warn("Column %s Row %4li: %s read as %.12g\n", column.name.c_str(), row, words.c_str(), number);
    else
        Warn("Column %s Row %4li: %s read as *\n", column.name.c_str(), row, words.c_str());
}

}  // namespace

bool Text_Column_To_Number(Column* column)
{
    if (column == nullptr || !Is_Text_Like(column->type))
        return false;
    const double missing = column->sheet->missing_value;
    long row = 0;
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next) {
        const std::string_view text = cell->Text();
        ++row;
        double number = missing;
        bool changed = false;
        if (!text.empty() && !Is_Missing_Text(text))
            number = Text_To_Number(text, missing, changed);
        if (changed)
            Warn_Of_Number(*column, row, text, number);
        cell->value.number = number;
    }
    Become_Variate(*column);
    return true;
}

namespace {

/// How the cells of a column read.
struct Date_Counts {
    std::array<std::int64_t, No_Layout + 1> hits{};  ///< by layout; blank cells have any
    std::int64_t cells = 0;
    std::int64_t blanks = 0;
    std::uint64_t early = 0;  ///< layouts by which there were dates in front of 1900
    bool colon = false;

    [[nodiscard]] std::int64_t Hits(std::int32_t format) const { return hits[Date_Layout_Of(format)]; }
};

/// The cells as they were read while counting, as long as all have the first layout of the first of them.
/// In most columns that is all cells, and none has to be read again.
class Remembered_Dates {
public:
    explicit Remembered_Dates(const Column& column)
        : missing_(column.sheet->missing_value), length_(static_cast<std::size_t>(column.length))
    {
        values_.reserve(length_);
    }

    void Take(const Strict_Readings& readings)
    {
        if (!whole_)
            return;
        const std::uint64_t first = readings.good & (~readings.good + 1);
        if (!readings.blank && layout_ == 0)
            layout_ = first;
        whole_ = readings.blank || (first == layout_ && first != 0);
        values_.push_back(readings.blank ? missing_ : readings.value);
    }

    /// All values, if each is what its cell is in the layout of `format`; else null.
    [[nodiscard]] const double* Values_By(std::int32_t format) const
    {
        return whole_ && values_.size() == length_ && (layout_ >> Date_Layout_Of(format) & 1) != 0
                   ? values_.data()
                   : nullptr;
    }

private:
    double missing_;
    std::size_t length_;
    std::uint64_t layout_ = 0;
    bool whole_ = true;
    std::vector<double> values_;
};

constexpr std::int64_t Sample_Size = 100;

/// Blank cells say nothing and widen a sample.
Date_Counts Count_Readings(const Column& column, bool sample, Remembered_Dates* remembered)
{
    Date_Counts counts;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        if (sample && counts.cells - counts.blanks == Sample_Size)
            break;
        const Strict_Readings readings = Read_By_All_Layouts(cell->Text());
        ++counts.cells;
        counts.blanks += readings.blank ? 1 : 0;
        counts.early |= readings.early;
        counts.colon = counts.colon || readings.colon;
        for (std::uint64_t good = readings.good; good != 0; good &= good - 1)
            ++counts.hits[static_cast<std::size_t>(std::countr_zero(good))];
        if (remembered != nullptr)
            remembered->Take(readings);
    }
    for (std::int64_t& hits : counts.hits)
        hits += counts.blanks;
    return counts;
}

bool Is_Passed_Over(std::int32_t format, const Date_Format_Search& search)
{
    if (search.sample)
        return format == short_year_format || format == year_format;
    return search.time_mode && format < time_format;
}

/// The code with most hits. The order in which codes are tried decides among equals.
std::int32_t Best_Format(const Date_Counts& counts, const Date_Format_Search& search)
{
    const std::int32_t last = search.time_mode ? seconds_format : marked_time_format;
    std::int32_t best = 0;
    std::int64_t most = -1;
    for (std::int32_t format = 1; format <= last; ++format) {
        if (Is_Passed_Over(format, search))
            continue;
        const std::int64_t hits = counts.Hits(format);
        // The crossed markers of one code would mislead where a plain one takes every cell as well.
        const bool misleads = format == marked_date_time_format && hits == counts.cells;
        const bool shows_time =
            counts.colon && format >= date_time_format && best < date_time_format && !misleads;
        if (hits > most || (hits == most && (format == search.wanted || shows_time)))
            best = format;
        most = std::max(most, hits);
        // Where a time was seen, a code that drops it may not end the search.
        if (format >= search.wanted && hits == counts.cells && (!counts.colon || format >= date_time_format))
            break;
    }
    return best;
}

/// Whether so many texts of a sample are dates that the others are put up with.
bool Is_Dated_Sample(std::int64_t hits, std::int64_t texts, bool has_default)
{
    return hits > 0 && (hits == texts || has_default || (texts >= Sample_Size && 100 * hits > 95 * texts));
}

/// What the counts say to a search, without the sign.
std::int32_t Found_Format(const Date_Counts& counts, const Date_Format_Search& search)
{
    const std::int32_t best = Best_Format(counts, search);
    const std::int64_t hits = counts.Hits(best);
    if (!search.sample)
        return hits > 2 || hits == counts.cells ? best : search.wanted;
    return Is_Dated_Sample(hits - counts.blanks, counts.cells - counts.blanks, search.has_default) ? best : 0;
}

}  // namespace

std::int32_t Find_Date_Format(const Column* column, const Date_Format_Search& search)
{
    if (column == nullptr || !Is_Text_Like(column->type))
        return 0;
    const Date_Counts counts = Count_Readings(*column, search.sample, nullptr);
    const std::int32_t format = Found_Format(counts, search);
    const bool negative = column->date_form == 0 && (counts.early >> Date_Layout_Of(format) & 1) != 0;
    return negative ? -format : format;
}

namespace {

/// What a text that isn't in its column's layout is tried as, in this order.
constexpr std::int32_t Other_Date_Formats[] = {35, 33, 10, 16, 8,  12, 14, 26, 34,
                                               2,  4,  6,  27, 24, 22, 20, 19, 18};
constexpr std::int32_t Other_Time_Formats[] = {36, 37, 38, 39};

bool Read_By_Other_Formats(std::string_view text, std::int32_t format, double missing, double& value)
{
    const auto read_strictly = [&](std::int32_t other) {
        return Text_To_Date(text, value, 1, other, missing, true);
    };
    if (format >= time_format && format <= seconds_format)
        return std::ranges::any_of(Other_Time_Formats, read_strictly);
    return std::ranges::any_of(Other_Date_Formats, read_strictly);
}

/// The whole of a text counts for people, before only its start does.
bool Read_Date_Cell(const Column& column, long row, std::string_view text, std::int32_t format, double& value)
{
    const double missing = column.sheet->missing_value;
    const bool whole_first = For_People(People_Rule::further_dates);
    if (whole_first
        && (Text_To_Date(text, value, 1, format, missing, true)
            || Read_By_Other_Formats(text, format, missing, value)))
        return true;
    if (Text_To_Date(text, value, 1, format, missing, false)) {
        double number;
        if (whole_first && !Whole_Number_Text(Trim_Copy(text), number))
            Note_Loss(Loss_Kind::date_part_dropped, column.name, row, text);
        return true;
    }
    return !whole_first && Read_By_Other_Formats(text, format, missing, value);
}

void Warn_Of_Date(const Column& column, long row, std::string_view text)
{
    Note_Loss(Loss_Kind::text_not_number, column.name, row, text);
    Begin_Warnings(request.Date_Warnings_Begun, "Text to Date Conversion Warnings\n \n");
    Warn("Column %s Row %4li: %s read as *\n", column.name.c_str(), row, std::string(text).c_str());
}

void Read_Date_Cells(Column& column, std::int32_t format)
{
    long row = 0;
    for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        const std::string_view text = cell->Text();
        ++row;
        double value;
        if (!Read_Date_Cell(column, row, text, format, value))
            Warn_Of_Date(column, row, text);
        cell->value.number = value;
    }
}

/// Whether a time of day would not be seen if only dates were shown.
bool Has_Times(const Column& column)
{
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        if (Is_Present(*column.sheet, cell->value.number)
            && cell->value.number != std::floor(cell->value.number))
            return true;
    return false;
}

/// Years of four digits, for people, where the year came first; dashes stay dashes.
std::int32_t Year_First_Format(const Column& column)
{
    const Cell_Node* cell = column.first_cell;
    while (cell != nullptr && cell->Text().find_first_of("0123456789") == std::string_view::npos)
        cell = cell->next;
    const bool dashed = cell != nullptr && cell->Text().find('-') != std::string_view::npos;
    return dashed ? dashed_year_month_day_format : year_month_day_format;
}

std::int32_t Wanted_Format(const Column& column, const Date_Counts& counts)
{
    const std::int32_t format = Found_Format(counts, {.wanted = 1, .has_default = true});
    const bool in_full = format == short_year_month_day_format && For_People(People_Rule::further_dates);
    return in_full ? Year_First_Format(column) : format;
}

/// The code by which a column that is marked for times is read. For people it may hold dates with them.
std::int32_t Wanted_Time_Format(const Column& column, const Date_Counts& counts)
{
    const std::int32_t times =
        Found_Format(counts, {.wanted = time_format, .has_default = true, .time_mode = true});
    const bool dated = For_People(People_Rule::further_dates)
                       && counts.Hits(Best_Format(counts, {.wanted = 1})) > counts.Hits(times);
    return dated ? Wanted_Format(column, counts) : times;
}

}  // namespace

void Unpack_Dates(Column* column)
{
    if (column == nullptr || column->type != variate_column || !For_People(People_Rule::further_dates))
        return;
    const double last_day = Max_Date(1);
    for (const Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
        if (cell->value.number > last_day) {
            static_cast<void>(Variate_To_Text(column));
            return;
        }
}

bool Text_Column_To_Date(Column* column, bool time_mode)
{
    if (column == nullptr || !Is_Text_Like(column->type))
        return false;
    Remembered_Dates remembered(*column);
    const Date_Counts counts = Count_Readings(*column, false, &remembered);
    const std::int32_t format =
        time_mode ? Wanted_Time_Format(*column, counts) : Wanted_Format(*column, counts);
    if (const double* value = remembered.Values_By(format); value != nullptr)
        for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
            cell->value.number = *value++;
    else
        Read_Date_Cells(*column, format);
    Become_Variate(*column);
    column->format = date_format_mark;
    column->date_format = format < date_time_format && Has_Times(*column) ? full_date_time_format : format;
    column->date_form = 1;
    return true;
}

}  // namespace ingester
