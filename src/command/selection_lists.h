// The columns and rows that the user chooses, as the list files that a request takes.
#pragma once

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace ingester {

struct Chosen_Data {
    std::vector<std::string> keep;    ///< names, or numbers and ranges of numbers
    std::vector<std::string> drop;    ///< names
    std::vector<std::string> rename;  ///< "old=new"
    std::vector<std::string> type;    ///< "name=factor"
    std::string rows_file;            ///< of numbers and ranges, one a line
};

void Offer_Choices(CLI::App& app, Chosen_Data& chosen);

/// The lists of a request, ready to be written; what is empty isn't asked for.
struct Choice_Lists {
    std::string columns;  ///< for the secondary file
    std::string rows;
    std::string changes;  ///< for the list beside the input
};

/// Makes the lists. What is wrong is told in `fault`, and then they are empty.
[[nodiscard]] Choice_Lists Make_Lists(const Chosen_Data& chosen, std::string& fault);

}  // namespace ingester
