#include "request/input_facts.h"

#include "request/request.h"

#include <algorithm>

namespace ingester {

void Note_Input_Fact(std::string_view name, std::string_view value)
{
    const auto found = std::ranges::find(request.input_facts, name, &Input_Facts::value_type::first);
    if (found != request.input_facts.end())
        found->second = value;
    else
        request.input_facts.emplace_back(name, value);
}

}  // namespace ingester
