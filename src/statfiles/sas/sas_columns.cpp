#include "statfiles/sas/sas_columns.h"

#include "model/column_names.h"
#include "model/names.h"
#include "model/subset.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"
#include "statfiles/sas/sas_dates.h"
#include "statfiles/sas/sas_format.h"
#include "statfiles/shared/new_sheet.h"

#include <algorithm>

namespace ingester {

namespace {

constexpr std::int32_t Most_Decimals = 20;

bool Is_Held(const Sas_Reading& reading, const Sas_Variable& variable)
{
    const bool text = variable.type == sas_text;
    const std::int32_t least = text ? 1 : Least_Number_Length;
    const std::int32_t most = text ? reading.longest_text : Greatest_Number_Length;
    return variable.length >= least && variable.length <= most && variable.offset >= 0
           && std::int64_t{variable.offset} + variable.length <= reading.row_size;
}

/// Rows whose variables lie over each other would make more of a file than it holds.
bool Rows_Hold_All(const Sas_Reading& reading)
{
    std::int64_t bytes = 0;
    for (const Sas_Variable& variable : reading.variables)
        bytes += variable.length;
    return bytes <= reading.row_size
           && std::ranges::all_of(reading.variables,
                                  [&](const Sas_Variable& variable) { return Is_Held(reading, variable); });
}

void Tell_Long_Texts(bool& told)
{
    if (!told && !For_People(People_Rule::whole_texts))
        Report_Message_Long("Columns containing text longer than %li have been truncated to this length.\n",
                            static_cast<long>(Text_Cell_Width));
    told = true;
}

void Tell_Columns_Beyond(const Sas_Reading& reading, std::int64_t beyond)
{
    Report_Message_Long(reading.columns_beyond, request.Max_Columns);
    Note_Loss(Loss_Kind::beyond_limit, {}, 0, "columns beyond the greatest number", beyond);
    request.losses.Bar_Replacing("columns beyond the greatest number would be lost");
}

bool Make_Column(Sas_Reading& reading, const Sas_Variable& variable, std::int32_t place)
{
    const bool text = variable.type == sas_text;
    Column* const column = New_Column(reading.sheet, text ? text_column : variate_column, {});
    if (column == nullptr)
        return false;
    const bool nameless = variable.name.empty() || variable.name.front() == ' ';
    const std::string name(nameless ? Format_Text("C%li", static_cast<long>(place))
                                    : std::string(reading.crossing.Cross(variable.name)));
    Name_From_Input(*column, name, name);
    reading.crossing.Go_To(column->name);
    if (!variable.label.empty())
        column->extra = reading.crossing.Cross(variable.label);
    if (text)
        return true;
    column->decimals = variable.decimals > 0 ? std::min(variable.decimals, Most_Decimals) : -1;
    if (variable.decimals > 0)
        column->format = fixed_format;
    if (const std::int32_t display = Date_Format_Of_Sas(variable.format); display != 0) {
        column->format = date_format_mark;
        column->date_format = display;
        column->date_form = 1;
    }
    return true;
}

Row_Field Field_Of(Column& column, const Sas_Variable& variable, Fill_Cells fill_numbers)
{
    Row_Field field{.column = &column,
                    .offset = static_cast<std::size_t>(variable.offset),
                    .width = static_cast<std::size_t>(variable.length)};
    field.fill = variable.type == sas_text ? Fill_Texts : fill_numbers;
    field.dated = column.format == date_format_mark;
    if (field.dated)
        field.epoch = Sas_Epoch(column.date_format);
    return field;
}

}  // namespace

bool Make_Sas_Columns(Sas_Reading& reading, Fill_Cells fill_numbers, std::vector<Row_Field>& plan)
{
    bool told = false;
    std::erase_if(reading.variables, [](const Sas_Variable& variable) {
        return variable.type != sas_number && variable.type != sas_text;
    });
    if (const std::int64_t beyond = std::ssize(reading.variables) - request.Max_Columns; beyond > 0) {
        Tell_Columns_Beyond(reading, beyond);
        reading.variables.resize(static_cast<std::size_t>(request.Max_Columns));
    }
    if (!Rows_Hold_All(reading))
        return false;
    reading.sheet = New_Sheet_Of_Reader();
    std::int32_t place = 0;
    for (const Sas_Variable& variable : reading.variables) {
        if (reading.sheet == nullptr || !Make_Column(reading, variable, ++place))
            return false;
        if (variable.type == sas_text && variable.length > static_cast<std::int32_t>(Text_Cell_Width))
            Tell_Long_Texts(told);
    }
    Make_Column_Names_Unique(reading.sheet);
    const std::vector<Column*> columns = Narrow_Columns(*reading.sheet);
    for (std::size_t i = 0; i < columns.size(); ++i)
        if (columns[i] != nullptr)
            plan.push_back(Field_Of(*columns[i], reading.variables[i], fill_numbers));
    return true;
}

}  // namespace ingester
