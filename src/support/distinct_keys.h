// Distinct keys, numbered in the order in which they come.
#pragma once

#include "support/letters.h"

#include <array>
#include <bit>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>
#include <utility>
#include <vector>

namespace ingester {

/// Mixes two words into one, each bit of which hangs on all of theirs.
[[nodiscard]] inline std::uint64_t Mix_Words(std::uint64_t a, std::uint64_t b)
{
    __extension__ using Wide = unsigned __int128;
    const Wide product = static_cast<Wide>(a ^ 0x9E3779B97F4A7C15U) * (b ^ 0xD1B54A32D192ED03U);
    return static_cast<std::uint64_t>(product) ^ static_cast<std::uint64_t>(product >> 64);
}

/// Numbers that are equal as numbers are: both zeros are one.
struct Number_Keys {
    static void Prefetch(double) {}
    [[nodiscard]] static bool Equal(double a, double b) { return a == b; }
    [[nodiscard]] static std::uint64_t Hash(double key, std::uint64_t seed)
    {
        return Mix_Words(std::bit_cast<std::uint64_t>(key + 0.0), seed);
    }
};

/// Texts equal byte for byte.
struct Exact_Keys {
    static void Prefetch(std::string_view key) { __builtin_prefetch(key.data()); }
    [[nodiscard]] static bool Equal(std::string_view a, std::string_view b) { return a == b; }
    [[nodiscard]] static std::uint64_t Hash(std::string_view key, std::uint64_t seed)
    {
        seed ^= key.size();
        std::uint64_t word = 0;
        for (; key.size() > sizeof word; key.remove_prefix(sizeof word)) {
            std::memcpy(&word, key.data(), sizeof word);
            seed = Mix_Words(word, seed);
        }
        word = 0;
        std::memcpy(&word, key.data(), key.size());
        return Mix_Words(word, seed);
    }
};

/// Texts equal but for the case of their letters.
struct Case_Free_Keys {
    static void Prefetch(std::string_view key) { __builtin_prefetch(key.data()); }
    [[nodiscard]] static bool Equal(std::string_view a, std::string_view b) { return Equal_Folded(a, b); }
    [[nodiscard]] static std::uint64_t Hash(std::string_view key, std::uint64_t seed)
    {
        std::uint64_t word = 0;
        std::size_t size = 0;
        For_Folded_Bytes(key, [&](char c) {
            word = word << 8 | static_cast<unsigned char>(c);
            if (++size % sizeof word == 0)
                seed = Mix_Words(word, seed);
        });
        return Mix_Words(word, seed ^ size);
    }
};

/// An open-addressing table. Keys hash with a seed of each table's own, so that no file can be made
/// whose keys all collide. Views must stay valid as long as the table. Throws std::bad_alloc.
template <class Key, class Rules> class Distinct_Keys {
public:
    Distinct_Keys() : slots_(first_slots) {}

    /// Keys that are looked up in one go.
    static constexpr std::size_t batch = 16;

    /// Gives each of `count` keys, a batch at most, its number, from 1; keys not met before get the
    /// next ones.
    void Number_Keys_Of(const Key* keys, std::size_t count, std::uint32_t* numbers)
    {
        std::array<std::uint32_t, batch> hashes;
        for (std::size_t i = 0; i < count; ++i)
            hashes[i] = static_cast<std::uint32_t>(Rules::Hash(keys[i], seed_) >> 32);
        if (slots_.size() > near_slots)
            Bring_Near(hashes.data(), count);
        for (std::size_t i = 0; i < count; ++i)
            numbers[i] = Number_Of(keys[i], hashes[i]);
    }

    [[nodiscard]] const std::vector<Key>& Keys() const { return keys_; }

    /// Ends the table.
    [[nodiscard]] std::vector<Key> Take_Keys() { return std::move(keys_); }

private:
    struct Slot {
        std::uint32_t hash = 0;
        std::uint32_t number = 0;  ///< 0: free
    };
    static constexpr std::size_t first_slots = 128;
    static constexpr std::size_t near_slots = 4096;  ///< of a table that stays in a near cache

    [[nodiscard]] static std::uint64_t New_Seed(const void* table)
    {
        const auto now = std::chrono::steady_clock::now().time_since_epoch().count();
        return Mix_Words(static_cast<std::uint64_t>(now), std::bit_cast<std::uintptr_t>(table));
    }

    /// In a large table each step of a look-up waits for memory, so all of a batch take it together.
    void Bring_Near(const std::uint32_t* hashes, std::size_t count) const
    {
        for (std::size_t i = 0; i < count; ++i)
            __builtin_prefetch(&slots_[Home_Of(hashes[i])]);
        for (std::size_t i = 0; i < count; ++i)
            if (const std::uint32_t number = slots_[Home_Of(hashes[i])].number; number != 0)
                __builtin_prefetch(&keys_[number - 1]);
        for (std::size_t i = 0; i < count; ++i)
            if (const std::uint32_t number = slots_[Home_Of(hashes[i])].number; number != 0)
                Rules::Prefetch(keys_[number - 1]);
    }

    [[nodiscard]] std::size_t Home_Of(std::uint32_t hash) const { return hash & (slots_.size() - 1); }

    [[nodiscard]] std::uint32_t Number_Of(const Key& key, std::uint32_t hash)
    {
        for (std::size_t at = Home_Of(hash);; at = Home_Of(static_cast<std::uint32_t>(at + 1))) {
            const Slot& slot = slots_[at];
            if (slot.number == 0)
                return Add(key, hash, at);
            if (slot.hash == hash && Rules::Equal(keys_[slot.number - 1], key))
                return slot.number;
        }
    }

    std::uint32_t Add(const Key& key, std::uint32_t hash, std::size_t at)
    {
        keys_.push_back(key);
        const auto number = static_cast<std::uint32_t>(keys_.size());
        slots_[at] = {hash, number};
        if (2 * keys_.size() > slots_.size())
            Grow();
        return number;
    }

    void Grow()
    {
        std::vector<Slot> grown(2 * slots_.size());
        const std::size_t mask = grown.size() - 1;
        for (const Slot& slot : slots_) {
            if (slot.number == 0)
                continue;
            std::size_t at = slot.hash & mask;
            while (grown[at].number != 0)
                at = (at + 1) & mask;
            grown[at] = slot;
        }
        slots_ = std::move(grown);
    }

    std::uint64_t seed_ = New_Seed(this);
    std::vector<Slot> slots_;
    std::vector<Key> keys_;
};

}  // namespace ingester
