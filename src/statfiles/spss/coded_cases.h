// Cases of system files whose values are told by control bytes, and what such cases are read from.
#pragma once

#include "platform/files.h"
#include "platform/inflater.h"

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace ingester {

/// The bytes of coded cases as they come from a file, or out of its packed blocks.
class Case_Bytes {
public:
    /// `packed_end` is where packed blocks end; below 0: the bytes aren't packed.
    Case_Bytes(Input_File& file, std::int64_t packed_end) : file_(&file), packed_end_(packed_end) {}

    /// The next eight bytes; null where there are no more.
    [[nodiscard]] const std::byte* Next_Eight()
    {
        if (end_ - at_ < eight && !Fill()) [[unlikely]]
            return nullptr;
        at_ += eight;
        return buffer_.data() + at_ - eight;
    }

    /// Whether packed blocks ended where they could not be unpacked.
    [[nodiscard]] bool Is_Damaged() const { return inflater_.Is_Damaged(); }

private:
    static constexpr std::size_t eight = 8;
    [[nodiscard]] bool Fill();

    Input_File* file_;
    std::int64_t packed_end_;
    Inflater inflater_;
    std::vector<std::byte> buffer_;
    std::size_t at_ = 0;
    std::size_t end_ = 0;
};

/// Decodes cases one by one: what is left of a block of control bytes belongs to the next case.
class Case_Decoder {
public:
    Case_Decoder(Case_Bytes& bytes, double bias, std::endian order);

    /// Puts the next case, of `slots` slots, into `buffer`, in the file's order. Its bytes; 0 where the file
    /// ended before any value of it, -1 where it ended amid it.
    [[nodiscard]] std::int64_t Read_Compressed_Case(std::byte* buffer, std::size_t slots);

private:
    Case_Bytes* bytes_;
    std::array<std::array<std::byte, 8>, 256> values_;  ///< by control byte
    std::array<std::uint8_t, 8> controls_{};
    std::size_t next_ = 8;
    bool ended_ = false;
};

}  // namespace ingester
