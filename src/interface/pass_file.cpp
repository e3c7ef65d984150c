#include "interface/pass_file.h"

#include "interface/paths.h"
#include "interface/people_options.h"
#include "interface/subset_lists.h"
#include "platform/folders.h"
#include "request/messages.h"
#include "request/request.h"

#include <cmath>

namespace ingester {

namespace {

constexpr std::int32_t Fewest_Arguments = 2;
constexpr std::int32_t Most_Arguments = 6;

using Words = Pass_File::Record_Words;

constexpr Words Infile_Words = {"Infile type missing.\n",   "Infile type not text.\n",
                                "Infile length missing.\n", "Infile length invalid.\n",
                                "Infile missing.\n",        Long_Name_Width};
constexpr Words Outfile_Words = {"Outfile type missing.\n",
                                 "Infile type not text.\n",  // hosts know this text for both records
                                 "Outfile length missing.\n", "Outfile length invalid.\n",
                                 "Output file missing.\n",    Long_Name_Width};
constexpr Words Worksheet_Words = {"Worksheet type missing.\n",   "Worksheet type not text.\n",
                                   "Worksheet length missing.\n", "Worksheet length invalid.\n",
                                   "Worksheet missing.\n",        Short_Name_Width};
constexpr Words Cell_Range_Words = {"Cell range type missing.\n",   "Cell range type not text.\n",
                                    "Cell range length missing.\n", "Cell range length invalid.\n",
                                    "Cell range missing.\n",        Short_Name_Width};
constexpr Words Secondary_Words = {"Secondary file type missing.\n",   "Secondary file type not text.\n",
                                   "Secondary file length missing.\n", "Secondary file length invalid.\n",
                                   "Secondary file missing.\n",        Long_Name_Width};
constexpr Words Subset_Words = {"Subset file type missing.\n",   "Subset file type not text.\n",
                                "Subset file length missing.\n", "Subset file length invalid.\n",
                                "Subset file missing.\n",        Long_Name_Width};
constexpr Words Subset_Rows_Words = {
    "Subset rows file type missing.\n",   "Subset rows file type not text.\n",
    "Subset rows file length missing.\n", "Subset rows file length invalid.\n",
    "Subset rows file missing.\n",        Long_Name_Width};

/// Silent by design where there are no words.
bool Fault(const char* words)
{
    return words != nullptr && Fail(words);
}

}  // namespace

bool Pass_File::Read_Count(const Count_Words& words)
{
    double count;
    if (!file_.Read_Little(count))
        return Fault(words.missing);
    const double whole = std::trunc(count);
    if (!(whole >= Fewest_Arguments && whole <= Most_Arguments))
        return Fault(words.wrong);
    count_ = static_cast<std::int32_t>(whole);
    return true;
}

bool Pass_File::Read_Text(const Record_Words& words, std::string& text)
{
    std::int32_t type;
    std::uint32_t length;
    if (!file_.Read_Little(type))
        return Fault(words.type_missing);
    if (type != 0)
        return Fault(words.type_not_text);
    if (!file_.Read_Little(length))
        return Fault(words.length_missing);
    if (length > words.greatest_length)
        return Fault(words.length_invalid);
    text.resize(length);
    if (!file_.Read_Exactly(text.data(), length))
        return Fault(words.missing);
    text.resize(text.find('\0') == std::string::npos ? length : text.find('\0'));
    return true;
}

namespace {

/// A marker in the Secondary file string, and what it asks for.
struct Secondary_Marker {
    std::string_view text;
    void (*ask)();
};

constexpr Secondary_Marker Secondary_Markers[] = {
    {"/a", [] { request.Add_Mode = Add_Modes::append; }},
    {"/c", [] { request.Add_Mode = Add_Modes::concatenate; }},
    {"/m", [] { request.Add_Mode = Add_Modes::merge; }},
    {"/r", [] { request.Subset_Rows = true; }},
    {"/s", [] { request.Subset_Columns = true; }},
};

void Cut_Secondary_Markers(std::string& text)
{
    for (const Secondary_Marker& marker : Secondary_Markers) {
        const std::size_t at = text.find(marker.text);
        if (at == std::string::npos)
            continue;
        text.erase(at, marker.text.size());
        marker.ask();
    }
}

/// Cuts the markers out of the secondary file's name and fetches what it points at.
bool Take_Secondary_File(std::string text, Pass_Request& asked)
{
    if (text.empty())
        return true;
    Cut_Secondary_Markers(text);
    const std::string temp = Get_Temp_Folder();
    Expand_Path_Tokens(text, temp);
    std::string source_url;
    bool downloaded = false;
    if (!Fetch_Url(text, "SEC", source_url, temp, downloaded)) {
        asked.secondary_failed = true;
        return Fail("Could not download secondary file URL:\n%.500s\n", text.c_str());
    }
    request.Secondary_File = text;
    if (downloaded)
        asked.secondary_scratch = std::move(text);
    return true;
}

/// The list of columns: the secondary file, or the next record where that has other work to do.
bool Take_Column_Subset(Pass_File& pass)
{
    if (!request.Subset_Columns)
        return true;
    std::string list;
    if (request.Add_Mode == Add_Modes::none)
        list = request.Secondary_File.view();
    else if (pass.Count() > 5 && !pass.Read_Text(Subset_Words, list))
        return false;
    Expand_Path_Tokens(list, Get_Temp_Folder());
    request.Subset_Columns = File_Exists(list);
    return !request.Subset_Columns || Read_Column_Subset(list);
}

bool Take_Row_Subset(Pass_File& pass, bool columns_asked)
{
    if (!request.Subset_Rows)
        return true;
    std::string list;
    const std::int32_t count = pass.Count();
    if (request.Add_Mode == Add_Modes::none && !columns_asked)
        list = request.Secondary_File.view();
    else if ((count >= 6 || (count == 5 && !columns_asked)) && !pass.Read_Text(Subset_Rows_Words, list))
        return false;
    request.Subset_Rows = File_Exists(list);
    return !request.Subset_Rows || Read_Row_Subset(list);
}

template <class Text>
bool Take_Text(Pass_File& pass, std::int32_t from_count, const Words& words, Text& target)
{
    std::string text;
    if (pass.Count() < from_count)
        return true;
    if (!pass.Read_Text(words, text))
        return false;
    target = text;
    return true;
}

}  // namespace

bool Read_Pass_File(Input_File& file, Pass_Request& asked)
{
    Pass_File pass(file);
    std::string secondary;
    if (!pass.Read_Count({}) || !pass.Read_Text(Infile_Words, asked.infile)
        || !pass.Read_Text(Outfile_Words, asked.outfile))
        return false;
    Take_People_Options(asked.infile, asked.outfile);  // the lists that follow are read by them
    if (!Take_Text(pass, 3, Worksheet_Words, request.Worksheet_Name)
        || !Take_Text(pass, 4, Cell_Range_Words, request.Cell_Range)
        || !Take_Text(pass, 5, Secondary_Words, secondary) || !Take_Secondary_File(secondary, asked))
        return false;
    const bool columns_asked = request.Subset_Columns;
    return Take_Column_Subset(pass) && Take_Row_Subset(pass, columns_asked);
}

namespace {

/// Head of a carrier file, little-endian, as far as it is looked at.
struct Carrier_Head_Layout {
    static constexpr std::size_t size = 64;
    static constexpr Little_Field<std::int32_t> first_mark{0};    // 1
    static constexpr Little_Field<std::int32_t> second_mark{24};  // 1
    static constexpr Little_Field<std::int32_t> count_a{28};      // count_a + count_b isn't 0
    static constexpr Little_Field<std::int32_t> count_b{32};
    static constexpr Little_Field<std::int32_t> zero{36};        // 0
    static constexpr Little_Field<std::int32_t> third_mark{40};  // 1
    static constexpr Little_Field<std::int32_t> kind{44};        // 2
    static constexpr Little_Field<double> request_id{56};
};
static_assert(Carrier_Head_Layout::request_id.End() <= Carrier_Head_Layout::size);

}  // namespace

std::int64_t Read_Carrier_Id(std::string_view name)
{
    using Head = Carrier_Head_Layout;
    std::byte head[Head::size];
    Input_File file;
    if (name.empty() || !file.Open(name) || !file.Read_Exactly(head, sizeof head))
        return 0;  // silent by design: without an id the names have a form of their own
    const auto count_a = static_cast<std::uint32_t>(Head::count_a.Get(head));
    const auto count_b = static_cast<std::uint32_t>(Head::count_b.Get(head));
    if (Head::first_mark.Get(head) != 1 || Head::second_mark.Get(head) != 1 || count_a + count_b == 0
        || Head::zero.Get(head) != 0 || Head::third_mark.Get(head) != 1 || Head::kind.Get(head) != 2)
        return 0;
    const double id = Head::request_id.Get(head);
    return id > 0.0 && id <= 2147483647.0 ? static_cast<std::int64_t>(id) : 0;
}

void Write_Result_File(std::string_view name, std::int32_t status)
{
    Output_File file(Output_File::small_buffer);
    if (!file.Open(name))
        return;  // silent by design: the host sees that there is no result
    file.Write_Little(status);
    file.Write_Little(std::int32_t{0});
    if (!file.Close())
        Delete_File(name);  // half an answer is none
}

}  // namespace ingester
