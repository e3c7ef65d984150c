#include "command/look.h"

#include "command/column_facts.h"
#include "command/shown_table.h"
#include "model/column_printer.h"
#include "platform/terminal.h"
#include "platform/text_codes.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <cstdio>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

namespace {

bool Print_Text(std::string_view text)
{
    return std::fwrite(text.data(), 1, text.size(), stdout) == text.size() && std::fflush(stdout) == 0;
}

std::vector<Column_Facts> Facts_Of_Columns(const Sheet& sheet)
{
    std::vector<Column_Facts> facts;
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        facts.push_back(Facts_Of(*column));
    return facts;
}

// --- info --------------------------------------------------------------------------------------

std::string Range_Words(const Column_Facts& facts)
{
    if (facts.low.empty())
        return {};
    return facts.low == facts.high ? facts.low : facts.low + " to " + facts.high;
}

std::string Level_Words(const Column_Facts& facts)
{
    constexpr std::size_t most = 8;
    std::string words = Format_Text("%zu levels", facts.levels.size());
    for (std::size_t i = 0; i < std::min(most, facts.levels.size()); ++i) {
        const Level_Facts& level = facts.levels[i];
        words.append(i == 0 ? ": " : ", ")
            .append(level.value.empty() ? "" : level.value + "=")
            .append(level.label);
    }
    return facts.levels.size() > most ? words + ", ..." : words;
}

std::string Value_Words(const Column_Facts& facts)
{
    if (facts.type == "factor")
        return Level_Words(facts);
    return facts.type == "text" ? Format_Text("up to %zu letters", facts.longest) : Range_Words(facts);
}

/// What is told of the file as a whole, a line each.
std::string Head_Lines(const Viewed_Sheet& viewed, const std::string& file)
{
    std::string lines = file + ": " + std::string(viewed.format.name);
    lines += viewed.packed ? ", packed as gzip\n" : "\n";
    for (const auto& [name, value] : request.input_facts)
        lines.append(name).append(": ").append(In_Utf8(value)).append("\n");
    if (!viewed.all_sheets.empty()) {
        lines += "sheets: ";
        for (const std::string& name : viewed.all_sheets)
            lines.append(&name == &viewed.all_sheets.front() ? "" : ", ").append(In_Utf8(name));
        lines += '\n';
    }
    if (!viewed.sheet.sheet_name.empty())
        lines += "this sheet: " + In_Utf8(viewed.sheet.sheet_name) + "\n";
    return lines
           + Format_Text("rows: %d\ncolumns: %d\n\n", viewed.sheet.row_count, viewed.sheet.column_count);
}

std::vector<Shown_Column> Facts_Table(const std::vector<Column_Facts>& all)
{
    std::vector<Shown_Column> table = {{"#", true}, {"NAME"}, {"TYPE"}, {"MISSING", true}, {"VALUES"}};
    const bool described =
        std::ranges::any_of(all, [](const Column_Facts& facts) { return !facts.description.empty(); });
    if (described)
        table.push_back({"DESCRIPTION"});
    std::size_t number = 0;
    for (const Column_Facts& facts : all) {
        const std::string texts[] = {std::to_string(++number), facts.name,
                                     std::string(facts.type),  std::to_string(facts.missing),
                                     Value_Words(facts),       facts.description};
        for (std::size_t i = 0; i < table.size(); ++i)
            table[i].cells.push_back(texts[i]);
    }
    return table;
}

/// Cut to a terminal; a pipe gets all of it.
bool Print_Info(const Viewed_Sheet& viewed, const std::string& file)
{
    std::size_t shown;
    const auto table = Facts_Table(Facts_Of_Columns(viewed.sheet));
    return Print_Text(Head_Lines(viewed, file) + Aligned_Lines(table, Terminal_Width(), shown));
}

using Json = nlohmann::ordered_json;

/// Numbers are such, dates are texts.
Json Json_Value(const Column_Facts& facts, const std::string& text)
{
    return facts.numeric ? Json::parse(text) : Json(text);
}

Json Json_Of(const Column_Facts& facts)
{
    Json column = {{"name", facts.name}, {"type", facts.type}, {"missing", facts.missing}};
    if (!facts.low.empty()) {
        column["min"] = Json_Value(facts, facts.low);
        column["max"] = Json_Value(facts, facts.high);
    }
    if (facts.type == "text")
        column["longest"] = facts.longest;
    for (const Level_Facts& level : facts.levels) {
        Json told = {{"label", level.label}, {"count", level.count}};
        if (!level.value.empty())
            told["value"] = Json::parse(level.value);
        column["levels"].push_back(told);
    }
    if (!facts.description.empty())
        column["description"] = facts.description;
    return column;
}

/// Words of a name are joined in a key.
std::string Json_Key(std::string name)
{
    std::ranges::replace(name, ' ', '_');
    return name;
}

Json Json_Fact(const std::string& value)
{
    const bool number = !value.empty() && value.find_first_not_of("0123456789") == std::string::npos;
    return number ? Json::parse(value) : Json(In_Utf8(value));
}

bool Print_Info_As_Json(const Viewed_Sheet& viewed, const std::string& file)
{
    Json info = {{"file", file}, {"format", viewed.format.name}, {"packed", viewed.packed}};
    for (const auto& [name, value] : request.input_facts)
        info[Json_Key(name)] = Json_Fact(value);
    if (!viewed.all_sheets.empty())
        for (const std::string& name : viewed.all_sheets)
            info["sheets"].push_back(In_Utf8(name));
    if (!viewed.sheet.sheet_name.empty())
        info["sheet"] = In_Utf8(viewed.sheet.sheet_name);
    info["rows"] = viewed.sheet.row_count;
    info["columns"] = Json::array();
    for (const Column_Facts& facts : Facts_Of_Columns(viewed.sheet))
        info["columns"].push_back(Json_Of(facts));
    return Print_Text(info.dump(2, ' ', false, Json::error_handler_t::replace) + "\n");
}

// --- head --------------------------------------------------------------------------------------

Shown_Column First_Cells(const Column& column, std::int32_t rows)
{
    const Column_Printer printer(
        column,
        {.numbers = Number_Print::for_others, .level_values = Number_Print::for_others, .margins = true});
    Shown_Column shown = {In_Utf8(column.name), printer.Kind_Of_Cells() == Column_Printer::Kind::number};
    char room[Number_Text_Room];
    const Cell_Node* cell = column.first_cell;
    for (std::int32_t row = 0; row < rows; ++row) {
        const bool there = cell != nullptr && row >= First_Row_Of(column);
        shown.cells.push_back(there ? In_Utf8(printer.Print(*cell, room, {.number = "", .label = ""}))
                                    : std::string());
        cell = there ? cell->next : cell;
    }
    return shown;
}

std::string Count_Of_More(std::size_t count, const char* what)
{
    return Format_Text("%zu more %s%s", count, what, count == 1 ? "" : "s");
}

/// What a terminal has no room for.
std::string Rest_Words(const Sheet& sheet, std::int32_t rows, const std::vector<Shown_Column>& columns,
                       std::size_t shown)
{
    std::string words;
    if (sheet.row_count > rows)
        words += Count_Of_More(static_cast<std::size_t>(sheet.row_count - rows), "row");
    if (shown < columns.size())
        words.append(words.empty() ? "" : ", ")
            .append(Count_Of_More(columns.size() - shown, "column"))
            .append(": ");
    for (std::size_t i = shown; i < columns.size(); ++i)
        words.append(i == shown ? "" : ", ").append(columns[i].title);
    return words;
}

bool Print_Head(const Sheet& sheet, std::int32_t wanted)
{
    const std::int32_t rows = std::min(sheet.row_count, wanted);
    std::vector<Shown_Column> columns;
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        columns.push_back(First_Cells(*column, rows));
    const std::size_t width = Terminal_Width();
    if (width == 0)
        return Print_Text(Tabbed_Lines(columns));
    std::size_t shown;
    const std::string lines = Aligned_Lines(columns, width, shown);
    const std::vector<Shown_Column> rest = {{Rest_Words(sheet, rows, columns, shown)}};
    return Print_Text(rest.front().title.empty() ? lines : lines + Aligned_Lines(rest, width, shown));
}

}  // namespace

Sheet_Viewer Viewer_Of(const Command_Options& options)
{
    const std::string file = options.input == Standard_Stream ? "standard input" : options.input;
    switch (options.task) {
    case Task::info:
        return [file, json = options.json](const Viewed_Sheet& viewed) {
            return json ? Print_Info_As_Json(viewed, file) : Print_Info(viewed, file);
        };
    case Task::head:
        return [rows = options.rows](const Viewed_Sheet& viewed) { return Print_Head(viewed.sheet, rows); };
    default:
        return {};
    }
}

}  // namespace ingester
