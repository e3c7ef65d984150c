// Storage for the texts of cells: many short strings, few allocations.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <string_view>
#include <vector>

namespace ingester {

/// Keeps texts, each behind a 16-bit length and in front of a NUL, in growing chunks.
/// A stored text never changes and never moves, so cells with equal texts may share one: the arena
/// remembers the texts stored of late, which makes a column of repeated labels cost its nodes only.
class Text_Arena {
public:
    static constexpr std::size_t greatest_length = 65535;

    /// The empty text, of every arena.
    [[nodiscard]] static const char* Empty() { return empty_record.data() + prefix_size; }

    /// `text`, cut at `greatest_length`, as a stored text. Throws std::bad_alloc.
    [[nodiscard]] const char* Store(std::string_view text)
    {
        if (text.empty())
            return Empty();
        text = text.substr(0, greatest_length);
        if (recent_ == nullptr)
            recent_ = std::make_unique<Recent_Texts>();
        const char*& remembered = (*recent_)[Slot_Of(text)];
        if (remembered != nullptr && View(remembered) == text)
            return remembered;
        remembered = Append(text);
        return remembered;
    }

    /// A text that `Store` returned.
    [[nodiscard]] static std::string_view View(const char* stored)
    {
        std::uint16_t length;
        std::memcpy(&length, stored - prefix_size, sizeof length);
        return {stored, length};
    }

private:
    static constexpr std::size_t prefix_size = sizeof(std::uint16_t);
    static constexpr std::size_t first_chunk = 128;
    static constexpr std::size_t greatest_chunk = 1 << 20;
    static constexpr std::array<char, prefix_size + 1> empty_record{};

    [[nodiscard]] static std::size_t Slot_Of(std::string_view text)
    {
        std::uint32_t word = 0;
        std::memcpy(&word, text.data(), text.size() < sizeof word ? text.size() : sizeof word);
        const auto last = static_cast<std::uint8_t>(text.back());
        const auto middle = static_cast<std::uint8_t>(text[text.size() / 2]);
        const std::uint32_t mixed =
            (word + 31U * last + 977U * middle + static_cast<std::uint32_t>(text.size())) * 2654435769U;
        return mixed >> 26;
    }

    [[nodiscard]] const char* Append(std::string_view text)
    {
        const std::size_t needed = prefix_size + text.size() + 1;
        if (needed > room_)
            Add_Chunk(needed);
        char* const record = free_;
        const auto length = static_cast<std::uint16_t>(text.size());
        std::memcpy(record, &length, sizeof length);
        std::memcpy(record + prefix_size, text.data(), text.size());
        record[prefix_size + text.size()] = '\0';
        free_ += needed;
        room_ -= needed;
        return record + prefix_size;
    }

    void Add_Chunk(std::size_t needed);

    using Recent_Texts = std::array<const char*, 64>;
    std::unique_ptr<Recent_Texts> recent_;  // made by the first text: most columns hold numbers
    std::vector<std::unique_ptr<char[]>> chunks_;
    char* free_ = nullptr;
    std::size_t room_ = 0;
    std::size_t next_chunk_ = first_chunk;
};

}  // namespace ingester
