// System files of PC+ releases: sections that a head of places leads to.
#include "platform/field_source.h"
#include "request/messages.h"
#include "statfiles/spss/coded_cases.h"
#include "statfiles/spss/spss.h"
#include "statfiles/spss/spss_dictionary.h"
#include "statfiles/spss/spss_system_format.h"

#include <algorithm>
#include <array>
#include <limits>
#include <tuple>

namespace ingester {

namespace {

struct Pc_Head {
    std::int32_t mark = 0;
    std::int32_t filler = 0;
    std::int32_t general_place = 0, general_length = 0;
    std::int32_t variables_place = 0, variables_length = 0;
    std::int32_t labels_place = 0, labels_length = 0;
    std::int32_t data_place = 0, data_length = 0;
};

constexpr std::tuple Pc_Head_Fields(&Pc_Head::mark, &Pc_Head::filler, &Pc_Head::general_place,
                                    &Pc_Head::general_length, &Pc_Head::variables_place,
                                    &Pc_Head::variables_length, &Pc_Head::labels_place,
                                    &Pc_Head::labels_length, &Pc_Head::data_place, &Pc_Head::data_length);

constexpr std::int32_t Pc_Mark = 2;
constexpr std::int32_t Pc_Labels_Mark = 3;

enum Pc_Type : std::uint8_t { pc_continuation = 0, pc_text = 1, pc_number = 5 };

enum Pc_Case_Code : std::uint8_t {
    pc_system_missing = 0,
    pc_literal = 1,
    pc_end = 2,
    pc_last_empty = 5,
};
constexpr double Pc_Bias = 105;

struct Pc_Reading {
    Field_Source source;
    Pc_Head head = {};
    double system_missing = 0;
    std::int16_t variables = 0;
    std::int16_t cases = 0;
    Spss_Reading common = {};
    std::vector<bool> is_text = {};  ///< by slot
    std::string stream = {};         ///< of labels
};

/// Where a variable's labels lie in their stream, from 1; 0 for none.
struct Pc_Variable_Record {
    std::int32_t values_place = 0;
    std::int32_t values_end = 0;
    std::int32_t label_place = 0;
    std::uint8_t decimals = 0, width = 0, type = 0, spare = 0;
};

constexpr std::tuple Pc_Variable_Fields(&Pc_Variable_Record::values_place, &Pc_Variable_Record::values_end,
                                        &Pc_Variable_Record::label_place, &Pc_Variable_Record::decimals,
                                        &Pc_Variable_Record::width, &Pc_Variable_Record::type,
                                        &Pc_Variable_Record::spare);

bool Read_Head(Pc_Reading& reading)
{
    Field_Source& source = reading.source;
    for (const std::endian order : {std::endian::little, std::endian::big}) {
        source.order = order;
        if (!source.Seek(0) || !source.Read_Record(reading.head, Pc_Head_Fields))
            return false;
        if (reading.head.mark == Pc_Mark)
            return true;
    }
    return Fail("SPSS/PC+ file %.100s is not in standard format.\n", source.File().Name().c_str());
}

bool Read_General_Section(Pc_Reading& reading)
{
    Field_Source& source = reading.source;
    if (!source.Seek(reading.head.general_place))
        return Fail("Variable definition data not found in SPSS/PC+ file.\n");
    if (!source.Skip(64) || !source.Read(reading.system_missing) || !source.Skip(12)
        || !source.Read(reading.variables, reading.cases))
        return false;
    return (reading.variables >= 1 && reading.cases >= 1)
           || Fail("No valid data in SPSS/PC+ file %.100s.\n", source.File().Name().c_str());
}

// --- Labels ------------------------------------------------------------------------------------------

bool Read_Label_Section(Pc_Reading& reading)
{
    Field_Source& source = reading.source;
    std::int32_t mark;
    std::int32_t length;
    if (reading.head.labels_length == 0)
        return true;
    if (!source.Seek(reading.head.labels_place))
        return Fail("Values definition data not found in SPSS/PC+ file.\n");
    if (!source.Read(mark) || mark != Pc_Labels_Mark)
        return Fail("SPSS/PC+ Value stream is invalid.\n");
    if (!source.Read(length) || length <= 0)
        return Fail("SPSS/PC+ Value stream length is invalid.\n");
    return source.Read_Bytes(length, static_cast<std::size_t>(length), reading.stream)
           || Fail("Values definition data not found in SPSS/PC+ file.\n");
}

/// What stands behind its length at a place of the stream; empty where there is no such place.
std::string Counted_Text(const std::string& stream, std::int64_t place, std::size_t most)
{
    if (place < 1 || place > std::ssize(stream))
        return {};
    const auto at = static_cast<std::size_t>(place);
    const auto length = static_cast<std::uint8_t>(stream[at - 1]);
    return stream.substr(at, std::min<std::size_t>(length, most));
}

void Take_Value_Labels(Pc_Reading& reading, const Pc_Variable_Record& record, Spss_Variable& variable)
{
    constexpr std::int32_t most_labels = 32000;
    constexpr std::size_t kept = 90;
    constexpr auto value_size = static_cast<std::int64_t>(Slot_Size);
    const std::string& stream = reading.stream;
    const std::int64_t end = std::min<std::int64_t>(record.values_end, std::ssize(stream));
    Label_Set set;
    std::int64_t at = std::int64_t{record.values_place} - 1;
    if (at < 0)
        return;
    for (std::int32_t i = 0; i < most_labels && at + value_size < end; ++i) {
        const std::string value = stream.substr(static_cast<std::size_t>(at), Slot_Size);
        const std::int64_t place = at + value_size + 1;
        const std::int64_t next =
            place + static_cast<std::uint8_t>(stream[static_cast<std::size_t>(place - 1)]);
        if (next > end)
            break;
        set.Add(Number_At<double>(value.data(), reading.source.order), value,
                Counted_Text(stream, place, kept));
        at = next;
    }
    if (set.labels.empty())
        return;
    Spss_Dictionary& dictionary = reading.common.dictionary;
    variable.label_set = static_cast<std::int32_t>(dictionary.label_sets.size());
    dictionary.label_sets.push_back(std::move(set));
}

// --- Variables ---------------------------------------------------------------------------------------

/// The variables that the program keeps for itself stand in front.
bool Is_System_Variable(const std::string& name, std::int16_t place)
{
    constexpr std::string_view names[] = {"$CASENUM", "$DATE   ", "$WEIGHT "};
    return place < std::ssize(names) && name == names[place];
}

bool Read_Variable(Pc_Reading& reading, std::int16_t place, bool& continues_text)
{
    constexpr std::size_t kept_label = 80;
    Field_Source& source = reading.source;
    Spss_Dictionary& dictionary = reading.common.dictionary;
    Pc_Variable_Record record;
    Spss_Variable variable;
    std::array<std::uint8_t, Slot_Size> missing;
    if (!source.Read_Record(record, Pc_Variable_Fields)
        || !source.Read_Bytes(Short_Spss_Name, Short_Spss_Name, variable.name)
        || !source.Read_Numbers(std::span(missing)))
        return false;
    const bool further = record.type == pc_continuation && place > 0 && continues_text;
    reading.is_text.push_back(record.type == pc_text || further);
    if (further)
        dictionary.variables.back().text_width += static_cast<std::int32_t>(Slot_Size);
    continues_text = further || (record.type == pc_text && !Is_System_Variable(variable.name, place));
    if ((record.type != pc_text && record.type != pc_number) || Is_System_Variable(variable.name, place))
        return true;
    if (variable.name.starts_with('$'))
        variable.name.front() = '%';
    variable.name = Without_Blanks(variable.name, false);
    variable.label = Counted_Text(reading.stream, record.label_place, kept_label);
    variable.text_width = record.type == pc_text ? static_cast<std::int32_t>(Slot_Size) : 0;
    variable.offset = Slot_Size * static_cast<std::size_t>(place);
    variable.format = {record.decimals, record.width, 0};
    const auto value = Number_At<double>(missing.data(), source.order);
    if (value != reading.system_missing) {
        variable.missing.Add_Value(value);
        variable.missing_texts.emplace_back(missing.begin(), missing.end());
    }
    Take_Value_Labels(reading, record, variable);
    dictionary.variables.push_back(std::move(variable));
    return true;
}

bool Read_Variables(Pc_Reading& reading)
{
    bool continues_text = false;
    if (!reading.source.Seek(reading.head.variables_place))
        return Fail("Variable definition data not found in SPSS/PC+ file.\n");
    for (std::int16_t place = 0; place < reading.variables; ++place)
        if (!Read_Variable(reading, place, continues_text))
            return false;
    reading.common.dictionary.case_size = Slot_Size * static_cast<std::size_t>(reading.variables);
    return !reading.common.dictionary.variables.empty();
}

// --- Cases -------------------------------------------------------------------------------------------

/// Blocks of control bytes, each in front of the values that it asks for.
class Pc_Decoder {
public:
    Pc_Decoder(Input_File& file, std::endian order) : bytes_(file, -1)
    {
        for (std::size_t code = 0; code < numbers_.size(); ++code) {
            const double number = code <= pc_last_empty ? -std::numeric_limits<double>::max()
                                                        : static_cast<double>(code) - Pc_Bias;
            std::memcpy(numbers_[code].data(), &number, sizeof number);
            if (order != std::endian::native)
                std::ranges::reverse(numbers_[code]);
        }
    }

