// The records of the dictionary.
#include "request/people_rules.h"
#include "statfiles/spss/spss_system_reader.h"

#include <algorithm>
#include <cstdlib>
#include <limits>

namespace ingester {

namespace {

constexpr std::size_t Kept_Label = 80;
constexpr std::size_t Kept_Value_Label = 90;

std::int64_t Rounded_Up(std::int64_t length, std::int64_t unit)
{
    return (length + unit - 1) / unit * unit;
}

// --- Variables ---------------------------------------------------------------------------------------

bool Read_Variable_Label(Field_Source& source, std::string& label)
{
    constexpr std::int64_t unit = 4;
    std::int32_t length;
    if (!source.Read_Count(length))
        return false;
    const auto kept = std::min<std::size_t>(Kept_Label, static_cast<std::size_t>(length));
    return source.Read_Bytes(Rounded_Up(length, unit), kept, label);
}

/// All that a record counts are read, three act.
bool Read_Missing_Values(Field_Source& source, std::int32_t count, Spss_Variable& variable)
{
    const bool has_range = count == -2 || count == -3;
    const std::int64_t values = std::abs(std::int64_t{count});
    std::array<std::uint8_t, Slot_Size> raw;
    Missing_Rule::Range range;
    for (std::int64_t i = 0; i < values; ++i) {
        if (!source.Read_Numbers(std::span(raw)))
            return false;
        const auto value = Number_At<double>(raw.data(), source.order);
        if (!has_range || i == 2)
            variable.missing.Add_Value(value);
        else
            (i == 0 ? range.low : range.high) = value;
        if (i < std::ssize(variable.missing.values))
            variable.missing_texts.emplace_back(reinterpret_cast<const char*>(raw.data()), raw.size());
    }
    if (has_range)
        variable.missing.Add_Range(range);
    return true;
}

void Cut_Blanks(std::string& text)
{
    text.resize(Without_Blanks(text, false).size());
}

std::size_t Bytes_Of_Case(std::int32_t text_width)
{
    const auto length = static_cast<std::size_t>(std::max(text_width, 1));
    return (length - 1) / Slot_Size * Slot_Size + Slot_Size;
}

bool Read_Variable(Spss_System_Reading& reading)
{
    Field_Source& source = reading.source;
    Spss_Dictionary& dictionary = reading.common.dictionary;
    Spss_Variable_Record record;
    Spss_Variable variable;
    if (!source.Read_Record(record, Spss_Variable_Fields) || record.type < Further_Slot
        || !source.Read_Bytes(Short_Spss_Name, Short_Spss_Name, variable.name)
        || (record.has_label != 0 && !Read_Variable_Label(source, variable.label))
        || !Read_Missing_Values(source, record.missing_count, variable))
        return false;
    reading.variable_of_slot.push_back(-1);
    if (record.type == Further_Slot)
        return true;
    reading.variable_of_slot.back() = static_cast<std::int32_t>(dictionary.variables.size());
    Cut_Blanks(variable.name);
    Cut_Blanks(variable.label);
    variable.text_width = record.type;
    variable.format = Spss_Format::Of_Packed(record.print_format);
    variable.offset = dictionary.case_size;
    dictionary.case_size += Bytes_Of_Case(record.type);
    dictionary.variables.push_back(std::move(variable));
    return true;
}

// --- Labels ------------------------------------------------------------------------------------------

bool Read_Value_Label(Field_Source& source, Label_Set& set)
{
    std::array<std::uint8_t, Slot_Size> raw;
    std::uint8_t length;
    std::string label;
    if (!source.Read_Numbers(std::span(raw)) || !source.Read(length))
        return false;
    const std::int64_t padded = Rounded_Up(length + 1, Slot_Size) - 1;
    if (!source.Read_Bytes(
            padded, Texts_Are_Whole() ? length : std::min<std::size_t>(length, Kept_Value_Label), label))
        return false;
    set.Add(Number_At<double>(raw.data(), source.order),
            {reinterpret_cast<const char*>(raw.data()), raw.size()}, label);
    return true;
}

bool Read_Label_Set(Spss_System_Reading& reading)
{
    std::int32_t count;
    if (!reading.source.Read(count))
        return false;
    Label_Set& set = reading.common.dictionary.label_sets.emplace_back();
    for (std::int32_t i = 0; i < count; ++i)
        if (!Read_Value_Label(reading.source, set))
            return false;
    return true;
}

bool Read_Labelled_Variables(Spss_System_Reading& reading)
{
    Spss_Dictionary& dictionary = reading.common.dictionary;
    std::int32_t count;
    if (!reading.source.Read(count))
        return false;
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t slot;
        if (!reading.source.Read(slot))
            return false;
        if (slot < 1 || slot > std::ssize(reading.variable_of_slot))
            continue;
        if (const std::int32_t variable = reading.variable_of_slot[static_cast<std::size_t>(slot - 1)];
            variable >= 0)
            dictionary.variables[static_cast<std::size_t>(variable)].label_set =
                static_cast<std::int32_t>(dictionary.label_sets.size()) - 1;
    }
    return true;
}

// --- What is kept for later, or passed over --------------------------------------------------------------

bool Skip_Document(Spss_System_Reading& reading)
{
    std::int32_t lines;
    return reading.source.Read(lines) && reading.source.Skip(Document_Line * lines);
}

bool Is_Kept(std::int32_t extension)
{
    constexpr std::int32_t kept[] = {numbers_extension, long_names_extension,  very_long_texts_extension,
                                     code_extension,    text_labels_extension, missing_texts_extension};
    return std::ranges::find(kept, extension) != std::end(kept);
}

bool Read_Extension(Spss_System_Reading& reading)
{
    std::int32_t subtype;
    std::int32_t size;
    std::int32_t count;
    if (!reading.source.Read(subtype, size, count))
        return false;
    const std::int64_t length = std::int64_t{size} * count;
    if (!Is_Kept(subtype))
        return reading.source.Skip(length);
    std::string& bytes = reading.extensions[subtype];
    std::string more;
    if (length < 0 || !reading.source.Read_Bytes(length, std::numeric_limits<std::size_t>::max(), more))
        return false;
    bytes += more;  // lists of labels may come in several records
    return true;
}

bool Read_Dictionary_End(Spss_System_Reading& reading)
{
    std::int32_t filler;
    return reading.source.Read(filler);
}

constexpr struct {
    std::int32_t type;
    bool (*read)(Spss_System_Reading& reading);
} Record_Readers[] = {
    {variable_record, Read_Variable},
    {labels_record, Read_Label_Set},
    {labelled_variables_record, Read_Labelled_Variables},
    {document_record, Skip_Document},
    {extension_record, Read_Extension},
    {dictionary_end, Read_Dictionary_End},
};

/// The slots that all variables take must be there.
bool Cases_Hold_All(Spss_System_Reading& reading)
{
    Spss_Dictionary& dictionary = reading.common.dictionary;
    const std::size_t bytes = Slot_Size * reading.variable_of_slot.size();
    const bool fits = dictionary.case_size <= bytes;
    dictionary.case_size = bytes;
    return fits && !dictionary.variables.empty();
}

}  // namespace

bool Read_Spss_Records(Spss_System_Reading& reading)
{
    std::int32_t type = 0;
    while (type != dictionary_end) {
        if (!reading.source.Read(type))
            return false;
        const auto* const found =
            std::ranges::find_if(Record_Readers, [type](const auto& row) { return row.type == type; });
        if (found == std::end(Record_Readers) || !found->read(reading))
            return false;
    }
    return Cases_Hold_All(reading);
}

}  // namespace ingester
