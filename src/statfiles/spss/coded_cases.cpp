#include "statfiles/spss/coded_cases.h"

#include "statfiles/spss/spss_system_format.h"
#include "support/byte_fields.h"

#include <cstring>

namespace ingester {

namespace {

constexpr std::size_t Buffer_Size = std::size_t{1} << 17;

template <class T> void Put_In_Order(std::byte* bytes, T value, std::endian order)
{
    if (order == std::endian::little)
        Put_Number<T, std::endian::little>(bytes, value);
    else
        Put_Number<T, std::endian::big>(bytes, value);
}

}  // namespace

bool Case_Bytes::Fill()
{
    buffer_.resize(Buffer_Size);
    const std::size_t kept = end_ - at_;
    std::memmove(buffer_.data(), buffer_.data() + at_, kept);
    at_ = 0;
    end_ = kept;
    std::byte* const target = buffer_.data() + kept;
    const std::size_t room = buffer_.size() - kept;
    end_ += packed_end_ < 0 ? file_->Read(target, room) : inflater_.Read(*file_, packed_end_, target, room);
    return end_ >= eight;
}

Case_Decoder::Case_Decoder(Case_Bytes& bytes, double bias, std::endian order) : bytes_(&bytes)
{
    for (std::size_t code = 1; code <= last_number; ++code)
        Put_In_Order(values_[code].data(), static_cast<double>(code) - bias, order);
    values_[eight_blanks].fill(std::byte{' '});
    Put_In_Order(values_[system_missing].data(), System_Missing_Bits, order);
}

std::int64_t Case_Decoder::Read_Compressed_Case(std::byte* buffer, std::size_t slots)
{
    std::size_t taken = 0;
    while (taken < slots && !ended_) {
        if (next_ == Controls_Per_Block) {
            const std::byte* const block = bytes_->Next_Eight();
            ended_ = block == nullptr;
            if (ended_)
                break;
            std::memcpy(controls_.data(), block, Controls_Per_Block);
            next_ = 0;
        }
        const std::uint8_t code = controls_[next_++];
        if (code == passed_over)
            continue;
        ended_ = code == end_of_cases;
        const std::byte* const value = code == literal_follows ? bytes_->Next_Eight() : values_[code].data();
        if (ended_ || value == nullptr) {
            ended_ = true;
            break;
        }
        std::memcpy(buffer + Slot_Size * taken++, value, Slot_Size);
    }
    if (taken == slots)
        return static_cast<std::int64_t>(Slot_Size * slots);
    return taken == 0 ? 0 : -1;
}

}  // namespace ingester
