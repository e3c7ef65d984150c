// The targets of functions that take a text: the build names the one that is tried. The first bytes of
// an input choose how the function is called.
#include "hostfiles/tbk/tbk.h"
#include "interface/detection_tests.h"
#include "interface/process_request.h"
#include "interface/slash_options.h"
#include "interface/var_file.h"
#include "model/date_format.h"
#include "model/date_text.h"
#include "model/sheet.h"
#include "model/text_number.h"
#include "platform/files.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text.h"
#include "support/check_sheet.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>

namespace ingester {

namespace {

constexpr std::size_t Head_Size = 2;

/// The choice that one character of the head makes among `count`; '0' is the first.
std::int32_t Choice(char character, unsigned count)
{
    return static_cast<std::int32_t>((static_cast<unsigned char>(character) + 256U - '0') % count);
}

void Must(bool holds, const char* what)
{
    if (holds)
        return;
    std::fprintf(stderr, "%s\n", what);
    std::abort();
}

/// The head: a display code, and the form.
[[maybe_unused]] void Try_Date(std::string_view head, std::string_view text)
{
    const std::int32_t format = Choice(head[0], Greatest_Date_Format + 2);
    const std::int32_t form = Choice(head[1], 2);
    double strict;
    double loose;
    const bool strictly = Text_To_Date(text, strict, form, format, Missing_Value, true);
    const bool loosely = Text_To_Date(text, loose, form, format, Missing_Value, false);
    Must(strictly || strict == Missing_Value, "no date has a value");
    Must(!strictly || (loosely && loose == strict), "a strict date reads otherwise");
    Must(loose <= Greatest_Number && loose >= Missing_Value, "a date is beyond all numbers");
    const Strict_Readings readings = Read_By_All_Layouts(text);
    const std::size_t layout = Date_Layout_Of(format);
    Must(readings.blank || layout == No_Layout || (readings.good >> layout & 1) == (strictly ? 1 : 0),
         "all layouts at once say otherwise");
    char shown[Number_Text_Room];
    Must(Format_Date_Time(shown, loose, form, format) <= shown + sizeof shown, "a date is too long");
}

/// The head: the mode, and nothing.
[[maybe_unused]] void Try_Number(std::string_view head, std::string_view text)
{
    request.Text_Number_Mode = Choice(head[0], 5);
    bool changed;
    const double number = Text_To_Number(text, Missing_Value, changed);
    Must(number <= Greatest_Number && number >= Missing_Value, "a number is out of range");
    double whole;
    if (!changed)
        Must(Whole_Number_Text(Trim_Copy(text), whole) && whole == number, "a number was changed unseen");
}

/// The head: which of the request's strings it is.
[[maybe_unused]] void Try_Options(std::string_view head, std::string_view text)
{
    request = Request_Globals{};
    const std::span<const Slash_Option> tables[] = {Genotype_Options(), Input_Options(), Output_Options()};
    std::string rest(text);
    static_cast<void>(Take_Reflow_Order(rest));
    Cut_Options(tables[Choice(head[0], 3)], rest);
    Must(rest.size() <= text.size(), "options leave more than there was");
    Must(request.Text_Number_Mode >= 0 && request.Text_Number_Mode <= 4, "no such mode");
    Must(request.Lines_Per_Record >= 1, "a record of no lines");
    Must(request.Merge_Key_Count >= 0 && request.Merge_Key_Count <= 9, "too many keys");
    Close_Message_File();
}

/// The head of the file, behind its name and a line end.
[[maybe_unused]] void Try_Detection(std::string_view, std::string_view text)
{
    const std::size_t line = std::min(text.find('\n'), text.size());
    Detection_Head head{text.substr(0, line)};
    text.remove_prefix(std::min(line + 1, text.size()));
    head.length = text.copy(head.bytes.data(), head.bytes.size());
    const std::int32_t code = Code_Of_Head(head);
    Must(code >= 0 && code <= 82, "no such type of file");
}

/// The head: what names a subset of columns gives, and how names are cleaned. The text is a list of columns
/// for a small table.
[[maybe_unused]] void Try_Lists(std::string_view head, std::string_view text)
{
    constexpr std::string_view table = "a,b,c!,d\n1,x,p,0.5\n2,3,q,*\n*,4,p,1e9\n";
    Start_Request();
    Input_File data(std::as_bytes(std::span(table)), "fuzz.csv");
    if (!Read_CSV(data))
        std::abort();
    const std::int32_t choice = Choice(head[0], 4);
    request.Subset_Columns = choice > 0;
    request.Subset_By_Number = choice > 1;
    request.Subset_Names = {"3", "2", choice == 2 ? "-7" : "b"};
    request.Names_Kept_As_They_Stand = Choice(head[1], 8) == 0;
    Input_File list(std::as_bytes(std::span(text)), "fuzz.VAR");
    Apply_Var_List(*Current_Sheet, list);
    Close_Message_File();
    const std::string faults = Check_Sheet(*Current_Sheet);
    Must(faults.empty(), faults.c_str());
    Free_Sheets();
}

/// A book, to which a sheet is added, or in which one is replaced.
[[maybe_unused]] void Try_Book_Update(std::string_view head, std::string_view text)
{
    const std::string folder = Get_Temp_Folder();
    const std::string name = folder + "update.tbk";
    Output_File book(Output_File::small_buffer);
    Must(book.Open(name), "no file can be made");
    book.Write(text);
    Must(book.Close(), "no file can be written");
    Start_Request();
    Sheet* sheet = New_Sheet_With_Rows(2);
    New_Data_Column(sheet, variate_column, "x", 2);
    const auto before = Read_Page_Names(name.c_str());
    const bool replaces = Choice(head[0], 2) == 1;
    const bool good = replaces ? Replace_Sheet_In_TBK(name.c_str(), sheet, "1")
                               : Add_Sheets_To_TBK(name.c_str(), std::span<Sheet* const>(&sheet, 1));
    const auto after = Read_Page_Names(name.c_str());
    Must(!good || (before && after && after->size() == before->size() + (replaces ? 0 : 1)),
         "an update leaves another number of sheets");
    Must(good || before == after, "a failed update changes a book");
    Close_Message_File();
    Free_Sheets();
}

}  // namespace

}  // namespace ingester

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    using namespace ingester;
    const std::string_view bytes(reinterpret_cast<const char*>(data), size);
    if (size >= Head_Size)
        FUZZ_TRY(bytes.substr(0, Head_Size), bytes.substr(Head_Size));
    return 0;
}
