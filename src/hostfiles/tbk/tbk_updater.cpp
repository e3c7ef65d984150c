// Adding to a book and replacing in it: a copy of the book is made beside it, in which every stored offset is
// moved, and takes the book's name when it is complete.
#include "hostfiles/tbk/tbk.h"
#include "hostfiles/tbk/tbk_writer.h"
#include "platform/folders.h"
#include "request/losses.h"
#include "request/messages.h"
#include "support/letters.h"
#include "support/progress.h"
#include "support/text.h"

#include <algorithm>
#include <optional>

namespace ingester {

namespace {

struct New_Page {
    Sheet* sheet;
    std::string name;
};

/// What is to come into a book.
struct Book_Change {
    std::vector<New_Page> pages;
    std::optional<std::size_t> replaced;  ///< the sheet that goes, from 0; none when pages are added
};

struct Book_Copy {
    Book_Source source;
    Book_Sink sink;
    const Book_Change& change;

    bool in_book = false;
    bool in_sheet = false;
    bool changed = false;  ///< the new sheets are in the copy
    std::int32_t sections_ended = 0;
    std::int32_t sheets = 0;       ///< of the section
    std::int32_t sheets_met = 0;   ///< of the first section
    Sheet_Offsets old_table = {};  ///< of the first section, as its sheets stand in the old book
    Sheet_Offsets table = {};      ///< and in the copy; 0 for a sheet not met yet
    std::int64_t table_at = 0;
    std::int64_t end_at = 0;
    std::int32_t old_end = 0;

