#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "model/names.h"
#include "spreadsheet/text/text.h"
#include "spreadsheet/text/text_format.h"
#include "support/text.h"

#include <cstring>

namespace ingester {

namespace {

/// Lines whose fields are looked at before the Sheet is made. What comes behind is settled while
/// the cells are filled, so that every number is parsed once.
constexpr std::int64_t Sampled_Lines = 200;

Text_Scan_Options Options_Of_Settings()
{
    const Settings& settings = Get_Settings();
    Text_Scan_Options options;
    options.auto_factors = settings.auto_factors != 0;
    options.trim_cells = settings.trim_cells != 0;
    options.delete_empty_rows = settings.delete_empty_rows != 0;
    if (request.No_Names)
        options.names_mode = names_absent;
    else if (request.Names_Given)
        options.names_mode = names_given;
    return options;
}

bool Holds(std::string_view text, char c)
{
    return std::memchr(text.data(), c, text.size()) != nullptr;
}

std::string_view Separators_Of(std::string_view text, bool tab_file, bool csv_file, bool blank_separated)
{
    if (csv_file)
        return request.Custom_Separators.empty() ? std::string_view(",") : request.Custom_Separators.view();
    if (tab_file)
        return "\t";
    if (blank_separated)
        return " ";
    if (Holds(text, '\t'))
        return "\t";
    return Holds(text, ',') || Holds(text, ';') ? ",;" : "";
}

/// One trailing mark of a name has done its work when the types are set.
void Cut_Type_Marks(Sheet& sheet)
{
    for (Column* column = sheet.first_column->next; column != nullptr; column = column->next) {
        const std::string_view name = column->name;
        if (name.empty())
            column->name = Default_Column_Name(0);
        else if (name.find_last_of("!#$") == name.size() - 1)
            column->name = std::string(name.substr(0, name.size() - 1));
    }
}

}  // namespace

bool Parse_Text_Buffer(std::string_view text, bool tab_file, bool csv_file, bool blank_separated)
{
    Text_Scan_Options options = Options_Of_Settings();
    options.separators = Separators_Of(text, tab_file, csv_file, blank_separated);
    options.separators_given = !options.separators.empty();
    Text_Shape shape;
    Scan_Text_Dimensions(shape, options, text, Sampled_Lines);
    if (shape.columns < 1 || shape.rows - (shape.has_names ? 1 : 0) < 1
        || !Text_Fits_In_Memory(shape, text.size()))
        return false;
    Sheet* const sheet = Setup_Text_Sheet(shape, variate_column);
    if (sheet == nullptr || !Fill_Text_Sheet(sheet, shape, options, text, tab_file))
        return false;
    Cut_Type_Marks(*sheet);
    Make_Column_Names_Unique(sheet);
    return true;
}

bool Read_CSV(Input_File& file)
{
    bool csv_file = Ends_Ignoring_Case(file.Name(), ".csv");
    bool tab_file = Ends_Ignoring_Case(file.Name(), ".tab");
    const bool strip_titles = !csv_file && !tab_file;
    bool blank_separated = false;
    Text_Image image;
    if (!Load_Text_Image(file, strip_titles, image) || image.length == 0)
        return false;
    if (!request.Custom_Separators.empty())
        csv_file = true;
    else if (strip_titles && !Holds(image.Text(), '\t') && !Holds(image.Text(), ','))
        blank_separated = true;
    else if (Holds(image.Text(), '\t'))
        tab_file = true;
    return Parse_Text_Buffer(image.Text(), tab_file, csv_file, blank_separated);
}

bool Read_CSV_File(const char* file_name)
{
    Input_File file;
    if (!file.Open(file_name))
        return Fail("CSV data file %.100s not found.\n", file_name);
    return Read_CSV(file);
}

}  // namespace ingester
