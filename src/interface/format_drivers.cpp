#include "interface/format_drivers.h"

#include "hostfiles/script/script.h"
#include "hostfiles/tbk/tbk.h"
#include "hostfiles/tss/tss.h"
#include "interface/compressed_files.h"
#include "interface/file_detection.h"
#include "spreadsheet/text/text.h"
#include "support/text.h"

#include <algorithm>

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

constexpr Format_Driver Format_Drivers[] = {
    {spreadsheet_file, "Tabulon Spreadsheet", Read_TSS_File, ".tss", Write_TSS_File},
    {2, "Lotus 1-2-3 worksheet"},
    {3, "dBase table", nullptr, ".dbf", nullptr, 511},
    {script_file, "command script", nullptr, ".gen", Write_Host_Script},
    {workbook_file, "Excel workbook", nullptr, ".xls", nullptr, 255},
    {text_file, "comma text", nullptr, ".csv", Write_Text},
    {text_file, "fixed-width text", nullptr, "", Write_Text},
    {7, "Minitab worksheet"},
    {8, "Quattro worksheet", nullptr, ".wq1", nullptr, 255},
    {9, "Paradox table"},
    {10, "SAS Version 6 data set"},
    {13, "S-Plus data object"},
    {14, "S-Plus dump of a data frame", nullptr, ".sdd"},
    {15, "Instat worksheet", nullptr, ".wor", nullptr, 224},
    {16, "binary dictionary with data"},
    {17, "field records"},
    {18, "Gauss data", nullptr, ".fmt"},
    {20, "MATLAB Level 4 matrix", nullptr, ".mat"},
    {21, "Systat"},
    {22, "SPSS system file"},
    {23, "Stata data set"},
    {plain_text_file, "delimited or other plain text", Read_Plain_Text},
    {26, "Shapefile"},
    {27, "MapInfo interchange"},
    {28, "SAS transport", nullptr, ".tpt"},
    {tab_text_file, "text with tabs", nullptr, ".tab", Write_Tabs},
    {30, "RTF table", nullptr, ".rtf"},
    {31, "HTML table", nullptr, ".htm .html"},
    {32, "Windows bitmap", nullptr, ".bmp"},
    {33, "WAVE sound"},
    {35, "Statistica, first generation"},
    {36, "Statistica, second generation"},
    {37, "SAS data set", nullptr, ".ssd .sas7bdat .ssd01"},
    {38, "Minitab portable worksheet"},
    {39, "WEKA ARFF", nullptr, ".arf .arff"},
    {40, "Visualist Tablet", nullptr, ".vtb"},
    {41, "S-Plus dump"},
    {r_data_file, "R data", nullptr, ".rda .rdata"},
    {r_text_file, "R data in text form"},
    {44, "SPSS system file of the early form"},
    {45, "SPSS portable"},
    {46, "data set read through the bridge"},
    {47, "data set read through the bridge"},
    {49, "NMR phase file"},
    {50, "Affymetrix CEL, binary"},
    {51, "Affymetrix CDF, binary"},
    {52, "Affymetrix CHP, binary"},
    {53, "Affymetrix CEL, text"},
    {54, "Affymetrix CDF, text"},
    {55, "GeneChip sequences"},
    {compressed_file, "gzip, of any format here", Read_Compressed_File},
    {book_file, "Tabulon Book", Read_TBK_File, ".tbk", Write_TBK_File, Book_Max_Columns, Read_Page_Names},
    {xml_workbook_file, "Excel 2007 workbook", nullptr, ".xlsx .xlsm"},
    {60, "JPEG image", nullptr, ".jpg"},
    {61, "TIFF image", nullptr, ".tif .tiff"},
    {62, "GIF image", nullptr, ".gif"},
    {63, "PNG image", nullptr, ".png"},
    {64, "PSD image", nullptr, ".psd"},
    {65, "Windows metafile", nullptr, ".emf"},
    {66, "other images"},
    {open_document_file, "OpenDocument spreadsheet", nullptr, ".ods", nullptr, 255},
    {68, "Statistica, third generation"},
    {69, "Affymetrix generic CEL"},
    {70, "Affymetrix generic CHP"},
    {71, "StatGraphics"},
    {72, "Cornell Ecology", nullptr, ".cep"},
    {qtl_locus_file, "QTL locus file"},
    {74, "QTL quantitative data"},
    {75, "CSPro dictionary"},
    {76, "MATLAB file, through the bridge"},
    {77, "EViews workfile, through the bridge"},
    {78, "Stata XML data set, through the bridge"},
    {79, "RATS data, through the bridge"},
    {80, "gretl data, through the bridge"},
    {81, "compressed data, through the bridge"},
    {82, "triple-s survey, through the bridge"},
};

/// Of outputs whose extension says nothing.
constexpr const Format_Driver& Fixed_Width_Text =
    *std::ranges::find_if(Format_Drivers, [](const Format_Driver& driver) {
        return driver.code == text_file && driver.extensions.empty();
    });

static_assert(std::ranges::is_sorted(Format_Drivers, {}, &Format_Driver::code));

}  // namespace

std::span<const Format_Driver> All_Formats()
{
    return Format_Drivers;
}

const Format_Driver& Output_Driver_Of(std::string_view file_name)
{
    for (const Format_Driver& driver : Format_Drivers)
        if (Ends_With_One_Of(file_name, driver.extensions))
            return driver;
    return Fixed_Width_Text;
}

const Format_Driver& Output_Driver_Of(std::int32_t code)
{
    const auto* const found = std::ranges::find(Format_Drivers, code, &Format_Driver::code);
    return found == std::end(Format_Drivers) ? Fixed_Width_Text : *found;
}

std::optional<std::vector<std::string>> List_Sheet_Names(const std::string& file_name)
{
    constexpr std::size_t most_names = 4096;
    const std::int32_t type = Detect_File_Type(file_name);
    if (type == compressed_file && Detect_Compressed_File_Type(file_name) == book_file) {
        const Scratch_File scratch(Decompressed_Name(file_name));
        return Decompress_To(scratch.Name(), file_name.c_str()) ? Read_Page_Names(scratch.Name().c_str())
                                                                : std::nullopt;
    }
    const auto* const found = std::ranges::find(Format_Drivers, type, &Format_Driver::code);
    if (type == unreadable_file)
        return std::nullopt;
    if (found == std::end(Format_Drivers) || found->sheet_names == nullptr)
        return std::vector<std::string>{};
    auto names = found->sheet_names(file_name.c_str());
    if (names)
        names->resize(std::min(names->size(), most_names));
    return names;
}

bool Read_Data_File(const std::string& file_name, std::int32_t type, std::string_view source_name)
{
    request.Content_Code = type;
    request.Current_File_Name = request.Source_Url.empty() ? source_name : request.Source_Url.view();
    const auto* const found = std::ranges::find(Format_Drivers, type, &Format_Driver::code);
    const bool readable = found != std::end(Format_Drivers) && found->read != nullptr;
    return readable && found->read(file_name.c_str());
}

bool Is_Host_File(std::int32_t type)
{
    return type == spreadsheet_file || type == book_file;
}

bool A_Host_File_Was_Read()
{
    return Is_Host_File(request.Content_Code);
}

}  // namespace ingester
