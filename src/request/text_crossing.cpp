#include "request/text_crossing.h"

#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"

#include <string>

namespace ingester {

Text_Code Declared_Code()
{
    return Find_Text_Code(request.Input_Encoding);
}

Text_Code Code_Of_Input(Text_Code told, std::string_view bytes)
{
    if (const Text_Code declared = Declared_Code(); declared != nullptr)
        return declared;
    return told != nullptr ? told : Code_Of_Bytes(bytes, nullptr);
}

bool Open_Converter(Text_Converter& converter, Text_Code from, Text_Code to)
{
    const Text_Code foreign = from == Code_Of_Letters() ? to : from;
    return converter.Open(from, to)
           || Fail("Error: Text of the encoding %s can't be converted on this system.\n",
                   std::string(foreign->name).c_str());
}

bool Text_Crossing::Open(Text_Code from, Text_Code to)
{
    if (!Open_Converter(converter_, from, to))
        return false;
    const Text_Code foreign = from == Code_Of_Letters() ? to : from;
    // A few codes of one byte a letter have other letters in the place of ASCII, a few shift between letters.
    constexpr std::string_view probe = "Az09,;~";
    passes_ascii_ = foreign->kind != Code_Kind::system && converter_.Convert(probe) == probe;
    static_cast<void>(converter_.Take_Losses());
    return true;
}

/// Bytes of UTF-8 that come in may be malformed; of one byte a letter any will do.
bool Text_Crossing::Open_Input(Text_Code code)
{
    comes_in_ = true;
    passes_ = code == Code_Of_Letters() && code->kind == Code_Kind::one_byte;
    return passes_ || Open(code, Code_Of_Letters());
}

bool Text_Crossing::Open_Output(Text_Code code)
{
    comes_in_ = false;
    passes_ = code == Code_Of_Letters();
    return passes_ || Open(Code_Of_Letters(), code);
}

std::string_view Text_Crossing::Converted(std::string_view text)
{
    const std::string_view converted = converter_.Convert(text);
    if (const std::int64_t losses = converter_.Take_Losses(); losses > 0)
        Note_Loss(Loss_Kind::letter_replaced, column_, row_, comes_in_ ? converted : text, losses);
    return converted;
}

}  // namespace ingester
