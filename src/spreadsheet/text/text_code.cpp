// The code of a text that is read.
#include "request/losses.h"
#include "request/messages.h"
#include "request/people_rules.h"
#include "request/text_crossing.h"
#include "spreadsheet/text/text_format.h"
#include "support/letters.h"

#include <utility>

namespace ingester {

namespace {

void Note_Replaced(Text_Converter& converter)
{
    if (const std::int64_t losses = converter.Take_Losses(); losses > 0)
        Note_Loss(Loss_Kind::letter_replaced, {}, 0, "malformed text", losses);
}

/// Whether two codes are one but for the order of their bytes.
bool Differ_In_Order(Code_Kind a, Code_Kind b)
{
    const auto are = [&](Code_Kind little, Code_Kind big) {
        return (a == little && b == big) || (a == big && b == little);
    };
    return are(Code_Kind::utf_16_little, Code_Kind::utf_16_big)
           || are(Code_Kind::utf_32_little, Code_Kind::utf_32_big);
}

/// The text of an image in the code of all letters takes its place.
bool Convert_Image(std::string_view text, Text_Code from, const std::string& name, File_Image& image)
{
    Text_Converter converter;
    if (!Open_Converter(converter, from, Code_Of_Letters()))
        return false;
    if (!image.Replace(converter.Convert(text)))
        return Fail_To_Read(name);
    Note_Replaced(converter);
    return true;
}

}  // namespace

bool Settle_Code(const std::string& name, File_Image& image, Text_Code_State& state)
{
    const Text_Code declared = Declared_Code();
    state = {};
    if (declared == nullptr && !Letters_Are_Utf8())
        return true;
    const std::string_view bytes(image.Bytes(), image.Size());
    std::size_t mark_length;
    const Text_Code marked = Code_Of_Mark(bytes, mark_length);
    // A text in UTF-16 or UTF-32 says by its mark which order its bytes have: the other reads as no letter.
    const bool of_both_orders =
        declared != nullptr && marked != nullptr && Differ_In_Order(declared->kind, marked->kind);
    if (declared != nullptr && marked != declared && !of_both_orders)
        mark_length = 0;
    const Text_Code code = declared != nullptr && !of_both_orders ? declared : marked;
    if (const Text_Code pattern = Code_Of_Pattern(bytes);
        code == nullptr && pattern != nullptr && For_People(People_Rule::sniffed_texts))
        return Convert_Image(bytes, state.code = pattern, name, image);
    state.code = code != nullptr ? code : Utf_8_Code();
    if (code != nullptr && (code != Utf_8_Code() || !Letters_Are_Utf8()))
        return Convert_Image(bytes.substr(mark_length), code, name, image);
    state.head = mark_length;
    state.watched = true;
    state.otherwise = code == nullptr ? Windows_1252_Code() : code;
    return true;
}

bool Convert_Malformed(const std::string& name, const Text_Code_State& state, File_Image& image,
                       Text_Buffer& buffer)
{
    if (!Convert_Image(buffer.Text(), state.otherwise, name, image))
        return false;
    buffer.first = image.Bytes();
    buffer.last = image.Bytes() + image.Size();
    buffer.watched = false;
    return true;
}

bool Take_Line_Into_Code(std::string& line)
{
    Text_Crossing texts;
    if (!texts.Open_Input(Code_Of_Input(nullptr, line)))
        return false;
    line = std::string(texts.Cross(line));
    return true;
}

}  // namespace ingester
