// Data sets of Version 6: variables, then rows; of the later releases in pages.
#include "platform/field_source.h"
#include "request/messages.h"
#include "request/request.h"
#include "statfiles/sas/sas.h"
#include "statfiles/sas/sas_columns.h"
#include "statfiles/sas/sas_format.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <map>
#include <span>

namespace ingester {

namespace {

struct Short_Head_Layout {
    static constexpr std::size_t size = 216;
    static constexpr Little_Field<std::int16_t> row_size{122}, variables{124};
    static constexpr Little_Field<std::int32_t> rows{126};
};

struct Short_Variable_Layout {
    static constexpr std::size_t size = 106;
    static constexpr Little_Field<std::int16_t> type{0}, length{4};
    static constexpr std::size_t name = 8, name_size = 8;
    static constexpr std::size_t label = 16, label_size = 40;
};

struct Paged_Head_Layout {
    static constexpr std::size_t size = 256;
    static constexpr Little_Field<std::int32_t> page_size{92};
};

struct Page_Layout {
    static constexpr std::size_t size = 16;
    static constexpr Little_Field<std::int16_t> subheaders{8}, kind{10};
};

struct Pointer_Layout {
    static constexpr std::size_t size = 12;
    static constexpr Little_Field<std::int32_t> offset{0}, length{4}, kind{8};
    static constexpr std::int32_t length_end = 512;
};

struct First_Subheader_Layout {
    static constexpr std::size_t size = 28;
    static constexpr Little_Field<std::int32_t> variables{8}, row_size{20}, rows{24};
};

struct Name_Subheader_Layout {
    static constexpr std::size_t size = 72;
    static constexpr std::size_t name = 4, name_size = 8;
    static constexpr Little_Field<std::int16_t> type{12}, length{68}, number{70};
    static constexpr Little_Field<std::int32_t> offset{64};
};

enum Page_Kind : std::int16_t { metadata_page = 256, mixed_page = 512 };

constexpr std::size_t Version_Place = 8;
constexpr std::string_view Short_Versions[] = {"6.03", "6.04"};
constexpr std::string_view Paged_Versions[] = {"6.07", "6.08", "6.09", "6.10", "6.11", "6.12"};

struct Data_Set_Reading {
    Input_File& file;
    Sas_Reading sas = {};
    std::int64_t rows = 0;
    std::size_t page_size = 0;
    std::int32_t variable_count = 0;
    std::map<std::int32_t, Sas_Variable> by_number = {};
};

using Bytes = std::span<const std::byte>;

std::string Text_At(Bytes bytes, std::size_t place, std::size_t length)
{
    return std::string(Without_Blanks({reinterpret_cast<const char*>(bytes.data()) + place, length}, false));
}

/// Numbers without their last bytes.
struct Stored_Short_Double {
    static double Decode(const std::byte* stored, std::size_t width)
    {
        std::array<std::byte, sizeof(double)> bytes{};
        std::memcpy(bytes.data() + bytes.size() - width, stored, width);
        return Number_At<double>(bytes.data());
    }
};

/// Makes the Sheet and what fills it.
bool Begin_Rows(Data_Set_Reading& reading, std::vector<Row_Field>& plan)
{
    Sas_Reading& sas = reading.sas;
    sas.columns_beyond = "Warning Columns above %li NOT transfered.\n";
    sas.longest_text = Longest_Sas_Text;
    if (reading.rows < 1 || sas.row_size < 1 || sas.variables.empty())
        return false;
    if ((Letters_Are_Utf8() || Declared_Code() != nullptr)
        && !sas.crossing.Open_Input(Code_Of_Input(Windows_1252_Code(), {})))
        return false;
    return Make_Sas_Columns(sas, Fill_Numbers<Stored_Short_Double>, plan);
}

Row_Filler Filler_Of(Data_Set_Reading& reading, std::vector<Row_Field> plan)
{
    Sas_Reading& sas = reading.sas;
    const Row_Texts texts{
        .trim_front = true, .whole = For_People(People_Rule::whole_texts), .crossing = &sas.crossing};
    return {*sas.sheet, static_cast<std::size_t>(sas.row_size), std::move(plan), texts, reading.file.Size()};
}

// --- The short layout ----------------------------------------------------------------------------------

bool Read_Short_Variable(Data_Set_Reading& reading)
{
    using Layout = Short_Variable_Layout;
    std::array<std::byte, Layout::size> record;
    if (!reading.file.Read_Exactly(record.data(), record.size()))
        return false;
    std::vector<Sas_Variable>& variables = reading.sas.variables;
    Sas_Variable variable;
    variable.type = Layout::type.Get(record);
    variable.length = Layout::length.Get(record);
    variable.name = Text_At(record, Layout::name, Layout::name_size);
    variable.label = Trim_Copy(Text_At(record, Layout::label, Layout::label_size));
    if (!variables.empty())
        variable.offset = variables.back().offset + variables.back().length;
    variables.push_back(std::move(variable));
    return true;
}

bool Read_Short(Data_Set_Reading& reading)
{
    using Layout = Short_Head_Layout;
    std::array<std::byte, Layout::size> head;
    std::vector<Row_Field> plan;
    if (!reading.file.Seek(0) || !reading.file.Read_Exactly(head.data(), head.size()))
        return false;
    reading.sas.row_size = Layout::row_size.Get(head);
    reading.rows = Layout::rows.Get(head);
    for (std::int16_t i = 0; i < Layout::variables.Get(head); ++i)
        if (!Read_Short_Variable(reading))
            return false;
    if (!Begin_Rows(reading, plan))
        return false;
    Row_Filler filler = Filler_Of(reading, std::move(plan));
    filler.infinity_is_missing = false;
    filler.Expect(
        std::min(reading.rows, (reading.file.Size() - reading.file.Position()) / reading.sas.row_size));
    return Fill_From_File(filler, reading.file, reading.file.Size(), reading.rows) && filler.Finish();
}

// --- Pages -------------------------------------------------------------------------------------------

bool Take_First_Subheader(Data_Set_Reading& reading, Bytes subheader)
{
    using Layout = First_Subheader_Layout;
    const std::string_view text(reinterpret_cast<const char*>(subheader.data()), subheader.size());
    if (subheader.size() < Layout::size || text.find("CMP") != std::string_view::npos)
        return false;
    reading.variable_count = Layout::variables.Get(subheader);
    reading.sas.row_size = Layout::row_size.Get(subheader);
    reading.rows = Layout::rows.Get(subheader);
    return true;
}

/// What stands behind the mark is a name where it is made as names are.
std::string Name_Of(Bytes subheader)
{
    using Layout = Name_Subheader_Layout;
    const std::string name = Text_At(subheader, Layout::name, Layout::name_size);
    const bool is_name = !name.empty() && !Is_Digit(name.front()) && std::ranges::all_of(name, [](char c) {
        return Is_Letter(c) || Is_Digit(c) || c == '_';
    });
    return is_name ? name : std::string();
}

void Take_Variable(Data_Set_Reading& reading, Bytes subheader)
{
    using Layout = Name_Subheader_Layout;
    if (subheader.size() < Layout::size || std::memcmp(subheader.data(), "NAME", 4) != 0)
        return;
    Sas_Variable variable;
    variable.type = Layout::type.Get(subheader);
    variable.length = Layout::length.Get(subheader);
    variable.offset = Layout::offset.Get(subheader);
    variable.name = Name_Of(subheader);
    reading.by_number.insert_or_assign(Layout::number.Get(subheader), std::move(variable));
}

/// One page: its subheaders, and where its rows lie.
struct Page {
    Bytes bytes = {};
    std::size_t rows_begin = 0;
    std::size_t rows_end = 0;
};

bool Has_Subheaders(std::int16_t kind)
{
    return kind == metadata_page || kind == mixed_page;
}

/// Reads the pointers of a page and what they lead to.
bool Read_Subheaders(Data_Set_Reading& reading, Page& page, bool& first)
{
    const std::int32_t count = Page_Layout::subheaders.Get(page.bytes);
    const std::size_t end =
        Page_Layout::size + Pointer_Layout::size * static_cast<std::size_t>(std::max(count, 0));
    if (count < 0 || end > page.bytes.size())
        return false;
    page.rows_begin = end;
    for (std::size_t at = Page_Layout::size; at < end; at += Pointer_Layout::size) {
        const Bytes pointer = page.bytes.subspan(at, Pointer_Layout::size);
        const std::int32_t offset = Pointer_Layout::offset.Get(pointer);
        const std::int32_t length = Pointer_Layout::length.Get(pointer);
        if (length < 0 || length >= Pointer_Layout::length_end || offset < 0
            || std::int64_t{offset} + length > std::ssize(page.bytes))
            return false;
        if (length == 0)
            continue;
        const Bytes subheader =
            page.bytes.subspan(static_cast<std::size_t>(offset), static_cast<std::size_t>(length));
        if (static_cast<std::size_t>(offset) >= end)
            page.rows_end = std::min(page.rows_end, static_cast<std::size_t>(offset));
        if (first && !Take_First_Subheader(reading, subheader))
            return false;
        if (!first)
            Take_Variable(reading, subheader);
        first = false;
    }
    return true;
}

/// Settles a page's rows, and reads its subheaders.
bool Look_At_Page(Data_Set_Reading& reading, Page& page, bool& first)
{
    const std::int16_t kind = Page_Layout::kind.Get(page.bytes);
    page.rows_begin = Page_Layout::size;
    page.rows_end = page.bytes.size();
    if (Has_Subheaders(kind) && !Read_Subheaders(reading, page, first))
        return false;
    if (kind == metadata_page)
        page.rows_end = page.rows_begin;
    return true;
}

/// Hands all pages to `take`, from the first on.
template <class Take> bool For_Pages(Data_Set_Reading& reading, const Take& take)
{
    std::vector<std::byte> bytes(reading.page_size);
    if (!reading.file.Seek(static_cast<std::int64_t>(Paged_Head_Layout::size)))
        return false;
    bool first = true;
    while (reading.file.Read_Exactly(bytes.data(), bytes.size())) {
        Page page{bytes};
        if (!Look_At_Page(reading, page, first) || !take(bytes, page))
            return false;
    }
    return !first;
}

bool Read_Page_Size(Data_Set_Reading& reading)
{
    std::array<std::byte, Paged_Head_Layout::size> head;
    if (!reading.file.Seek(0) || !reading.file.Read_Exactly(head.data(), head.size()))
        return false;
    const std::int32_t size = Paged_Head_Layout::page_size.Get(head);
    reading.page_size = static_cast<std::size_t>(std::max(size, 0));
    return size >= static_cast<std::int32_t>(Page_Layout::size) && size <= reading.file.Size();
}

bool Take_Rows(Row_Filler& filler, std::int64_t all, std::vector<std::byte>& bytes, const Page& page)
{
    const std::size_t room = page.rows_end - std::min(page.rows_begin, page.rows_end);
    const auto left = static_cast<std::size_t>(all - filler.Rows());
    return filler.Take(bytes.data() + page.rows_begin, std::min(room / filler.Row_Size(), left));
}

bool Read_Paged(Data_Set_Reading& reading)
{
    std::vector<Row_Field> plan;
    if (!Read_Page_Size(reading)
        || !For_Pages(reading, [](const std::vector<std::byte>&, const Page&) { return true; }))
        return false;
    for (auto& [number, variable] : reading.by_number)
        reading.sas.variables.push_back(variable);
    if (std::ssize(reading.sas.variables) != reading.variable_count || !Begin_Rows(reading, plan))
        return false;
    Row_Filler filler = Filler_Of(reading, std::move(plan));
    filler.infinity_is_missing = false;
    filler.Expect(std::min(reading.rows, reading.file.Size() / reading.sas.row_size));
    const auto take = [&](std::vector<std::byte>& bytes, const Page& page) {
        return Take_Rows(filler, reading.rows, bytes, page);
    };
    return For_Pages(reading, take) && filler.Rows() == reading.rows && filler.Finish();
}

template <std::size_t count>
bool Is_One_Of(std::string_view version, const std::string_view (&versions)[count])
{
    return std::ranges::find(versions, version) != std::end(versions);
}

}  // namespace

bool Read_Sas_Data_Set(Input_File& file)
{
    std::array<char, Version_Place + 4> head{};
    static_cast<void>(file.Read_Head(head.data(), head.size()));
    const std::string_view text(head.data(), head.size());
    const std::string_view version = text.substr(Version_Place);
    const bool paged = Is_One_Of(version, Paged_Versions);
    if (!text.starts_with("SAS") || (!paged && !Is_One_Of(version, Short_Versions)))
        return false;  // silent by design
    Data_Set_Reading reading{.file = file};
    if (!(paged ? Read_Paged(reading) : Read_Short(reading)))
        return Fail("Cannot successfully read SAS transport file.\n");
    Current_Sheet = reading.sas.sheet;
    return true;
}

bool Read_Sas_Data_Set(const char* file_name)
{
    Input_File file;
    return file.Open(file_name) && Read_Sas_Data_Set(file);  // silent by design
}

}  // namespace ingester
