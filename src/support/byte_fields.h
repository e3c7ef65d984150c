// Numbers in the bytes of files: typed fields at stated offsets, whatever this machine's order.
#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <span>
#include <type_traits>

namespace ingester {

namespace detail {

template <std::size_t Size> struct Word_Of_Size;
template <> struct Word_Of_Size<1> {
    using type = std::uint8_t;
};
template <> struct Word_Of_Size<2> {
    using type = std::uint16_t;
};
template <> struct Word_Of_Size<4> {
    using type = std::uint32_t;
};
template <> struct Word_Of_Size<8> {
    using type = std::uint64_t;
};

template <class Word> [[nodiscard]] constexpr Word Reverse_Bytes(Word word)
{
    Word reversed = 0;
    for (std::size_t i = 0; i < sizeof(Word); ++i) {
        reversed = static_cast<Word>((reversed << 4 << 4) | (word & 0xFF));
        word = static_cast<Word>(word >> 4 >> 4);
    }
    return reversed;
}

}  // namespace detail

/// The number of type `T` (integer or IEEE floating point) that `bytes` hold in `order`.
template <class T, std::endian order = std::endian::little>
[[nodiscard]] inline T Number_At(const void* bytes)
{
    typename detail::Word_Of_Size<sizeof(T)>::type word;
    std::memcpy(&word, bytes, sizeof word);
    if constexpr (order != std::endian::native)
        word = detail::Reverse_Bytes(word);
    return std::bit_cast<T>(word);
}

/// Puts `value` into `bytes` in `order`.
template <class T, std::endian order = std::endian::little> inline void Put_Number(void* bytes, T value)
{
    auto word = std::bit_cast<typename detail::Word_Of_Size<sizeof(T)>::type>(value);
    if constexpr (order != std::endian::native)
        word = detail::Reverse_Bytes(word);
    std::memcpy(bytes, &word, sizeof word);
}

/// The same in an order that is known only when the file is read.
template <class T> [[nodiscard]] inline T Number_At(const void* bytes, std::endian order)
{
    return order == std::endian::little ? Number_At<T, std::endian::little>(bytes)
                                        : Number_At<T, std::endian::big>(bytes);
}

/// Turns numbers that were read as they stand from `order` into this machine's.
template <class T> void Turn_Native(std::span<T> numbers, std::endian order)
{
    if (order != std::endian::native)
        for (T& number : numbers)
            number = Number_At<T>(&number, order);
}

/// A number at a fixed offset of a record. Layouts are structs of these, shared by reader and writer.
template <class T, std::endian order> struct Byte_Field {
    std::size_t offset;

    [[nodiscard]] constexpr std::size_t End() const { return offset + sizeof(T); }
    [[nodiscard]] T Get(std::span<const std::byte> record) const
    {
        return Number_At<T, order>(record.subspan(offset, sizeof(T)).data());
    }
    void Put(std::span<std::byte> record, T value) const
    {
        Put_Number<T, order>(record.subspan(offset, sizeof(T)).data(), value);
    }
};

template <class T> using Little_Field = Byte_Field<T, std::endian::little>;
template <class T> using Big_Field = Byte_Field<T, std::endian::big>;

}  // namespace ingester
