// A system that refuses one thing that is asked of it, or ends the process there.
#pragma once

#include "platform/refusals.h"

#include <initializer_list>
#include <optional>

namespace ingester {

/// Which of the things asked is refused.
struct Refusal {
    int number = 0;                           ///< from 1; 0 for none
    std::initializer_list<Asked> kinds = {};  ///< that are counted; all of them when there are none
    bool onwards = false;                     ///< those behind it are refused as well
    bool kills = false;                       ///< the process ends in the place of the refusal
};

/// From here to the end of its life the system refuses, and its clock stands still. One at a time.
class Refusing {
public:
    explicit Refusing(const Refusal& refusal);
    Refusing(const Refusing&) = delete;
    Refusing& operator=(const Refusing&) = delete;
    ~Refusing() { refusal_hook = nullptr; }

    /// How many things were asked.
    [[nodiscard]] static int Count() { return count_; }
    /// What was refused first.
    [[nodiscard]] static std::optional<Asked> Refused() { return refused_; }

private:
    [[nodiscard]] static bool Is_Allowed(Asked what);

    static inline Refusal refusal_;
    static inline unsigned kinds_ = 0;  ///< a bit for each that is counted
    static inline int count_ = 0;
    static inline std::optional<Asked> refused_;
};

/// Memory blocks that were taken with `new` and not given back.
[[nodiscard]] long Living_Blocks();

}  // namespace ingester
