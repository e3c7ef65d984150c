#include "request/request.h"

namespace ingester {

Request_Globals request;

Settings& Get_Settings()
{
    return request.settings;
}

}  // namespace ingester
