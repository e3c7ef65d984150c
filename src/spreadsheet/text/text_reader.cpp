#include "model/factors.h"
#include "model/names.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text.h"
#include "spreadsheet/text/text_format.h"
#include "support/text.h"

namespace ingester {

namespace {

/// Lines whose fields are looked at before the Sheet is made. What comes behind is settled while
/// the cells are filled, so that every number is parsed once.
constexpr std::int64_t Sampled_Lines = 200;

Text_Scan_Options Options_Of_Settings()
{
    Text_Scan_Options options;
    options.trim_cells = Get_Settings().trim_cells != 0;
    if (request.No_Names)
        options.names_mode = names_absent;
    else if (request.Names_Given)
        options.names_mode = names_given;
    return options;
}

std::string_view Separators_Of(const Text_Buffer& buffer, bool tab_file, bool csv_file, bool blank_separated)
{
    if (csv_file)
        return request.Custom_Separators.empty() ? std::string_view(",") : request.Custom_Separators.view();
    if (tab_file)
        return "\t";
    if (blank_separated)
        return " ";
    if (buffer.Holds('\t'))
        return "\t";
    return buffer.Holds(',') || buffer.Holds(';') ? ",;" : "";
}

/// Columns that are marked for it become Factors. One of too many levels stays what it is.
void Make_Factors(Sheet& sheet, const Text_Shape& shape, const Text_Scan_Options& options)
{
    Column* column = sheet.first_column->next;
    for (const Column_Scan& scan : shape.types) {
        if (column == nullptr)
            break;
        if (scan.make_factor && Is_Text_Like(column->type))
            Text_To_Factor(column, false, options.trim_cells, 0);
        else if (scan.make_factor)
            Variate_To_Factor(column, true, 0);
        column = column->next;
    }
}

}  // namespace

bool Parse_Text_Buffer(const Text_Buffer& buffer, bool tab_file, bool csv_file, bool blank_separated,
                       File_Image* image)
{
    Text_Scan_Options options = Options_Of_Settings();
    options.separators = Separators_Of(buffer, tab_file, csv_file, blank_separated);
    options.separators_given = !options.separators.empty();
    options.cells_may_shift = !csv_file && !tab_file;
    Text_Shape shape;
    if (!Scan_Text_Dimensions(shape, options, buffer, Sampled_Lines) || shape.columns < 1)
        return false;
    if (Wanted_Types_Need_All_Lines(shape) && !Scan_Text_Dimensions(shape, options, buffer))
        return false;
    Sheet* const earlier = Current_Sheet;
    Sheet* const sheet = Setup_Text_Sheet(shape, variate_column);
    Current_Sheet = earlier;
    if (sheet == nullptr || !Fill_Text_Sheet(sheet, shape, options, buffer, image))
        return false;
    Make_Factors(*sheet, shape, options);
    Make_Column_Names_Unique(sheet);
    Current_Sheet = sheet;
    return true;
}

bool Read_CSV(Input_File& file)
{
    bool csv_file = Ends_Ignoring_Case(file.Name(), ".csv");
    bool tab_file = Ends_Ignoring_Case(file.Name(), ".tab");
    const bool strip_titles = !csv_file && !tab_file;
    bool blank_separated = false;
    bool rewritten;
    File_Image image;
    Text_Buffer buffer;
    if (!Load_Text_Image(file, strip_titles, image, buffer, rewritten) || buffer.Text().empty())
        return false;
    if (!request.Custom_Separators.empty())
        csv_file = true;
    else if (strip_titles && !buffer.Holds('\t') && !buffer.Holds(','))
        blank_separated = true;
    else if (strip_titles && buffer.Holds('\t'))
        tab_file = true;
    Sheet* const earlier = Current_Sheet;
    bool good = false;
    bool changed = false;
    try {
        good = Parse_Text_Buffer(buffer, tab_file, csv_file, blank_separated, rewritten ? nullptr : &image);
    } catch (const Text_Changed&) {
        changed = true;
    }
    if (!changed && !image.Changed())
        return good;
    Current_Sheet = earlier;
    return Fail_To_Read(file.Name());
}

bool Read_CSV_File(const char* file_name)
{
    Input_File file;
    if (!file.Open(file_name))
        return Fail("CSV data file %.100s not found.\n", file_name);
    return Read_CSV(file);
}

}  // namespace ingester
