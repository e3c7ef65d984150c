#include "support/edit_distance.h"

#include <algorithm>
#include <numeric>
#include <utility>
#include <vector>

namespace ingester {

std::size_t Edit_Distance(std::string_view a, std::string_view b)
{
    std::vector<std::size_t> costs(b.size() + 1);
    std::iota(costs.begin(), costs.end(), 0);
    for (std::size_t i = 1; i <= a.size(); ++i) {
        std::size_t diagonal = std::exchange(costs[0], i);
        for (std::size_t j = 1; j <= b.size(); ++j) {
            const std::size_t changed = diagonal + (a[i - 1] == b[j - 1] ? 0 : 1);
            diagonal = std::exchange(costs[j], std::min({changed, costs[j] + 1, costs[j - 1] + 1}));
        }
    }
    return costs.back();
}

}  // namespace ingester
