// What the extensions of a dictionary tell of its variables.
#include "request/losses.h"
#include "request/people_rules.h"
#include "statfiles/spss/spss_system_reader.h"
#include "support/letters.h"

#include <algorithm>
#include <span>
#include <unordered_map>

namespace ingester {

namespace {

using Variables_By_Name = std::unordered_map<std::string, std::size_t>;

Variables_By_Name By_Short_Name(const Spss_Dictionary& dictionary)
{
    Variables_By_Name found;
    for (std::size_t i = 0; i < dictionary.variables.size(); ++i)
        found.try_emplace(Name_Key(dictionary.variables[i].name), i);
    return found;
}

/// Hands the pairs of a list, as `NAME=value` with tabs between, to `take`.
template <class Take> void For_Pairs(std::string_view list, const Take& take)
{
    while (!list.empty()) {
        const std::size_t end = std::min(list.find('\t'), list.size());
        const std::string_view pair = list.substr(0, end);
        if (const std::size_t equals = pair.find('='); equals != std::string_view::npos)
            take(pair.substr(0, equals), pair.substr(equals + 1));
        list.remove_prefix(std::min(end + 1, list.size()));
    }
}

void Take_Long_Names(Spss_Dictionary& dictionary, std::string_view list)
{
    const Variables_By_Name by_name = By_Short_Name(dictionary);
    For_Pairs(list, [&](std::string_view name, std::string_view long_name) {
        const auto found = by_name.find(Name_Key(name));
        if (found != by_name.end())
            dictionary.variables[found->second].long_name = Without_Blanks(long_name, false);
    });
}

// --- For people: very long texts -------------------------------------------------------------------------

/// Whether the variables behind `first` are the pieces of a text of `width` bytes.
bool Has_Pieces(const Spss_Dictionary& dictionary, std::size_t first, std::size_t pieces)
{
    if (first + pieces > dictionary.variables.size())
        return false;
    for (std::size_t i = first; i < first + pieces; ++i)
        if (dictionary.variables[i].offset != dictionary.variables[first].offset + (i - first) * Piece_Stride
            || !dictionary.variables[i].Is_Text())
            return false;
    const Spss_Variable& last = dictionary.variables[first + pieces - 1];
    return last.text_width <= static_cast<std::int32_t>(Piece_Length);
}

/// Very long texts become one variable each; what their further pieces were called is of no interest.
void Join_Pieces(Spss_Dictionary& dictionary, std::string_view list)
{
    const Variables_By_Name by_name = By_Short_Name(dictionary);
    std::vector<bool> dropped(dictionary.variables.size());
    For_Pairs(list, [&](std::string_view name, std::string_view width_text) {
        const auto found = by_name.find(Name_Key(name));
        const long width = Leading_Integer(width_text);
        constexpr long longest = 32767;
        if (found == by_name.end() || width <= static_cast<long>(Piece_Length) || width > longest)
            return;
        const auto pieces = static_cast<std::size_t>((width + Bytes_Per_Segment - 1) / Bytes_Per_Segment);
        Spss_Variable& variable = dictionary.variables[found->second];
        if (!Has_Pieces(dictionary, found->second, pieces) || variable.in_pieces || dropped[found->second])
            return;
        variable.in_pieces = true;
        variable.text_width = static_cast<std::int32_t>(width);
        std::fill_n(dropped.begin() + static_cast<std::ptrdiff_t>(found->second) + 1, pieces - 1, true);
    });
    std::size_t next = 0;
    std::erase_if(dictionary.variables, [&](const Spss_Variable&) { return dropped[next++]; });
}

// --- For people: labels and missing values of texts -------------------------------------------------------

/// Walks through the bytes of an extension.
class Extension_Bytes {
public:
    Extension_Bytes(std::string_view bytes, std::endian order) : rest_(bytes), order_(order) {}

