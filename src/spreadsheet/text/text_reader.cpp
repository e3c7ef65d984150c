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

/// A Sheet whose text turns out to be malformed goes before the text is read again.
bool Fill_Unless_Malformed(Sheet* sheet, Text_Shape& shape, const Text_Scan_Options& options,
                           const Text_Buffer& buffer, File_Image* image)
{
    try {
        return Fill_Text_Sheet(sheet, shape, options, buffer, image);
    } catch (const Text_Malformed&) {
        Free_Sheet(sheet);
        throw;
    }
}

}  // namespace

bool Parse_Text_Buffer(const Text_Buffer& buffer, const Text_Scan_Options& options, File_Image* image)
{
    Text_Shape shape;
    if (!Scan_Text_Dimensions(shape, options, buffer, Sampled_Lines) || shape.columns < 1)
        return false;
    if (Wanted_Types_Need_All_Lines(shape) && !Scan_Text_Dimensions(shape, options, buffer))
        return false;
    Sheet* const earlier = Current_Sheet;
    Sheet* const sheet = Setup_Text_Sheet(shape, variate_column);
    Current_Sheet = earlier;
    if (sheet == nullptr || !Fill_Unless_Malformed(sheet, shape, options, buffer, image))
        return false;
    Make_Factors(*sheet, shape, options);
    Make_Column_Names_Unique(sheet);
    Current_Sheet = sheet;
    return true;
}

namespace {

/// How a host's text is cut: by its name and its characters.
Text_Scan_Options Options_For_Host(const std::string& name, const Text_Buffer& buffer)
{
    bool commas = Ends_Ignoring_Case(name, ".csv");
    bool tabs = Ends_Ignoring_Case(name, ".tab");
    bool blanks = false;
    const bool other = !commas && !tabs;
    if (!request.Custom_Separators.empty())
        commas = true;
    else if (other && !buffer.Holds('\t') && !buffer.Holds(','))
        blanks = true;
    else if (other && buffer.Holds('\t'))
        tabs = true;
    Text_Scan_Options options = Options_Of_Settings();
    options.separators = Separators_Of(buffer, tabs, commas, blanks);
    options.separators_given = !options.separators.empty();
    options.cells_may_shift = !commas && !tabs;
    return options;
}

/// Reads a text and, where it was taken for UTF-8 and is none, reads it again as what it is.
bool Parse_In_Its_Code(const std::string& name, const Text_Scan_Options& options, Text_Code_State& code,
                       Text_Buffer& buffer, File_Image& image, bool rewritten)
{
    const Name_Counters counters = Get_Name_Counters();
    const Loss_Ledger losses = request.losses;
    try {
        return Parse_Text_Buffer(buffer, options, rewritten ? nullptr : &image);
    } catch (const Text_Malformed&) {
        Set_Name_Counters(counters);
        request.losses = losses;
        code.code = code.otherwise;
    }
    return Convert_Malformed(name, code, image, buffer) && Parse_Text_Buffer(buffer, options);
}

}  // namespace

bool Read_CSV(Input_File& file)
{
    const bool sniffed = For_People(People_Rule::sniffed_texts);
    const bool strip_titles = !sniffed && !Ends_With_One_Of(file.Name(), ".csv .tab");
    bool rewritten;
    File_Image image;
    Text_Buffer buffer;
    Text_Code_State code;
    if (!Load_Text_Image(file, strip_titles, image, buffer, code, rewritten) || buffer.Text().empty())
        return false;
    Sheet* const earlier = Current_Sheet;
    bool good = false;
    bool changed = false;
    Text_Dialect dialect;
    try {
        const Text_Scan_Options options = sniffed
                                              ? Options_For_People(file.Name(), buffer, rewritten, dialect)
                                              : Options_For_Host(file.Name(), buffer);
        good = Parse_In_Its_Code(file.Name(), options, code, buffer, image, rewritten);
    } catch (const Text_Changed&) {
        changed = true;
    }
    if (Found_Dialect() != nullptr && sniffed) {
        dialect = *Found_Dialect();
        dialect.code = code.code;
        Set_Found_Dialect(dialect);
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