    [[nodiscard]] bool In_First_Section() const { return sections_ended == 0; }
    [[nodiscard]] std::size_t Added() const { return change.replaced ? 0 : change.pages.size(); }
    /// By how much the record lies farther back in the copy than in the old book.
    [[nodiscard]] std::int64_t Shift() const { return sink.Position() - source.Record().offset; }
};

// --- Records as they stand ---------------------------------------------------------------------------

void Copy_Record_Head(Book_Copy& copy)
{
    copy.sink.Put_Record_Head(copy.source.Record().type, copy.source.Record().length);
}

bool Copy_Payload(Book_Copy& copy)
{
    constexpr std::int64_t large = 1 << 20;
    if (copy.source.Left() >= large)
        return copy.source.Copy_Rest(copy.sink.File());
    while (copy.source.Left() > 0) {
        const auto count =
            std::min(copy.source.Left(), static_cast<std::int64_t>(Book_Source::Bytes_At_Once));
        const std::byte* const bytes = copy.source.Take(static_cast<std::size_t>(count));
        if (bytes == nullptr || copy.sink.Failed())
            return false;
        copy.sink.Put_Bytes(bytes, static_cast<std::size_t>(count));
    }
    return true;
}

bool Copy_Record(Book_Copy& copy)
{
    Copy_Record_Head(copy);
    return Copy_Payload(copy);
}

// --- Records that hold offsets -----------------------------------------------------------------------

bool Copy_Book_Start(Book_Copy& copy)
{
    std::int32_t end;
    const std::int64_t shift = copy.Shift();
    copy.in_book = true;
    if (!copy.source.Read(copy.sheets, end) || (copy.sheets < 0 && !copy.source.Corrupt()))
        return false;
    Copy_Record_Head(copy);
    const bool first = copy.In_First_Section();
    const auto added = static_cast<std::int64_t>(first ? copy.Added() : 0);
    copy.sink.Put(copy.sink.In_A_Word(copy.sheets + added));
    if (first) {
        copy.end_at = copy.sink.Position();
        copy.old_end = end;
    }
    copy.sink.Put(copy.sink.In_A_Word(first ? 0 : end + shift));
    return true;
}

bool Copy_Sheet_Table(Book_Copy& copy)
{
    constexpr auto size = static_cast<std::int64_t>(sizeof(std::int32_t));
    Sheet_Offsets offsets;
    const std::int64_t shift = copy.Shift();
    if (!Read_Sheet_Table(copy.source, copy.sheets, offsets))
        return false;
    const std::size_t added = copy.In_First_Section() ? copy.Added() : 0;
    copy.sink.Put_Record_Head(sheet_table_record, size * static_cast<std::int64_t>(offsets.size() + added));
    if (copy.In_First_Section()) {
        copy.table_at = copy.sink.Position();
        copy.table.assign(offsets.size() + added, 0);
        copy.old_table = offsets;
    }
    for (const std::int32_t offset : offsets)
        copy.sink.Put(copy.In_First_Section() ? 0 : copy.sink.In_A_Word(offset + shift));
    for (std::size_t i = 0; i < added; ++i)
        copy.sink.Put(std::int32_t{0});
    return true;
}

bool Copy_Column_Table(Book_Copy& copy)
{
    const std::int64_t shift = copy.Shift();
    std::int32_t offset;
    Copy_Record_Head(copy);
    while (copy.source.Left() > 0) {
        if (!copy.source.Read(offset))
            return false;
        copy.sink.Put(copy.sink.In_A_Word(offset + shift));
    }
    return true;
}

// --- Sheets ------------------------------------------------------------------------------------------

bool Add_Pages(Book_Copy& copy)
{
    copy.changed = true;
    std::size_t position = copy.old_table.size();
    for (const New_Page& page : copy.change.pages)
        if (!Write_One_Sheet(*page.sheet, copy.sink, copy.table, position++, page.name))
            return false;
    return true;
}

/// Passes over the sheet that goes.
bool Skip_Sheet(Book_Copy& copy)
{
    do
        if (!copy.source.Next_Record())
            return false;
    while (copy.source.Record().type != sheet_end_record && copy.source.Record().type != sheet_start_record
           && copy.source.Record().type != book_end_record);
    return copy.source.Record().type == sheet_end_record ? copy.source.Skip_Rest() : copy.source.Corrupt();
}

bool Replace_Page(Book_Copy& copy)
{
    const New_Page& page = copy.change.pages.front();
    copy.changed = true;
    return Write_One_Sheet(*page.sheet, copy.sink, copy.table, *copy.change.replaced, page.name)
           && Skip_Sheet(copy);
}

bool Copy_Sheet_Start(Book_Copy& copy)
{
    if (!copy.In_First_Section()) {
        copy.in_sheet = true;
        return Copy_Record(copy);
    }
    ++copy.sheets_met;
    bool goes = false;
    for (std::size_t i = 0; i < copy.old_table.size(); ++i)
        if (copy.old_table[i] == copy.source.Record().offset) {
            copy.table[i] = copy.sink.In_A_Word(copy.sink.Position());
            goes = goes || copy.change.replaced == i;
        }
    if (goes)
        return Replace_Page(copy);
    copy.in_sheet = true;
    return Copy_Record(copy);
}

bool Copy_Sheet_End(Book_Copy& copy)
{
    copy.in_sheet = false;
    const bool last = copy.In_First_Section() && copy.sheets_met == copy.sheets;
    const bool adds = !copy.change.replaced && !copy.changed;
    return Copy_Record(copy) && (!last || !adds || Add_Pages(copy));
}

bool Copy_Book_End(Book_Copy& copy)
{
    copy.in_book = false;
    if (!copy.In_First_Section()) {
        ++copy.sections_ended;
        return Copy_Record(copy);
    }
    if (!copy.change.replaced && !copy.changed && !Add_Pages(copy))
        return false;
    // A sheet that the table tells of and that isn't there would be lost.
    if (!copy.changed || std::ranges::count(copy.table, 0) > 0)
        return copy.source.Corrupt();
    const std::int64_t shift = copy.Shift();
    ++copy.sections_ended;
    if (!Copy_Record(copy))
        return false;
    Rewrite_Offsets(copy.sink, copy.table_at, copy.table);
    copy.sink.Put_Word_At(copy.end_at, copy.old_end + shift);
    return true;
}

// --- The walk ----------------------------------------------------------------------------------------

struct Copy_Rule {
    std::int32_t type;
    bool (*in_place)(const Book_Copy& copy);
    bool (*copy)(Book_Copy& copy);
};

bool Is_Outside_Books(const Book_Copy& copy)
{
    return !copy.in_book;
}

bool Is_Between_Sheets(const Book_Copy& copy)
{
    return copy.in_book && !copy.in_sheet;
}

/// The table of the first section stands there once, and in front of the sheets.
bool Is_Place_Of_Table(const Book_Copy& copy)
{
    return Is_Between_Sheets(copy) && (!copy.In_First_Section() || copy.table_at == 0);
}

bool Is_Place_Of_Sheet(const Book_Copy& copy)
{
    return Is_Between_Sheets(copy) && copy.table_at != 0;
}

bool Is_In_Sheet(const Book_Copy& copy)
{
    return copy.in_sheet;
}

/// All other records are copied as they stand.
constexpr Copy_Rule Copy_Rules[] = {
    {book_start_record, Is_Outside_Books, Copy_Book_Start},
    {book_end_record, Is_Place_Of_Sheet, Copy_Book_End},
    {sheet_table_record, Is_Place_Of_Table, Copy_Sheet_Table},
    {sheet_start_record, Is_Place_Of_Sheet, Copy_Sheet_Start},
    {sheet_end_record, Is_In_Sheet, Copy_Sheet_End},
    {column_table_record, Is_In_Sheet, Copy_Column_Table},
};

bool Copy_Next_Record(Book_Copy& copy)
{
    if (!copy.source.Next_Record())
        return false;
    const auto* const rule = std::ranges::find(Copy_Rules, copy.source.Record().type, &Copy_Rule::type);
    if (rule == std::end(Copy_Rules))
        return Copy_Record(copy);
    if (!rule->in_place(copy))
        return copy.source.Corrupt();
    return rule->copy(copy) && (copy.source.Left() == 0 || copy.source.Corrupt());
}

void Copy_Head(Book_Copy& copy)
{
    copy.sink.Put_Bytes(Book_Magic);
    copy.sink.Put(Order_Mark, static_cast<std::uint16_t>(copy.source.Sections()));
}

bool Copy_Book(Book_Copy& copy)
{
    constexpr std::int64_t shown_each = std::int64_t{1} << 24;
    std::int64_t shown = 0;
    Copy_Head(copy);
    while (copy.sections_ended == 0 || copy.sections_ended < copy.source.Sections()) {
        if (!Copy_Next_Record(copy) || copy.sink.Failed())
            return false;
        if (copy.sink.Position() - shown >= shown_each) {
            shown = copy.sink.Position();
            Show_Progress("copying", copy.source.Record().offset, copy.source.Size());
        }
    }
    return true;
}

// --- The files ---------------------------------------------------------------------------------------

std::string Scratch_Name(std::string_view file_name)
{
    const long pid = Process_Id();
    return std::string(Folder_Of(file_name))
        .append(pid < 1 ? "$Ingester$.$X$" : Format_Text("$IG%li$.$X$", pid));
}

bool Write_Copy(Input_File& book, const std::string& shown, const std::string& scratch,
                const Book_Change& change)
{
    Output_File file;
    if (!file.Open_Scratch(scratch))
        return Fail("Tabulon Book file %.100s not saved.\n", shown.c_str());
    Book_Source source(book, Book_Walker::updater, shown);
    const bool good = book.Seek(0) && source.Read_Head();
    const std::endian order = source.Order();
    Book_Copy copy{std::move(source), Book_Sink(file, order), change};
    const bool copied = good && Copy_Book(copy);
    return (file.Close() && copied) || Fail("Document not saved.\n");
}

bool Update_Book(Input_File& book, const char* file_name, const std::string& shown, const Book_Change& change)
{
    Scratch_File scratch(Scratch_Name(file_name));
    if (!Write_Copy(book, shown, scratch.Name(), change) || !Losses_Are_Allowed())
        return false;
    if (Replace_File(scratch.Name(), file_name))
        return true;
    Warn("Error: Temporary file %.100s could not be renamed to %.100s\nDocument is saved in "
         "Temporary file only.\n",
         scratch.Name().c_str(), shown.c_str());
    scratch.Keep();
    return false;
}

/// The names of the sheets that there are.
bool Open_Book(Input_File& book, const char* file_name, const std::string& shown,
               std::vector<std::string>& names)
{
    Sheet_Offsets offsets;
    if (!book.Open(file_name) || !List_Pages(book, offsets, names))
        return Fail("Unable to get Pagenames from Tabulon Book file %.200s.\n", shown.c_str());
    return true;
}

/// The sheet of that name exactly; else the last but for the case of letters; else that of the number.
std::optional<std::size_t> Find_Page(std::span<const std::string> names, std::string_view page)
{
    constexpr std::size_t most_pages = 16383;
    const auto looked_at = names.first(std::min(names.size(), most_pages));
    if (const auto found = std::ranges::find(looked_at, page); found != looked_at.end())
        return static_cast<std::size_t>(found - looked_at.begin());
    for (std::size_t i = looked_at.size(); i > 0; --i)
        if (Equal_Folded(looked_at[i - 1], page))
            return i - 1;
    const std::size_t number = Sheet_Number_Of(page, names.size());
    return number == 0 ? std::nullopt : std::optional(number - 1);
}

}  // namespace

bool Add_Sheets_To_TBK(const char* file_name, std::span<Sheet* const> sheets, std::string_view shown)
{
    if (file_name == nullptr || sheets.empty() || std::ranges::count(sheets, nullptr) > 0)
        return Fail("Internal Spreadsheet Error: Null BOOK in Save book.\n");
    const std::string book_name(shown.empty() ? file_name : shown);
    Input_File book;
    std::vector<std::string> names;
    if (!Open_Book(book, file_name, book_name, names))
        return false;
    Book_Change change;
    for (Sheet* const sheet : sheets)
        change.pages.push_back({sheet, Add_Unique_Page_Name(names, Page_Name_Of(*sheet))});
    return Update_Book(book, file_name, book_name, change);
}

bool Replace_Sheet_In_TBK(const char* file_name, Sheet* sheet, std::string_view page, std::string_view shown)
{
    if (file_name == nullptr || sheet == nullptr)
        return Fail("Internal Spreadsheet Error: Null BOOK in Save book.\n");
    const std::string book_name(shown.empty() ? file_name : shown);
    Input_File book;
    std::vector<std::string> names;
    if (!Open_Book(book, file_name, book_name, names))
        return false;
    const std::optional<std::size_t> found = Find_Page(names, page);
    if (!found)
        return Fail("Sheet %s not found in Tabulon file %.100s.\n", std::string(page).c_str(),
                    book_name.c_str());
    // A number says which sheet, and is no name for it.
    const bool named = Equal_Folded(names[*found], page);
    const Book_Change change{{{sheet, named ? std::string(page) : names[*found]}}, found};
    return Update_Book(book, file_name, book_name, change);
}

}  // namespace ingester
