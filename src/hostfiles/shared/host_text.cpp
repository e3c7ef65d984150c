#include "hostfiles/shared/host_text.h"

#include "request/losses.h"

namespace ingester {

std::string_view From_Host(std::string_view bytes, std::string& room)
{
    if (!Letters_Are_Utf8() || Is_Ascii(bytes))
        return bytes;
    static thread_local Text_Converter converter = Sure_Converter(Windows_1252_Code(), Utf_8_Code());
    room = converter.Convert(bytes);
    return room;
}

void Take_From_Host(std::string& text)
{
    static_cast<void>(From_Host(text, text));
}

std::string_view Host_Text_Out::Converted(std::string_view text)
{
    const std::string_view converted = converter_.Convert(text);
    if (const std::int64_t losses = converter_.Take_Losses(); losses > 0)
        Note_Loss(Loss_Kind::letter_replaced, column_, row_, text, losses);
    return converted;
}

std::string As_Held_By_Host(std::string_view text)
{
    std::string held(Sure_Converter(Code_Of_Letters(), Windows_1252_Code()).Convert(text));
    Take_From_Host(held);
    return held;
}

}  // namespace ingester
