#include "interface/format_drivers.h"

#include "hostfiles/script/script.h"
#include "interface/file_detection.h"
#include "interface/request/request.h"
#include "spreadsheet/text/text.h"
#include "support/text.h"

namespace ingester {

namespace {

/// A text is a table, unless a number of lines to skip asks for one of its lines.
bool Read_Plain_Text(const char* file_name)
{
    return request.Fixed_Lines > 0 ? Read_Text_Lines(file_name) : Read_CSV_File(file_name);
}

bool Write_Text(Sheet* sheet, const char* file_name)
{
    return Write_Text_File(sheet, file_name, false);
}

bool Write_Tabs(Sheet* sheet, const char* file_name)
{
    return Write_Text_File(sheet, file_name, true);
}

constexpr Input_Driver Input_Drivers[] = {
    {plain_text_file, "delimited or other plain text", Read_Plain_Text},
};

constexpr std::int32_t Columns = Default_Max_Columns;

constexpr Output_Driver Output_Drivers[] = {
    {".xlsx", 59, "Excel 2007 workbook", nullptr, Columns},
    {".xlsm", 59, "Excel 2007 workbook", nullptr, Columns},
    {".gen", script_file, "command script", Write_Host_Script, Columns},
    {".tss", spreadsheet_file, "Tabulon Spreadsheet", nullptr, Columns},
    {".tbk", book_file, "Tabulon Book", nullptr, 10000000},
    {".fmt", 18, "Gauss data", nullptr, Columns},
    {".xls", 5, "Excel workbook", nullptr, 255},
    {".wor", 15, "Instat worksheet", nullptr, 224},
    {".dbf", 3, "dBase table", nullptr, 511},
    {".wq1", 8, "Quattro worksheet", nullptr, 255},
    {".sdd", 14, "S-Plus dump", nullptr, Columns},
    {".mat", 20, "MATLAB Level 4 matrix", nullptr, Columns},
    {".tab", tab_text_file, "text with tabs", Write_Tabs, Columns},
    {".tpt", 28, "SAS transport", nullptr, Columns},
    {".rtf", 30, "RTF table", nullptr, Columns},
    {".htm", 31, "HTML table", nullptr, Columns},
    {".html", 31, "HTML table", nullptr, Columns},
    {".arf", 39, "WEKA ARFF", nullptr, Columns},
    {".arff", 39, "WEKA ARFF", nullptr, Columns},
    {".vtb", 40, "Visualist Tablet", nullptr, Columns},
    {".rda", 42, "R data", nullptr, Columns},
    {".rdata", 42, "R data", nullptr, Columns},
    {".csv", text_file, "comma text", Write_Text, Columns},
    {".bmp", 32, "Windows bitmap", nullptr, Columns},
    {".jpg", 60, "image", nullptr, Columns},
    {".tif", 61, "image", nullptr, Columns},
    {".tiff", 61, "image", nullptr, Columns},
    {".gif", 62, "image", nullptr, Columns},
    {".png", 63, "image", nullptr, Columns},
    {".psd", 64, "image", nullptr, Columns},
    {".emf", 65, "image", nullptr, Columns},
    {".ods", 67, "OpenDocument spreadsheet", nullptr, 255},
    {".cep", 72, "Cornell Ecology", nullptr, Columns},
    {".ssd", 37, "SAS data set", nullptr, Columns},
    {".sas7bdat", 37, "SAS data set", nullptr, Columns},
    {".ssd01", 37, "SAS data set", nullptr, Columns},
};

constexpr Output_Driver Fixed_Width_Text = {"", text_file, "fixed-width text", Write_Text, Columns};

}  // namespace

Reader Reader_Of(std::int32_t code)
{
    for (const Input_Driver& driver : Input_Drivers)
        if (driver.code == code)
            return driver.read;
    return nullptr;
}

const Output_Driver& Output_Driver_Of(std::string_view file_name)
{
    for (const Output_Driver& driver : Output_Drivers)
        if (Ends_Ignoring_Case(file_name, driver.extension))
            return driver;
    return Fixed_Width_Text;
}

}  // namespace ingester
