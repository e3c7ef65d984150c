// The rows of text tables, spreadsheets and pages.
#pragma once

#include "interface/file_detection.h"
#include "interface/formats/format_driver.h"
#include "spreadsheet/text/text.h"

namespace ingester {

/// A text is a table, unless a number of lines to skip asks for one of its lines.
inline bool Read_Plain_Text(const char* file_name)
{
    return request.Fixed_Lines > 0 ? Read_Text_Lines(file_name) : Read_CSV_File(file_name);
}

template <bool tabs> bool Write_Text(Sheet* sheet, const char* file_name)
{
    return Write_Text_File(sheet, file_name, tabs);
}

constexpr Format_Driver Spreadsheet_Formats[] = {
    {.code = 2, .name = "Lotus 1-2-3 worksheet", .names = Held_Names::free},
    {.code = workbook_file,
     .name = "Excel workbook",
     .lists_sheets = true,
     .extensions = ".xls",
     .names = Held_Names::free,
     .max_columns = 255},
    {.code = text_file,
     .name = "comma text",
     .extensions = ".csv",
     .clipboard_extensions = ".csv",
     .write = Write_Text<false>,
     .names = Held_Names::free_for_people},
    {.code = text_file,
     .name = "fixed-width text",
     .clipboard_extensions = ".txt",
     .write = Write_Text<false>},
    {.code = 8,
     .name = "Quattro worksheet",
     .lists_sheets = true,
     .extensions = ".wq1",
     .names = Held_Names::free,
     .max_columns = 255},
    {.code = plain_text_file,
     .name = "delimited or other plain text",
     .read = Any_Code<Read_Plain_Text>,
     .options = "/lt= /csv /n /y /s /e /z= range encoding"},
    {.code = tab_text_file,
     .name = "text with tabs",
     .extensions = ".tab",
     .people_extensions = ".tsv",
     .clipboard_extensions = ".tab",
     .write = Write_Text<true>,
     .names = Held_Names::free_for_people},
    {.code = 30, .name = "RTF table", .extensions = ".rtf", .names = Held_Names::free},
    {.code = 31, .name = "HTML table", .extensions = ".htm .html", .names = Held_Names::free},
    {.code = xml_workbook_file,
     .name = "Excel 2007 workbook",
     .lists_sheets = true,
     .extensions = ".xlsx .xlsm",
     .names = Held_Names::free},
    {.code = open_document_file,
     .name = "OpenDocument spreadsheet",
     .lists_sheets = true,
     .extensions = ".ods",
     .names = Held_Names::free,
     .max_columns = 255},
};

}  // namespace ingester