    [[nodiscard]] bool Is_Empty() const { return rest_.empty(); }
    template <class T> [[nodiscard]] bool Take(T& value)
    {
        if (rest_.size() < sizeof value)
            return false;
        value = Number_At<T>(rest_.data(), order_);
        rest_.remove_prefix(sizeof value);
        return true;
    }
    [[nodiscard]] bool Take_Text(std::int32_t length, std::string_view& text)
    {
        if (length < 0 || static_cast<std::size_t>(length) > rest_.size())
            return false;
        text = rest_.substr(0, static_cast<std::size_t>(length));
        rest_.remove_prefix(text.size());
        return true;
    }
    [[nodiscard]] bool Take_Counted(std::string_view& text)
    {
        std::int32_t length;
        return Take(length) && Take_Text(length, text);
    }

private:
    std::string_view rest_;
    std::endian order_;
};

/// These name variables by their long names.
Variables_By_Name By_Full_Name(const Spss_Dictionary& dictionary)
{
    Variables_By_Name found = By_Short_Name(dictionary);
    for (std::size_t i = 0; i < dictionary.variables.size(); ++i)
        found.insert_or_assign(Name_Key(dictionary.variables[i].Full_Name()), i);
    return found;
}

Spss_Variable* Find_Text(Spss_Dictionary& dictionary, const Variables_By_Name& by_name, std::string_view name)
{
    const auto found = by_name.find(Name_Key(name));
    Spss_Variable* const variable = found == by_name.end() ? nullptr : &dictionary.variables[found->second];
    return variable != nullptr && variable->Is_Text() ? variable : nullptr;
}

bool Take_Text_Labels(Extension_Bytes& bytes, Spss_Dictionary& dictionary, const Variables_By_Name& by_name)
{
    std::string_view name;
    std::int32_t width;
    std::int32_t count;
    if (!bytes.Take_Counted(name) || !bytes.Take(width) || !bytes.Take(count))
        return false;
    Label_Set set;
    for (std::int32_t i = 0; i < count; ++i) {
        std::string_view value;
        std::string_view label;
        if (!bytes.Take_Counted(value) || !bytes.Take_Counted(label))
            return false;
        set.Add(0, value, label);
    }
    if (Spss_Variable* const variable = Find_Text(dictionary, by_name, name); variable != nullptr) {
        variable->label_set = static_cast<std::int32_t>(dictionary.label_sets.size());
        dictionary.label_sets.push_back(std::move(set));
    }
    return true;
}

bool Take_Missing_Texts(Extension_Bytes& bytes, Spss_Dictionary& dictionary, const Variables_By_Name& by_name)
{
    std::string_view name;
    std::uint8_t count;
    std::int32_t width;
    if (!bytes.Take_Counted(name) || !bytes.Take(count) || !bytes.Take(width))
        return false;
    Spss_Variable* const variable = Find_Text(dictionary, by_name, name);
    for (std::uint8_t i = 0; i < count; ++i) {
        std::string_view text;
        if (!bytes.Take_Text(width, text))
            return false;
        if (variable != nullptr && variable->missing_texts.size() < Most_Missing_Values)
            variable->missing_texts.emplace_back(text);
    }
    return true;
}

template <class Take>
void Take_All(Spss_System_Reading& reading, std::int32_t extension, const Take& take_one)
{
    if (reading.extensions[extension].empty())
        return;
    Spss_Dictionary& dictionary = reading.common.dictionary;
    const Variables_By_Name by_name = By_Full_Name(dictionary);
    Extension_Bytes bytes(reading.extensions[extension], reading.source.order);
    while (!bytes.Is_Empty())
        if (!take_one(bytes, dictionary, by_name))
            break;
}

// --- For people: the code of letters ----------------------------------------------------------------------

Text_Code Told_Code(Spss_System_Reading& reading)
{
    const std::string& name = reading.extensions[code_extension];
    if (const Text_Code code = Find_Text_Code(Without_Blanks(name, true)); code != nullptr)
        return code;
    const std::string& numbers = reading.extensions[numbers_extension];
    const std::size_t at = sizeof(std::int32_t) * Code_Page_Place;
    if (numbers.size() < at + sizeof(std::int32_t))
        return nullptr;
    return Text_Code_Of_Page(Number_At<std::int32_t>(numbers.data() + at, reading.source.order));
}

/// Where nothing is told, the dictionary's texts are all that there is to judge by.
std::string Texts_Of(const Spss_Dictionary& dictionary)
{
    std::string texts;
    for (const Spss_Variable& variable : dictionary.variables)
        texts.append(variable.Full_Name()).append(" ").append(variable.label).append(" ");
    for (const Label_Set& set : dictionary.label_sets)
        for (const char* const label : set.labels)
            texts.append(Text_Arena::View(label)).append(" ");
    return texts;
}

void Tell_Weight(const Spss_System_Reading& reading)
{
    const std::int32_t slot = reading.head.weight_slot;
    if (slot < 1 || slot > std::ssize(reading.variable_of_slot))
        return;
    const std::int32_t variable = reading.variable_of_slot[static_cast<std::size_t>(slot - 1)];
    if (variable >= 0)
        Note_Loss(Loss_Kind::metadata_dropped,
                  reading.common.dictionary.variables[static_cast<std::size_t>(variable)].Full_Name(), 0,
                  "the variable is the weight of cases");
}

}  // namespace

bool Apply_Spss_Extensions(Spss_System_Reading& reading)
{
    Spss_Dictionary& dictionary = reading.common.dictionary;
    Take_Long_Names(dictionary, reading.extensions[long_names_extension]);
    Tell_Weight(reading);
    if (Texts_Are_Whole()) {
        Join_Pieces(dictionary, reading.extensions[very_long_texts_extension]);
        Take_All(reading, text_labels_extension, Take_Text_Labels);
        Take_All(reading, missing_texts_extension, Take_Missing_Texts);
    }
    if (!Letters_Are_Utf8() && Declared_Code() == nullptr)
        return true;
    const Text_Code told = Told_Code(reading);
    return reading.common.crossing.Open_Input(
        Code_Of_Input(told, told == nullptr ? Texts_Of(dictionary) : std::string()));
}

}  // namespace ingester
