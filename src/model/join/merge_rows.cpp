#include "model/join/merge_rows.h"

#include <cstddef>
#include <utility>

namespace ingester {

namespace {

/// The rows of one Sheet in the order of their keys, and where a walk through them stands.
struct Sorted_Side {
    Sorted_Side(const std::vector<Sort_Key>& its_keys, bool ignore_case)
        : keys(its_keys), order(Sorted_Rows(its_keys, true, ignore_case, &parted_by))
    {}

    [[nodiscard]] bool Ended() const { return at >= order.size(); }
    [[nodiscard]] std::uint32_t Row() const { return order[at]; }

    /// Keys are far apart in memory when they are looked at in their order.
    void Bring_Near() const
    {
        const std::size_t soon = at + Sort_Key::ahead;
        if (soon + Sort_Key::ahead < order.size())
            for (const Sort_Key& key : keys)
                key.Prefetch(order[soon], order[soon + Sort_Key::ahead]);
    }

    const std::vector<Sort_Key>& keys;
    std::vector<std::uint8_t> parted_by;  ///< see `Sorted_Rows`
    std::vector<std::uint32_t> order;
    std::size_t at = 0;
};

/// Walks both Sheets in the order of their keys.
class Key_Walk {
public:
    Key_Walk(const Merge_Request& wanted, const Merge_Keys& keys)
        : wanted_(wanted), key_count_(keys.target.size()), exact_(!(wanted.tolerance > 0.0)),
          target_(keys.target, wanted.ignore_case), source_(keys.source, wanted.ignore_case),
          partners_(target_.order.size(), -1), copies_(target_.order.size())
    {
        Compare_From(0);
        while (!source_.Ended())
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
        return static_cast<std::int32_t>(source_.order[at]);
    }

    void Step()
    {
        switch (standing_) {
        case Key_Order::first_ended:
        case Key_Order::above:
            if (wanted_.fill_mode >= fill_all)
                added_.push_back(Source_Row(source_.at));
            Go_On(source_, Key_Order::below);
            break;
        case Key_Order::below:
            Go_On(target_, Key_Order::above);
            break;
        default:
            Join();
        }
    }

    /// Compares the rows that the walk has come to. Keys before `key` are known to be equal.
    void Compare_From(std::size_t key)
    {
        shared_keys_ = key;
        if (target_.Ended() || source_.Ended())
            standing_ = Key_Order::first_ended;
        else
            standing_ = Compare_Key_Rows(target_.keys, source_.keys, target_.Row(), source_.Row(),
                                         wanted_.tolerance, wanted_.ignore_case, shared_keys_);
    }

    /// To the next row of one side. What parted it from the row before mostly tells where it stands to the
    /// row of the other side, without a look at the keys: `beyond`, where it leaves a key that both had.
    void Go_On(Sorted_Side& side, Key_Order beyond)
    {
        ++side.at;
        side.Bring_Near();
        if (!exact_ || side.Ended() || standing_ == Key_Order::first_ended) {
            Compare_From(0);
            return;
        }
        const std::size_t parted_by = side.parted_by[side.at];
        if (parted_by == shared_keys_) {
            Compare_From(parted_by);
        } else if (parted_by < shared_keys_) {
            shared_keys_ = parted_by;
            standing_ = beyond;
        }
    }

    /// Rows of one key meet one by one. When those of the target are at their end, the rest of the source
    /// makes copies of the last; when those of the source are, its last one goes on.
    void Join()
    {
        partners_[target_.Row()] = Source_Row(source_.at);
        const bool more_target = Next_Is_Same(target_);
        const bool more_source = Next_Is_Same(source_);
        if (more_source && !more_target)
            Join_Copies();
        if (more_source || !more_target)
            Go_On(source_, Key_Order::below);
        Go_On(target_, Key_Order::above);
    }

    void Join_Copies()
    {
        Run run{static_cast<std::uint32_t>(source_.at + 1), 0};
        for (; Next_Is_Same(source_); ++source_.at)
            ++run.count;
        if (wanted_.fill_mode < fill_copies)
            return;
        copies_[target_.Row()] = run;
        copied_ += run.count;
    }

    /// Whether the next row of a Sheet has the same key.
    [[nodiscard]] bool Next_Is_Same(const Sorted_Side& side) const
    {
        const std::size_t next = side.at + 1;
        if (next >= side.order.size())
            return false;
        std::size_t key = 0;
        return exact_ ? side.parted_by[next] == key_count_
                      : Compare_Key_Rows(side.keys, side.keys, side.Row(), side.order[next],
                                         wanted_.tolerance, wanted_.ignore_case, key)
                            == Key_Order::equal;
    }

    const Merge_Request& wanted_;
    std::size_t key_count_;
    bool exact_;  ///< equal keys are so to the bit
    Sorted_Side target_;
    Sorted_Side source_;
    std::vector<std::int32_t> partners_;  ///< by row of the target
    std::vector<Run> copies_;             ///< the same
    std::vector<std::int32_t> added_;
    std::size_t copied_ = 0;
    Key_Order standing_ = Key_Order::equal;  ///< of the target's row to the source's
    std::size_t shared_keys_ = 0;            ///< leading keys that are equal in both
};

}  // namespace

std::vector<Merged_Row> Plan_Merged_Rows(const Merge_Request& wanted, const Merge_Keys& keys)
{
    return Key_Walk(wanted, keys).Result();
}

}  // namespace ingester