    /// False where the cases end, in front of one or in it.
    [[nodiscard]] bool Read_Case(std::byte* target, const std::vector<bool>& is_text)
    {
        return std::ranges::all_of(is_text, [&](bool text) {
            const bool read = Read_Slot(target, text);
            target += Slot_Size;
            return read;
        });
    }

private:
    [[nodiscard]] bool Read_Slot(std::byte* target, bool text)
    {
        if (next_ == Controls_Per_Block) {
            const std::byte* const block = bytes_.Next_Eight();
            if (block == nullptr)
                return false;
            std::memcpy(controls_.data(), block, Controls_Per_Block);
            next_ = 0;
        }
        const std::uint8_t code = controls_[next_++];
        const std::byte* const value = code == pc_literal ? bytes_.Next_Eight()
                                       : text             ? nothing_.data()
                                                          : numbers_[code].data();
        if (code == pc_end || value == nullptr)
            return false;
        std::memcpy(target, value, Slot_Size);
        return true;
    }

    Case_Bytes bytes_;
    std::array<std::array<std::byte, Slot_Size>, 256> numbers_;
    std::array<std::byte, Slot_Size> nothing_{};
    std::array<std::uint8_t, Controls_Per_Block> controls_{};
    std::size_t next_ = Controls_Per_Block;
};

bool Fill_Cases(Pc_Reading& reading, Row_Filler& filler)
{
    Pc_Decoder decoder(reading.source.File(), reading.source.order);
    std::vector<std::byte> row(filler.Row_Size());
    filler.Expect(reading.cases);
    while (filler.Rows() < reading.cases && decoder.Read_Case(row.data(), reading.is_text))
        if (!filler.Take(row.data(), 1))
            return false;
    return !reading.source.File().Failed() && filler.Finish();
}

bool Read_Cases(Pc_Reading& reading)
{
    Spss_Reading& common = reading.common;
    Input_File& file = reading.source.File();
    if (!reading.source.Seek(reading.head.data_place) || file.Position() >= file.Size())
        return Fail("Record data not found in SPSS/PC+ file.\n");
    if (!Make_Spss_Columns(common))
        return false;
    Row_Filler filler(*common.sheet, common.dictionary.case_size,
                      Plan_Of_Cases(common, Fill_Doubles(reading.source.order)), Texts_Of_Cases(common),
                      file.Size());
    if (!Fill_Cases(reading, filler))
        return false;
    filler.Held().Report(Greater_Numbers_Were_Set);
    return true;
}

/// Nothing tells the code of letters; these files are older than UTF-8.
bool Open_Texts(Pc_Reading& reading)
{
    return (!Letters_Are_Utf8() && Declared_Code() == nullptr)
           || reading.common.crossing.Open_Input(Code_Of_Input(Windows_1252_Code(), {}));
}

}  // namespace

bool Read_Spss_Pc(Input_File& file)
{
    Pc_Reading reading{.source = Field_Source(file)};
    if (!Read_Head(reading) || !Read_General_Section(reading) || !Read_Label_Section(reading)
        || !Read_Variables(reading) || !Open_Texts(reading) || !Read_Cases(reading))
        return Fail("Cannot read SPSS/PC+ data file %.80s.\n", file.Name().c_str());
    Label_Spss_Columns(reading.common);
    Current_Sheet = reading.common.sheet;
    return true;
}

bool Read_Spss_Pc_File(const char* file_name)
{
    Input_File file;
    if (!file.Open(file_name))
        return Fail("SPSS data file %.100s not found.\n", file_name);
    return Read_Spss_Pc(file);
}

}  // namespace ingester
