// The levels of a Factor that many numbers or texts name.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <string_view>
#include <utility>
#include <vector>

namespace ingester {

/// Finds what `Nearest_Level` and a text that is put into a cell find by looking through all levels. The
/// levels are sorted for the first that asks, and must stay as they are from then on.
class Level_Finder {
public:
    void Look_In(const Column& factor) { factor_ = &factor; }

    /// The level whose value is nearest, or 0. Where distances are equal only by rounding, the nearer value
    /// may be a later one than `Nearest_Level` takes.
    [[nodiscard]] std::int32_t Nearest(double value);

    /// The value, or the label, of a level that was found; not a number, or no text, for 0.
    [[nodiscard]] double Value_Of(std::int32_t level) const;
    [[nodiscard]] std::string_view Label_Of(std::int32_t level) const;

    /// The level with that label, or else, in this order, one with it but for the case, one whose label
    /// begins so, one that does but for the case, and the only one whose label shares most of its start;
    /// or 0. The first, where there are more. No text is asked for twice: there may be many labels that
    /// begin with it.
    [[nodiscard]] std::int32_t Of_Label(std::string_view text);

    /// The level with just that label, or 0.
    [[nodiscard]] std::int32_t Of_Exact_Label(std::string_view text);

private:
    struct Label {
        std::string_view text;
        std::int32_t level;
    };
    void Sort_Values();
    void Sort_Labels();
    [[nodiscard]] std::int32_t Sharing_Most_Of_Its_Start(std::string_view text) const;

    const Column* factor_ = nullptr;
    std::vector<double> values_;                                ///< by level
    std::vector<std::string_view> labels_;                      ///< the same
    std::vector<std::pair<double, std::int32_t>> near_values_;  ///< sorted
    std::vector<Label> exact_;                                  ///< by their bytes
    std::vector<Label> case_free_;                              ///< by their letters in lower case
};

}  // namespace ingester
