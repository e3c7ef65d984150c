// Transport files: a member's description, and its observations.
#include "model/sheet_list.h"
#include "platform/field_source.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"
#include "statfiles/sas/sas.h"
#include "statfiles/sas/sas_columns.h"
#include "statfiles/sas/sas_format.h"
#include "statfiles/sas/sas_numbers.h"
#include "statfiles/sas/sas_transport_members.h"
#include "support/text.h"
#include "support/utf8.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <map>

namespace ingester {

namespace {

bool Cannot_Read()
{
    return Fail("Cannot successfully read SAS transport file.\n");
}

/// A member on its way into a Sheet.
struct Transport_Reading {
    Input_File& file;
    std::string shown = {};  ///< the name of the file, for messages
    Sas_Reading sas = {};
    bool several = false;  ///< members
    bool version_8 = false;
    std::int64_t end = 0;  ///< of its observations
    long overflows = 0;
    std::map<std::string, std::int64_t, std::less<>> marks = {};
};

bool Read_Record(Input_File& file, std::string& record)
{
    record.resize(Sas_Record_Size);
    return file.Read_Exactly(record.data(), record.size());
}

bool Read_Header(Input_File& file, std::string& record)
{
    return Read_Record(file, record) && record.starts_with(Sas_Header);
}

// --- Variables ---------------------------------------------------------------------------------------

std::string Text_At(std::string_view record, std::size_t place, std::size_t length)
{
    const std::string_view text = record.substr(place, length);
    return std::string(text.substr(0, text.find('\0')));
}

std::string Trimmed_End(const std::string& text)
{
    return std::string(Without_Blanks(text, false));
}

/// Hosts get what stands behind a label as well.
std::string Label_Of(std::string_view record)
{
    using Layout = Namestr_Layout;
    const bool alone = For_People(People_Rule::whole_texts);
    return std::string(
        Trim_Copy(Text_At(record, Layout::nlabel, alone ? Layout::label_size : Layout::label_reach)));
}

Sas_Variable Variable_Of(const Transport_Reading& reading, const std::string& record)
{
    using Layout = Namestr_Layout;
    const auto bytes = std::as_bytes(std::span(record));
    Sas_Variable variable;
    variable.type = Layout::ntype.Get(bytes);
    variable.length = Layout::nlng.Get(bytes);
    variable.offset = Layout::npos.Get(bytes);
    variable.decimals = Layout::nfd.Get(bytes);
    variable.name = Trimmed_End(Text_At(record, Layout::nname, Layout::name_size));
    variable.label = Label_Of(record);
    variable.format = record.substr(Layout::nform, Layout::form_size);
    if (reading.version_8)
        if (const std::string name = Trimmed_End(Text_At(record, Layout::long_name, Layout::long_name_size));
            !name.empty())
            variable.name = name;
    return variable;
}

bool Read_Variables(Transport_Reading& reading, std::size_t size, long count)
{
    Input_File& file = reading.file;
    std::int64_t bytes = 0;
    for (long i = 0; i < count; ++i) {
        std::string record(size, '\0');
        if (!file.Read_Exactly(record.data(), size))
            return false;
        record.resize(Namestr_Layout::size, ' ');
        reading.sas.variables.push_back(Variable_Of(reading, record));
        bytes += static_cast<std::int64_t>(size);
    }
    constexpr auto record_size = static_cast<std::int64_t>(Sas_Record_Size);
    return file.Seek(file.Position() + (record_size - bytes % record_size) % record_size);
}

long Digits_At(const std::string& record, std::size_t place, std::size_t digits)
{
    return Leading_Integer(std::string_view(record).substr(place, digits));
}

/// The records up to the one that counts the variables.
bool Read_Member_Head(Transport_Reading& reading, std::size_t& size, long& count)
{
    std::string record;
    if (!Read_Header(reading.file, record))
        return false;
    size = static_cast<std::size_t>(std::max(Digits_At(record, Variable_Size_Place, 3), 0L));
    reading.version_8 = record.starts_with(Sas_Member_Header_8.substr(0, Sas_Header_Compared));
    if ((size != Namestr_Layout::size && size != Namestr_Layout::size_on_vms)
        || !Read_Header(reading.file, record) || !Read_Record(reading.file, record)
        || !Read_Record(reading.file, record) || !Read_Header(reading.file, record))
        return false;
    count = reading.version_8 ? Digits_At(record, Count_Place_8, Count_Digits_8)
                              : Digits_At(record, Variable_Count_Place, Variable_Count_Digits);
    return true;
}

// --- Version 8: names and labels in full ---------------------------------------------------------------

/// A number of the variable, the lengths of its texts, and these.
bool Read_Long_Label(Transport_Reading& reading, Field_Source& source, bool has_formats)
{
    std::int16_t number;
    std::int16_t lengths[4] = {};
    std::string name;
    std::string label;
    const std::size_t count = has_formats ? 4 : 2;
    if (!source.Read(number) || !source.Read_Numbers(std::span(lengths, count))
        || !source.Read_Bytes(lengths[0], Sas_Record_Size, name)
        || !source.Read_Bytes(lengths[1], 4 * Sas_Record_Size, label)
        || !source.Skip(std::max<std::int16_t>(lengths[2], 0))
        || !source.Skip(std::max<std::int16_t>(lengths[3], 0)))
        return false;
    if (number < 1 || number > std::ssize(reading.sas.variables))
        return true;
    Sas_Variable& variable = reading.sas.variables[static_cast<std::size_t>(number - 1)];
    if (!name.empty())
        variable.name = Trimmed_End(name);
    variable.label = Trim_Copy(label);
    return true;
}

bool Read_Long_Labels(Transport_Reading& reading, const std::string& header)
{
    Field_Source source(reading.file, std::endian::big);
    const std::int64_t start = reading.file.Position();
    const bool has_formats = header.starts_with(Sas_Label_Header_9.substr(0, Sas_Header_Compared));
    const long count = Digits_At(header, Count_Place_8, Count_Digits_8);
    for (long i = 0; i < count; ++i)
        if (!Read_Long_Label(reading, source, has_formats))
            return false;
    constexpr auto size = static_cast<std::int64_t>(Sas_Record_Size);
    return reading.file.Seek(start + (reading.file.Position() - start + size - 1) / size * size);
}

bool Has_Long_Labels(const Transport_Reading& reading, const std::string& header)
{
    return reading.version_8
           && (header.starts_with(Sas_Label_Header_8.substr(0, Sas_Header_Compared))
               || header.starts_with(Sas_Label_Header_9.substr(0, Sas_Header_Compared)));
}

/// The record in front of the observations.
bool Read_Data_Header(Transport_Reading& reading)
{
    std::string record;
    bool found = Read_Header(reading.file, record);
    if (found && Has_Long_Labels(reading, record))
        found = Read_Long_Labels(reading, record) && Read_Header(reading.file, record);
    return found || Fail("No Data header found in SAS transport file.\n");
}

// --- Observations ------------------------------------------------------------------------------------

bool Find_Data_End(Transport_Reading& reading)
{
    const std::int64_t start = reading.file.Position();
    reading.end = reading.file.Size();
    if (!reading.several)
        return true;
    reading.end = Next_Sas_Header(reading.file);
    return reading.file.Seek(start);
}

/// Numbers of up to eight bytes.
struct Stored_Ibm {
    static double Decode(const std::byte* stored, std::size_t width)
    {
        std::uint64_t bytes;
        if (width == sizeof bytes) [[likely]]
            return Usual_Ibm_Number(Number_At<std::uint64_t, std::endian::big>(stored));
        bytes = 0;
        std::memcpy(&bytes, stored, width);
        return Usual_Ibm_Number(Number_At<std::uint64_t, std::endian::big>(&bytes));
    }
};

void Tell_Overflow(Transport_Reading& reading, const Column& column, std::int64_t row)
{
    if (reading.overflows++ == 0)
        Report_Message("SAS Transport Conversion Warnings\n \n");
    Fail("Exponent overflow in Column %s at row %li.\n", column.name.c_str(), static_cast<long>(row));
    Note_Loss(Loss_Kind::number_not_held, column.name, row, "beyond the exponents of SAS transport files");
}

/// Letters and "_" tell why a value is missing.
void Note_Mark(const Column& column, std::uint8_t mark, std::int64_t row)
{
    if (mark == '_' || (mark >= 'A' && mark <= 'Z')) {
        const char text[] = {'.', static_cast<char>(mark)};
        Note_Loss(Loss_Kind::missing_codes_merged, column.name, row, std::string_view(text, sizeof text));
    }
}

double Settle_Ibm(Transport_Reading& reading, const Row_Field& field, const std::byte* stored,
                  std::int64_t row)
{
    std::array<std::byte, sizeof(double)> bytes{};
    std::memcpy(bytes.data(), stored, field.width);
    double value;
    if (Ibm_To_Double(bytes.data(), value) == 0)
        Tell_Overflow(reading, *field.column, row);
    else if (value != value)
        Note_Mark(*field.column, std::to_integer<std::uint8_t>(bytes[0]), row);
    return value == value ? value : field.column->sheet->missing_value;
}

/// The last record is filled up with blanks: whole observations of them are none.
std::size_t Rows_In_Front_Of_Padding(const Row_Block& block, std::int64_t first_doubtful)
{
    const auto is_blank = [&](std::size_t i) {
        const std::string_view row(reinterpret_cast<const char*>(block.rows) + i * block.row_size,
                                   block.row_size);
        return row.find_first_not_of(' ') == std::string_view::npos;
    };
    const std::int64_t last = block.first_row + static_cast<std::int64_t>(block.count) - 1;
    if (last < first_doubtful)
        return block.count;
    auto i = static_cast<std::size_t>(std::max<std::int64_t>(first_doubtful - block.first_row, 0));
    while (i < block.count && !is_blank(i))
        ++i;
    return i;
}

bool Is_Empty(const Transport_Reading& reading)
{
    const Sas_Reading& sas = reading.sas;
    return sas.variables.empty() || sas.row_size < 1
           || (reading.end - reading.file.Position()) / sas.row_size < 1;
}

void Tell_Overflows(const Transport_Reading& reading)
{
    if (reading.overflows == 0)
        return;
    Report_Message_Long("%li values in: ", reading.overflows);
    Fail(
        "%.100s\noverflowed the 7 bit exponent in the SAS XPORT numerical format.\nThe values where abs(X) > "
        "1e+76 or abs(X) < 1e-76\nhave been set to missing or zero respectively.\n",
        reading.shown.c_str());
    Fail("A summary of this is detailed in the file %s.\n", Message_File_Name().c_str());
}

bool Read_Observations(Transport_Reading& reading, std::vector<Row_Field> plan)
{
    Sas_Reading& sas = reading.sas;
    Input_File& file = reading.file;
    const std::int64_t bytes = reading.end - file.Position();
    constexpr auto record = static_cast<std::int64_t>(Sas_Record_Size);
    const std::int64_t first_doubtful = (bytes / record * record - record) / sas.row_size + 1;
    const Row_Texts texts{.whole = For_People(People_Rule::whole_texts), .crossing = &sas.crossing};
    Row_Filler filler(*sas.sheet, static_cast<std::size_t>(sas.row_size), std::move(plan), texts,
                      file.Size());
    filler.settle = [&](const Row_Field& field, const std::byte* stored, double, std::int64_t row) {
        return Settle_Ibm(reading, field, stored, row);
    };
    filler.Expect(bytes / sas.row_size);
    if (!Fill_From_File(filler, file, reading.end, bytes / sas.row_size, [&](const Row_Block& block) {
            return Rows_In_Front_Of_Padding(block, first_doubtful);
        }))
        return Cannot_Read();
    if (!filler.Finish())
        return Fail("All SAS Transport records are blank.\n");
    filler.Held().Report(Greater_Numbers_Were_Set);
    Tell_Overflows(reading);
    return true;
}

bool Is_Held_Text(const Sas_Reading& sas, const Sas_Variable& variable)
{
    return variable.length > 0 && variable.offset >= 0
           && std::int64_t{variable.offset} + variable.length <= sas.row_size;
}

/// What is no ASCII among the texts of some rows.
void Gather_Letters(const Row_Block& block, std::span<const Sas_Variable> variables, std::string& letters)
{
    for (const Sas_Variable& variable : variables)
        for (std::size_t i = 0; i < block.count; ++i) {
            const auto* const start = reinterpret_cast<const char*>(block.rows) + i * block.row_size;
            const std::string_view text(start + variable.offset, static_cast<std::size_t>(variable.length));
            if (!Is_Ascii(text))
                letters.append(text).append(" ");
        }
}

/// Nothing tells the code of letters, so all texts are looked at: UTF-8 is what is valid as such.
bool All_Texts_Are_Utf8(Transport_Reading& reading)
{
    const Sas_Reading& sas = reading.sas;
    std::string letters;
    std::vector<Sas_Variable> texts;
    for (const Sas_Variable& variable : sas.variables) {
        letters.append(variable.name).append(" ").append(variable.label).append(" ");
        if (variable.type == sas_text && Is_Held_Text(sas, variable))
            texts.push_back(variable);
    }
    const std::int64_t start = reading.file.Position();
    std::vector<std::byte> buffer(static_cast<std::size_t>(sas.row_size) * 256);
    bool valid = Is_Utf8(letters);
    while (valid && !texts.empty() && reading.file.Position() < reading.end) {
        letters.clear();
        const std::size_t got = reading.file.Read(buffer.data(), buffer.size());
        const auto size = static_cast<std::size_t>(sas.row_size);
        Gather_Letters({buffer.data(), size, got / size}, texts, letters);
        valid = Is_Utf8(letters);
        if (got < buffer.size())
            break;
    }
    return reading.file.Seek(start) && valid;
}

bool Open_Texts(Transport_Reading& reading)
{
    if (!Letters_Are_Utf8() && Declared_Code() == nullptr)
        return true;
    const bool judged = Declared_Code() == nullptr;
    const Text_Code found = judged && All_Texts_Are_Utf8(reading) ? Utf_8_Code() : Windows_1252_Code();
    return reading.sas.crossing.Open_Input(Code_Of_Input(found, {}));
}

bool Read_Member(Transport_Reading& reading, const Sas_Member& member)
{
    std::size_t size;
    long count;
    std::vector<Row_Field> plan;
    if (!reading.file.Seek(member.offset) || !Read_Member_Head(reading, size, count)
        || !Read_Variables(reading, size, count))
        return Cannot_Read();
    if (!Read_Data_Header(reading) || !Find_Data_End(reading))
        return false;
    Sas_Reading& sas = reading.sas;
    if (!sas.variables.empty())
        sas.row_size = std::int64_t{sas.variables.back().offset} + sas.variables.back().length;
    if (Is_Empty(reading))
        return Fail("SAS transport file %.100s is empty.\n", reading.shown.c_str());
    sas.columns_beyond = "Too many variables in SAS dataset, only the first %li will be imported.";
    sas.longest_text = reading.version_8 ? Longest_Sas_Text_8 : Longest_Sas_Text;
    if (!Open_Texts(reading) || !Make_Sas_Columns(sas, Fill_Numbers<Stored_Ibm>, plan))
        return Cannot_Read();
    return Read_Observations(reading, std::move(plan));
}

}  // namespace

bool Read_Sas_Transport(Input_File& file)
{
    std::vector<Sas_Member> members;
    std::size_t chosen;
    if (!Find_Sas_Members(file, members))
        return false;
    if (request.List_Sheets_Only) {
        std::vector<std::string> names;
        std::ranges::transform(members, std::back_inserter(names), &Sas_Member::name);
        return Make_Sheet_List(names);
    }
    if (!Choose_Sas_Member(members, chosen))
        return false;
    Transport_Reading reading{.file = file, .shown = file.Name(), .several = members.size() > 1};
    if (!Read_Member(reading, members[chosen]))
        return false;
    reading.sas.sheet->sheet_name = members[chosen].name;
    if (reading.several)
        request.losses.Bar_Replacing("its other members would be lost");
    Current_Sheet = reading.sas.sheet;
    return true;
}

bool Read_Sas_Transport(const char* file_name)
{
    Input_File file;
    return file.Open(file_name) ? Read_Sas_Transport(file) : Cannot_Read();
}

std::optional<std::vector<std::string>> Read_Sas_Member_Names(const char* file_name)
{
    Input_File file;
    std::vector<Sas_Member> members;
    if (!file.Open(file_name) || !Find_Sas_Members(file, members))
        return std::nullopt;
    std::vector<std::string> names;
    std::ranges::transform(members, std::back_inserter(names), &Sas_Member::name);
    return names;
}

}  // namespace ingester
