// The code of a text that is read.
#include "platform/text_codes.h"
#include "request/messages.h"
#include "request/request.h"
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

/// The text of an image in the code of all letters takes its place.
bool Convert_Image(std::string_view text, Text_Code from, const std::string& name, File_Image& image)
{
    Text_Converter converter;
    if (!converter.Open(from, Code_Of_Letters()))
        return Fail("Error: Text of the encoding %s can't be converted on this system.\n",
                    std::string(from->name).c_str());
    if (!image.Replace(converter.Convert(text)))
        return Fail_To_Read(name);
    Note_Replaced(converter);
    return true;
}

}  // namespace

bool Declared_Code(Text_Code& code)
{
    code = Find_Text_Code(request.Input_Encoding);
    return code != nullptr || request.Input_Encoding.empty()
           || Fail("Error: The encoding %s is not known.\n", request.Input_Encoding.c_str());
}

bool Settle_Code(const std::string& name, File_Image& image, Text_Code_State& state)
{
    Text_Code declared;
    if (!Declared_Code(declared))
        return false;
    state = {};
    if (declared == nullptr && !Letters_Are_Utf8())
        return true;
    const std::string_view bytes(image.Bytes(), image.Size());
    std::size_t mark_length;
    const Text_Code marked = Code_Of_Mark(bytes, mark_length);
    if (declared != nullptr && marked != declared)
        mark_length = 0;
    const Text_Code code = declared != nullptr ? declared : marked;
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
    Text_Code code;
    if (!Declared_Code(code))
        return false;
    Text_Converter converter;
    code = Code_Of_Bytes(line, code);
    if (!converter.Open(code, Code_Of_Letters()))
        return Fail("Error: Text of the encoding %s can't be converted on this system.\n",
                    std::string(code->name).c_str());
    line = std::string(converter.Convert(line));
    Note_Replaced(converter);
    return true;
}

}  // namespace ingester
