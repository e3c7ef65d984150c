#include "model/sheet.h"

#include "model/list.h"
#include "model/names.h"
#include "platform/folders.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <memory>
#include <utility>
#include <vector>

namespace ingester {

Sheet* Current_Sheet = nullptr;

namespace {

/// Every Sheet of the request.
std::vector<std::unique_ptr<Sheet>> sheets;

/// Row numbers get wider columns as they grow: below 1001, below 10001, and from then on.
std::int32_t Row_Number_Width(std::int32_t rows)
{
    return rows < 1001 ? 4 : rows < 10001 ? 5 : 6;
}

}  // namespace

Sheet::~Sheet()
{
    for (Column* column = first_column; column != nullptr;)
        delete std::exchange(column, column->next);
}

void Init_Library()
{
    request.settings = Settings{};
    Use_Utf8_Text(For_People(People_Rule::utf8_text));
    Reset_Name_Counters();
}

void Free_Sheets()
{
    sheets.clear();
    Current_Sheet = nullptr;
}

void Free_Sheet(Sheet* sheet)
{
    if (Current_Sheet == sheet)
        Current_Sheet = nullptr;
    std::erase_if(sheets, [&](const std::unique_ptr<Sheet>& each) { return each.get() == sheet; });
}

Settings Copy_Settings()
{
    return Get_Settings();
}

Sheet* New_Sheet()
{
    sheets.push_back(std::make_unique<Sheet>());
    Sheet* const sheet = sheets.back().get();
    sheet->settings = Copy_Settings();
    New_Column(sheet, row_column, "Row");
    Current_Sheet = sheet;
    return sheet;
}

Sheet* New_Sheet_With_Rows(std::int32_t rows)
{
    Sheet* const earlier = Current_Sheet;
    Sheet* const sheet = New_Sheet();
    sheet->row_count = std::max(rows, 0);
    if (rows >= 1 && !Setup_Rows(sheet)) {
        sheets.pop_back();
        Current_Sheet = earlier;
        return nullptr;
    }
    return sheet;
}

bool Setup_Rows(Sheet* sheet)
{
    if (sheet == nullptr || sheet->row_count < 1)
        return false;
    const std::int32_t rows = sheet->row_count;
    Column& numbers = *sheet->first_column;
    Free_Cell_Nodes(&numbers, row_column);
    sheet->row_blocks.clear();
    sheet->cursor_row_index = -1;
    sheet->rows_due = true;
    if (Alloc_Row_Nodes(rows, sheet->first_row, sheet->last_row, sheet->row_blocks) == 0
        || Alloc_Cell_Nodes(row_column, rows, numbers.first_cell, numbers.last_cell, numbers.blocks) == 0)
        return false;
    sheet->rows_due = false;
    numbers.length = rows;
    numbers.width = Row_Number_Width(rows);
    double number = 0.0;
    for (Cell_Node* cell = numbers.first_cell; cell != nullptr; cell = cell->next)
        cell->value.number = ++number;
    return true;
}

void Expect_Rows(Sheet* sheet, std::int32_t rows)
{
    if (sheet == nullptr)
        return;
    sheet->row_count = std::max(rows, 0);
    sheet->rows_due = rows > 0;
}

bool Need_Rows(Sheet* sheet)
{
    return sheet != nullptr && (!sheet->rows_due || Setup_Rows(sheet));
}

Column* Column_At(Sheet* sheet, std::int32_t index)
{
    if (sheet == nullptr)
        return nullptr;
    return Walk_To(sheet->first_column, sheet->last_column, sheet->cursor_column, sheet->cursor_column_index,
                   sheet->column_count + 1, index);
}

Row_Node* Row_At(Sheet* sheet, std::int32_t index)
{
    if (!Need_Rows(sheet))
        return nullptr;
    return Walk_To(sheet->first_row, sheet->last_row, sheet->cursor_row, sheet->cursor_row_index,
                   sheet->row_count, index);
}

Cell_Node* Cell_At(Column* column, std::int32_t index)
{
    if (column == nullptr || (column->type == row_column && !Need_Rows(column->sheet)))
        return nullptr;
    return Walk_To(column->first_cell, column->last_cell, column->cursor_node, column->cursor_index,
                   column->length, index);
}

void Add_Sheet_Comment(Sheet* sheet, std::string_view text)
{
    if (sheet == nullptr)
        return;
    while (!text.empty()) {
        const std::size_t end = text.find('\n');
        const std::string_view line = text.substr(0, end);
        for (const char c : line)
            if (static_cast<unsigned char>(c) >= 32 && c != 127)
                sheet->title_lines += c;
        sheet->title_lines += '\0';
        ++sheet->title_line_count;
        if (end == std::string_view::npos)
            break;
        text.remove_prefix(end + 1);
    }
    sheet->title_bytes = static_cast<std::int32_t>(sheet->title_lines.size());
}

void Clear_Title(Sheet* sheet)
{
    if (sheet == nullptr)
        return;
    sheet->title_lines.clear();
    sheet->title_line_count = 0;
    sheet->title_bytes = 0;
}

void Stamp_Title(Sheet* target, const Sheet* source, const char* text)
{
    if (target == nullptr)
        return;
    Clear_Title(target);
    if (text != nullptr) {
        const Local_Time now = Local_Time_Now();
        const auto month = static_cast<std::size_t>(now.month);  // the list begins with a mark
        Add_Sheet_Comment(target,
                          Format_Text("%s on: %li-%s-%li %li:%02li:%02li", text, static_cast<long>(now.day),
                                      Get_Settings().month_names[month].c_str(), static_cast<long>(now.year),
                                      static_cast<long>(now.hour), static_cast<long>(now.minute),
                                      static_cast<long>(now.second)));
    }
    if (source == nullptr)
        return;
    target->title_lines += source->title_lines;
    target->title_line_count += source->title_line_count;
    target->title_bytes = static_cast<std::int32_t>(target->title_lines.size());
}

}  // namespace ingester
