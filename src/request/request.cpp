#include "request/request.h"

namespace ingester {

Request_Globals request;

bool For_People(People_Rule rule)
{
    return request.people.test(static_cast<std::size_t>(rule));
}

Settings& Get_Settings()
{
    return request.settings;
}

}  // namespace ingester
