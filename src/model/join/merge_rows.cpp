#include "model/join/merge_rows.h"

#include <cstddef>
#include <utility>

namespace ingester {

namespace {

/// Walks both Sheets in the order of their keys.
class Key_Walk {
public:
    Key_Walk(const Merge_Request& wanted, const Merge_Keys& keys)
        : wanted_(wanted), keys_(keys), target_order_(Sorted_Rows(keys.target, true, wanted.ignore_case)),
          source_order_(Sorted_Rows(keys.source, true, wanted.ignore_case)),
          partners_(target_order_.size(), -1), copies_(target_order_.size())
    {
        while (source_ < source_order_.size())
            Step();
    }

    /// The rows of the target with their copies, then those of other keys.
    [[nodiscard]] std::vector<Merged_Row> Result() const
    {
        std::vector<Merged_Row> rows;
        rows.reserve(partners_.size() + copied_ + added_.size());
        for (std::size_t row = 0; row < partners_.size(); ++row) {
            rows.push_back({Merged_Row::Kind::kept, partners_[row]});
            for (std::uint32_t i = 0; i < copies_[row].count; ++i)
                rows.push_back({Merged_Row::Kind::copied, Source_Row(copies_[row].first + i)});
        }
        for (const std::int32_t row : added_)
            rows.push_back({Merged_Row::Kind::added, row});
        return rows;
    }

private:
    /// A run in the order of the source.
    struct Run {
        std::uint32_t first = 0;
        std::uint32_t count = 0;
    };

    [[nodiscard]] std::int32_t Source_Row(std::size_t at) const
    {
        return static_cast<std::int32_t>(source_order_[at]);
    }

    static void Bring_Near(const std::vector<Sort_Key>& keys, const std::vector<std::uint32_t>& order,
                           std::size_t at)
    {
        const std::size_t soon = at + Sort_Key::ahead;
        if (soon + Sort_Key::ahead < order.size())
            for (const Sort_Key& key : keys)
                key.Prefetch(order[soon], order[soon + Sort_Key::ahead]);
    }

    void Step()
    {
        Bring_Near(keys_.target, target_order_, target_);
        Bring_Near(keys_.source, source_order_, source_);
        switch (Compare()) {
        case Key_Order::first_ended:
        case Key_Order::above:
            if (wanted_.fill_mode >= fill_all)
                added_.push_back(Source_Row(source_));
            ++source_;
            break;
        case Key_Order::below:
            ++target_;
            break;
        default:
            Join();
        }
    }

    [[nodiscard]] Key_Order Compare() const
    {
        if (target_ >= target_order_.size())
            return Key_Order::first_ended;
        return Compare_Key_Rows(keys_.target, keys_.source, target_order_[target_], source_order_[source_],
                                wanted_.tolerance, wanted_.ignore_case);
    }

    /// Rows of one key meet one by one. When those of the target are at their end, the rest of the source
    /// makes copies of the last; when those of the source are, its last one goes on.
    void Join()
    {
        partners_[target_order_[target_]] = Source_Row(source_);
        const bool more_target = Is_Same(keys_.target, target_order_, target_);
        const bool more_source = Is_Same(keys_.source, source_order_, source_);
        if (more_source && !more_target)
            Join_Copies();
        if (more_source || !more_target)
            ++source_;
        ++target_;
    }

    void Join_Copies()
    {
        Run run{static_cast<std::uint32_t>(source_ + 1), 0};
        for (; Is_Same(keys_.source, source_order_, source_); ++source_)
            ++run.count;
        if (wanted_.fill_mode < fill_copies)
            return;
        copies_[target_order_[target_]] = run;
        copied_ += run.count;
    }

    /// Whether the next row of a Sheet has the same key.
    [[nodiscard]] bool Is_Same(const std::vector<Sort_Key>& keys, const std::vector<std::uint32_t>& order,
                               std::size_t at) const
    {
        return at + 1 < order.size()
               && Compare_Key_Rows(keys, keys, order[at], order[at + 1], wanted_.tolerance,
                                   wanted_.ignore_case)
                      == Key_Order::equal;
    }

    const Merge_Request& wanted_;
    const Merge_Keys& keys_;
    std::vector<std::uint32_t> target_order_;
    std::vector<std::uint32_t> source_order_;
    std::vector<std::int32_t> partners_;  ///< by row of the target
    std::vector<Run> copies_;             ///< the same
    std::vector<std::int32_t> added_;
    std::size_t copied_ = 0;
    std::size_t target_ = 0;
    std::size_t source_ = 0;
};

}  // namespace

std::vector<Merged_Row> Plan_Merged_Rows(const Merge_Request& wanted, const Merge_Keys& keys)
{
    return Key_Walk(wanted, keys).Result();
}

}  // namespace ingester
