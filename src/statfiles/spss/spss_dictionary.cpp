#include "statfiles/spss/spss_dictionary.h"

#include "model/column_names.h"
#include "model/date_format.h"
#include "model/factor_lists.h"
#include "model/names.h"
#include "model/subset.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"
#include "statfiles/shared/new_sheet.h"

#include <algorithm>

namespace ingester {

namespace {

/// The day count of 14 October 1582, from which seconds are counted.
constexpr double Spss_Day_Zero = -6347;

struct Spss_Date_Format {
    std::int32_t code;
    std::int32_t display;  ///< a `Date_Format`
    bool is_duration = false;
};

constexpr Spss_Date_Format Date_Formats[] = {
    {20, day_month_short_year_format},  // DATE
    {21, time_format, true},            // TIME
    {22, date_time_format},             // DATETIME
    {23, month_day_year_format},        // ADATE
    {24, marked_date_time_format},      // JDATE
    {25, date_time_format, true},       // DTIME
    {38, day_month_year_format},        // EDATE
    {39, year_month_day_format},        // SDATE
};

/// For people durations aren't shifted, and are shown in hours of all their days.
bool Is_Plain_Duration(const Spss_Date_Format& date)
{
    return date.is_duration && For_People(People_Rule::calendar_dates);
}

const Spss_Date_Format* Find_Date_Format(std::int32_t code)
{
    const auto* const found = std::ranges::find(Date_Formats, code, &Spss_Date_Format::code);
    return found == std::end(Date_Formats) ? nullptr : found;
}

void Show_As_Date(Column& column, const Spss_Date_Format& date)
{
    column.format = date_format_mark;
    column.date_form = 1;
    column.date_format = Is_Plain_Duration(date) ? total_hours_format : date.display;
}

/// How many of the variables become Columns.
std::size_t Limited_Variables(const Spss_Dictionary& dictionary)
{
    const auto limit = static_cast<std::size_t>(request.Max_Columns);
    const std::size_t count = dictionary.variables.size();
    if (count <= limit)
        return count;
    Report_Message_Long("Warning Columns above %li NOT transfered.\n", request.Max_Columns);
    Note_Loss(Loss_Kind::beyond_limit, {}, 0, "columns beyond the greatest number",
              static_cast<std::int64_t>(count - limit));
    request.losses.Bar_Replacing("columns beyond the greatest number would be lost");
    return limit;
}

constexpr std::int32_t Beside_Name = 2;
constexpr std::int32_t Most_Decimals = 16;
constexpr std::int32_t Greatest_Width = 90;

bool Make_Column(Spss_Reading& reading, const Spss_Variable& variable)
{
    Column* const column = New_Column(reading.sheet, variable.Is_Text() ? text_column : variate_column, {});
    if (column == nullptr)
        return false;
    const std::string name(reading.crossing.Cross(variable.Full_Name()));
    Name_From_Input(*column, name, name);
    reading.crossing.Go_To(column->name);
    if (!variable.label.empty())
        column->extra = reading.crossing.Cross(variable.label);
    column->width = static_cast<std::int32_t>(Letter_Count(column->name)) + Beside_Name;
    column->decimals = 0;
    if (reading.formats_are_kept) {
        column->decimals = std::min(variable.format.decimals, Most_Decimals);
        column->width = std::max(column->width, std::min(variable.format.width, Greatest_Width));
    }
    if (const Spss_Date_Format* const date = Find_Date_Format(variable.format.code);
        date != nullptr && !variable.Is_Text())
        Show_As_Date(*column, *date);
    return true;
}

}  // namespace

std::string Name_Key(std::string_view name)
{
    std::string key(Without_Blanks(name, false));
    std::ranges::transform(key, key.begin(), To_Upper);
    return key;
}

bool Epoch_Of_Format(const Spss_Format& format, Epoch& epoch)
{
    const Spss_Date_Format* const date = Find_Date_Format(format.code);
    if (date == nullptr)
        return false;
    epoch = {Is_Plain_Duration(*date) ? 0.0 : Spss_Day_Zero, Seconds_Per_Day};
    return true;
}

bool Texts_Are_Whole()
{
    return For_People(People_Rule::whole_texts);
}

bool Make_Spss_Columns(Spss_Reading& reading)
{
    const std::vector<Spss_Variable>& variables = reading.dictionary.variables;
    const std::size_t count = Limited_Variables(reading.dictionary);
    reading.sheet = New_Sheet_Of_Reader();
    for (std::size_t i = 0; i < count; ++i)
        if (reading.sheet == nullptr || !Make_Column(reading, variables[i]))
            return false;
    Make_Column_Names_Unique(reading.sheet);
    reading.columns = Narrow_Columns(*reading.sheet);
    reading.columns.resize(variables.size());
    return true;
}

namespace {

/// Texts that mean missing, as cells would hold them.
std::vector<std::string> Missing_Texts_Of(Spss_Reading& reading, const Spss_Variable& variable)
{
    std::vector<std::string> texts;
    for (const std::string_view text : variable.missing_texts)
        texts.emplace_back(reading.crossing.Cross(Without_Blanks(text, Get_Settings().trim_cells != 0)));
    return texts;
}

}  // namespace

std::vector<Row_Field> Plan_Of_Cases(Spss_Reading& reading, Fill_Cells fill_numbers)
{
    const bool user_missing = Get_Settings().ignore_value_case == 0;
    std::vector<Row_Field> plan;
    for (std::size_t i = 0; i < reading.columns.size(); ++i) {
        const Spss_Variable& variable = reading.dictionary.variables[i];
        if (reading.columns[i] == nullptr)
            continue;
        Row_Field field{.column = reading.columns[i], .offset = variable.offset};
        if (variable.Is_Text()) {
            field.width = static_cast<std::size_t>(variable.text_width);
            field.fill = variable.in_pieces ? Fill_Texts_In_Pieces : Fill_Texts;
            if (user_missing && Texts_Are_Whole())
                field.missing_texts = Missing_Texts_Of(reading, variable);
        } else {
            field.fill = fill_numbers;
            field.dated = Epoch_Of_Format(variable.format, field.epoch);
            if (user_missing)
                field.missing = variable.missing;
        }
        plan.push_back(std::move(field));
    }
    return plan;
}

Row_Texts Texts_Of_Cases(Spss_Reading& reading)
{
    return {.trim_front = Get_Settings().trim_cells != 0,
            .whole = Texts_Are_Whole(),
            .crossing = &reading.crossing};
}

void Label_Spss_Columns(Spss_Reading& reading)
{
    Label_Terms terms{.trim_front = Get_Settings().trim_cells != 0,
                      .by_case_free = reading.labels_by_case_free && Get_Settings().ignore_value_case != 0,
                      .add_unused = request.Add_Unused_Labels,
                      .crossing = &reading.crossing};
    if (Texts_Are_Whole())
        terms.width = Long_Label_Width;
    for (std::size_t i = 0; i < reading.columns.size(); ++i) {
        const Spss_Variable& variable = reading.dictionary.variables[i];
        if (reading.columns[i] == nullptr || variable.label_set < 0)
            continue;
        terms.dated = !variable.Is_Text() && Epoch_Of_Format(variable.format, terms.epoch);
        Apply_Value_Labels(*reading.columns[i],
                           reading.dictionary.label_sets[static_cast<std::size_t>(variable.label_set)],
                           terms);
    }
}

}  // namespace ingester
