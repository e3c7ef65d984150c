// Portable files: tags, each with what belongs to it, and the cases behind them.
#include "request/losses.h"
#include "request/messages.h"
#include "request/people_rules.h"
#include "request/request.h"
#include "statfiles/spss/portable_source.h"
#include "statfiles/spss/spss.h"
#include "statfiles/spss/spss_dictionary.h"
#include "support/progress.h"
#include "support/utf8.h"

#include <algorithm>
#include <string_view>
#include <unordered_map>

namespace ingester {

namespace {

constexpr std::size_t Kept_Name = 8;
constexpr std::size_t Kept_Label = 80;
constexpr std::size_t Kept_Value_Label = 90;
constexpr std::size_t Longest_Value_Label = 1000;
constexpr std::size_t Kept_Value = 8;
constexpr std::int64_t Most_Cases = 10000000;

struct Portable_Reading {
    Portable_Source source;
    Input_File& file;
    Spss_Reading common = {};
    std::int32_t variables_told = 0;
    std::unordered_map<std::string, std::size_t> by_name = {};
    bool in_cases = false;
};

bool Cannot_Read()
{
    return Fail("Cannot read SPSS Portable data file.\n");
}

/// The fault has been told, and no other is to be.
bool Told(std::string_view words)
{
    Report_Message(words);
    return Cannot_Read();
}

// --- The head ----------------------------------------------------------------------------------------

constexpr std::size_t Splash_Length = 200;
constexpr std::size_t Table_Length = 256;
constexpr std::size_t Mark_Place = 40;
constexpr std::string_view Splash_Mark = "ASCII SPSS PORT FILE                    ";
constexpr std::string_view Signature = "SPSSPORT";

bool Read_Portable_Head(Portable_Reading& reading)
{
    const std::string name = reading.file.Name();
    const std::string splash = reading.source.Next_Text(Splash_Length);
    if (reading.source.Ended()) {
        Report_Message("SPSS Portable data file ");
        Report_Message(name);
        return Fail(" is empty.\n");
    }
    if (std::string_view(splash).substr(Mark_Place, Splash_Mark.size()) != Splash_Mark) {
        Report_Message("SPSS Portable data file ");
        Report_Message(name);
        return Fail("  is not in correct format.\n");
    }
    static_cast<void>(reading.source.Next_Text(Table_Length));
    if (reading.source.Next_Text(Signature.size()) != Signature)
        return Fail("SPSS Portable file %.100s is not in correct format.\n", name.c_str());
    std::string text;
    static_cast<void>(reading.source.Next());  // the version
    return (reading.source.Portable_String(text, 0) && reading.source.Portable_String(text, 0))
           || Cannot_Read();
}

// --- Tags --------------------------------------------------------------------------------------------

bool Drop_Text(Portable_Reading& reading)
{
    std::string text;
    return reading.source.Portable_String(text, 0) || Cannot_Read();
}

bool Read_Variable_Count(Portable_Reading& reading)
{
    std::int32_t precision;
    if (!reading.source.Portable_Int(reading.variables_told))
        return Cannot_Read();
    if (reading.variables_told < 1)
        return Told("SPSS Portable file: Number of fields is illegal.\n");
    return reading.source.Portable_Int(precision) || Cannot_Read();
}

bool Read_Format(Portable_Source& source, Spss_Format& format)
{
    constexpr std::int32_t type_mask = 63;
    if (!source.Portable_Int(format.code) || !source.Portable_Int(format.width)
        || !source.Portable_Int(format.decimals))
        return false;
    format.code &= type_mask;
    return true;
}

bool Read_Variable(Portable_Reading& reading)
{
    std::vector<Spss_Variable>& variables = reading.common.dictionary.variables;
    Spss_Variable variable;
    Spss_Format print_format;
    if (!reading.source.Portable_Int(variable.text_width))
        return Cannot_Read();
    if (variable.text_width < 0 || reading.variables_told == 0)
        return Told("Invalid variable length in SPSS Portable file.\n");
    if (std::ssize(variables) >= reading.variables_told)
        return Told("Too many variable records in SPSS Portable file.\n");
    if (!reading.source.Portable_String(variable.name, Kept_Name)
        || !Read_Format(reading.source, print_format) || !Read_Format(reading.source, variable.format))
        return Cannot_Read();
    reading.by_name.try_emplace(Name_Key(variable.name), variables.size());
    variables.push_back(std::move(variable));
    return true;
}

/// A value of the variable read last; of a text the number stays 0.
bool Read_Value(Portable_Reading& reading, bool is_text, double& number, std::string& text)
{
    number = 0;
    return is_text ? reading.source.Portable_String(text, Kept_Value) : reading.source.Portable_Real(number);
}

/// How many values a tag of missing values has, and what they mean.
template <bool ranges_low, bool ranges_high> bool Read_Missing(Portable_Reading& reading)
{
    Spss_Variable& variable = reading.common.dictionary.variables.back();
    Missing_Rule::Range range;
    double number;
    std::string text;
    if (!Read_Value(reading, variable.Is_Text(), number, text))
        return Cannot_Read();
    if constexpr (!ranges_low && !ranges_high) {
        if (variable.Is_Text())
            variable.missing_texts.push_back(text);
        else
            variable.missing.Add_Value(number);
        return true;
    }
    (ranges_low ? range.low : range.high) = number;
    if (ranges_low && ranges_high && !Read_Value(reading, variable.Is_Text(), range.high, text))
        return Cannot_Read();
    if (!variable.Is_Text())
        variable.missing.Add_Range(range);
    return true;
}

bool Read_Variable_Label(Portable_Reading& reading)
{
    std::string& label = reading.common.dictionary.variables.back().label;
    if (!reading.source.Portable_String(label, Kept_Label))
        return Cannot_Read();
    if (label == " ")
        label.clear();
    return true;
}

/// Gives the variables that a set of labels names the set; the first that is there tells what its values are.
bool Read_Labelled_Variables(Portable_Reading& reading, std::int32_t count, bool& is_text)
{
    Spss_Dictionary& dictionary = reading.common.dictionary;
    bool found_one = false;
    for (std::int32_t i = 0; i < count; ++i) {
        std::string name;
        if (!reading.source.Portable_String(name, Kept_Name))
            return false;
        const auto found = reading.by_name.find(Name_Key(name));
        if (found == reading.by_name.end())
            continue;
        Spss_Variable& variable = dictionary.variables[found->second];
        variable.label_set = static_cast<std::int32_t>(dictionary.label_sets.size());
        is_text = found_one ? is_text : variable.Is_Text();
        found_one = true;
    }
    return true;
}

bool Read_Label_Set(Portable_Reading& reading)
{
    std::int32_t count;
    bool is_text = false;
    if (!reading.source.Portable_Int(count))
        return Cannot_Read();
    if (count < 1)
        return Told("Invalid Label record in SPSS Portable file.\n");
    Label_Set set;
    if (!Read_Labelled_Variables(reading, count, is_text) || !reading.source.Portable_Int(count))
        return Cannot_Read();
    for (std::int32_t i = 0; i < count; ++i) {
        double value;
        std::string text;
        std::string label;
        if (!Read_Value(reading, is_text, value, text)
            || !reading.source.Portable_String(label,
                                               Texts_Are_Whole() ? Longest_Value_Label : Kept_Value_Label))
            return Cannot_Read();
        set.Add(value, text, label);
    }
    reading.common.dictionary.label_sets.push_back(std::move(set));
    return true;
}

bool Begin_Cases(Portable_Reading& reading)
{
    reading.in_cases = true;
    return true;
}

// --- For people: what else there is -------------------------------------------------------------------

bool Tell_Weight(Portable_Reading& reading)
{
    std::string name;
    if (!reading.source.Portable_String(name, Kept_Name))
        return Cannot_Read();
    Note_Loss(Loss_Kind::metadata_dropped, name, 0, "the variable is the weight of cases");
    return true;
}

bool Drop_Documents(Portable_Reading& reading)
{
    std::int32_t lines;
    if (!reading.source.Portable_Int(lines))
        return Cannot_Read();
    for (std::int32_t i = 0; i < lines; ++i)
        if (!Drop_Text(reading))
            return false;
    return true;
}

constexpr struct {
    char tag;
    bool (*read)(Portable_Reading& reading);
    bool of_variable = false;  ///< belongs to the variable in front of it
    bool for_people = false;
} Tags[] = {
    {'1', Drop_Text},
    {'2', Drop_Text, false, true},
    {'3', Drop_Text},
    {'4', Read_Variable_Count},
    {'6', Tell_Weight, false, true},
    {'7', Read_Variable},
    {'8', Read_Missing<false, false>, true},
    {'9', Read_Missing<false, true>, true},
    {'A', Read_Missing<true, false>, true},
    {'B', Read_Missing<true, true>, true},
    {'C', Read_Variable_Label, true},
    {'D', Read_Label_Set},
    {'E', Drop_Documents, false, true},
    {'F', Begin_Cases},
};

bool Read_Tags(Portable_Reading& reading)
{
    const bool for_people = For_People(People_Rule::further_types);
    while (!reading.in_cases) {
        const char tag = reading.source.Portable_Char();
        if (reading.source.Ended())
            return true;
        const auto* const found = std::ranges::find_if(
            Tags, [&](const auto& row) { return row.tag == tag && (for_people || !row.for_people); });
        if (found == std::end(Tags))
            return Told("Unexpected record type in SPSS Portable file.\n");
        if (found->of_variable && reading.common.dictionary.variables.empty())
            return Told("Missing variable record in SPSS Portable file.\n");
        if (!found->read(reading))
            return false;
    }
    return true;
}

// --- Cases -------------------------------------------------------------------------------------------

/// A variable's value in the case under way; `field` is null for one that is passed over.
bool Read_Cell(Portable_Reading& reading, const Spss_Variable& variable, Row_Filler& filler, Row_Field* field,
               std::string& text)
{
    double number;
    if (!variable.Is_Text()) {
        if (!reading.source.Portable_Real(number))
            return false;
        if (field != nullptr)
            filler.Append_Number(*field, number);
        return true;
    }
    constexpr std::size_t most_bytes = Long_Text_Width * Longest_Letter;
    if (!reading.source.Portable_String(text, most_bytes))
        return false;
    if (field != nullptr)
        filler.Append_Text(*field, text);
    return true;
}

/// False where the cases end, in front of one or in it.
bool Read_Case(Portable_Reading& reading, Row_Filler& filler, bool kept)
{
    std::string text;
    std::size_t next = 0;
    for (std::size_t i = 0; i < reading.common.columns.size(); ++i) {
        Row_Field* const field =
            kept && reading.common.columns[i] != nullptr ? &filler.Fields()[next] : nullptr;
        next += field != nullptr ? 1 : 0;
        if (!Read_Cell(reading, reading.common.dictionary.variables[i], filler, field, text))
            return false;
    }
    return true;
}

bool Read_Cases(Portable_Reading& reading, Row_Filler& filler)
{
    constexpr std::int64_t told_step = 1 << 14;
    while (filler.Rows() < Most_Cases) {
        const bool kept = filler.Keeps_Next_Row();
        if (!Read_Case(reading, filler, kept))
            return reading.source.Ended() || Cannot_Read();
        if (!filler.End_Row(kept))
            return Cannot_Read();
        if (filler.Rows() % told_step == 0)
            Show_Progress("Reading", reading.file.Position(), reading.file.Size());
    }
    request.losses.Note_Unread("cases beyond the greatest number");
    return true;
}

bool Fill_Sheet(Portable_Reading& reading)
{
    Spss_Reading& common = reading.common;
    if (common.dictionary.variables.empty())
        return Fail("SPSS Portable file contains no data records.\n");
    if (!Make_Spss_Columns(common))
        return Cannot_Read();
    Row_Filler filler(*common.sheet, 0, Plan_Of_Cases(common, nullptr), Texts_Of_Cases(common),
                      reading.file.Size());
    constexpr std::int64_t least_field = 2;  // a digit and its end
    const std::int64_t left = reading.file.Size() - reading.file.Position();
    filler.Expect(left / least_field / std::max<std::int64_t>(std::ssize(common.columns), 1));
    if (!Read_Cases(reading, filler))
        return false;
    if (!filler.Finish())
        return Fail("SPSS Portable file contains no data records.\n");
    filler.Held().Report("Numbers in greater than9.99999E+307 have been set to this value.\n");
    return true;
}

/// Nothing tells the code of letters: for people all that is there is looked at. Letters may go on in the
/// next line.
bool Is_All_Utf8(Input_File& file)
{
    const std::int64_t place = file.Position();
    Utf8_Check check;
    bool valid = file.Seek(0);
    Portable_Source source(file);
    while (valid && !source.Ended())
        valid = check.Take(source.Next_Piece());
    return file.Seek(place) && valid && check.Is_Whole();
}

bool Open_Texts(Portable_Reading& reading)
{
    if (!Letters_Are_Utf8() && Declared_Code() == nullptr)
        return true;
    const bool utf8 = Declared_Code() == nullptr && Is_All_Utf8(reading.file);
    return reading.common.crossing.Open_Input(Code_Of_Input(utf8 ? Utf_8_Code() : Windows_1252_Code(), {}));
}

}  // namespace

bool Read_Spss_Portable(Input_File& file)
{
    Portable_Reading reading{.source = Portable_Source(file), .file = file};
    reading.common.labels_by_case_free = true;
    reading.common.formats_are_kept = false;
    if (!Read_Portable_Head(reading) || !Read_Tags(reading) || !Open_Texts(reading) || !Fill_Sheet(reading))
        return false;
    if (file.Failed())
        return Cannot_Read();
    Label_Spss_Columns(reading.common);
    Current_Sheet = reading.common.sheet;
    return true;
}

bool Read_Spss_Portable(const char* file_name)
{
    Input_File file;
    if (file.Open(file_name))
        return Read_Spss_Portable(file);
    Report_Message("SPSS Portable data file ");
    Report_Message(file_name);
    return Fail(" not found.\n");
}

}  // namespace ingester
