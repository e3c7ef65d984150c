#include "hostfiles/shared/host_text.h"

#include "support/letters.h"

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

Host_Text_Out::Host_Text_Out()
{
    static_cast<void>(Open_Output(Windows_1252_Code()));  // between these codes there is always a way
}

std::string As_Held_By_Host(std::string_view text)
{
    std::string held(Sure_Converter(Code_Of_Letters(), Windows_1252_Code()).Convert(text));
    Take_From_Host(held);
    return held;
}

}  // namespace ingester
