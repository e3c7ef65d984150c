#include "interface/paths.h"

#include "support/text.h"

#include <algorithm>
#include <iterator>

namespace ingester {

namespace {

constexpr std::string_view Url_Starts[] = {"ftp:", "http:", "https:", "file:"};

}  // namespace

bool Is_Url(std::string_view name)
{
    return std::any_of(std::begin(Url_Starts), std::end(Url_Starts),
                       [name](std::string_view start) { return Starts_Ignoring_Case(name, start); });
}

bool Fetch_Url(std::string& name, std::string_view, std::string&, bool& downloaded)
{
    downloaded = false;
    return !Is_Url(name);
}

}  // namespace ingester
