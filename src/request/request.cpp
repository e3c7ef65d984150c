#include "request/request.h"

#include "support/letters.h"

namespace ingester {

Request_Globals request;

bool For_People(People_Rule rule)
{
    return request.people.test(static_cast<std::size_t>(rule));
}

void Use_Utf8_Text(bool on)
{
    request.people.set(static_cast<std::size_t>(People_Rule::utf8_text), on);
    letter_code = on ? Letter_Code::utf_8 : Letter_Code::windows_1252;
}

Settings& Get_Settings()
{
    return request.settings;
}

}  // namespace ingester
