#include "hostfiles/tbk/book_source.h"

#include "request/messages.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace ingester {

Book_Source::Book_Source(Input_File& file, Book_Walker walker, std::string_view shown)
    : file_(&file), walker_(walker), shown_(shown),
      block_(std::make_unique_for_overwrite<std::byte[]>(Bytes_At_Once))
{}

bool Book_Source::Read_Head()
{
    std::array<std::byte, Book_Head_Size> head;
    const std::byte* const mark = head.data() + Book_Magic.size();
    const bool complete = file_->Read_Exactly(head.data(), head.size());
    if (complete && Number_At<std::uint16_t>(mark) != Order_Mark)
        order_ = std::endian::big;
    if (!complete || std::memcmp(head.data(), Book_Magic.data(), Book_Magic.size()) != 0
        || Number_At<std::uint16_t>(mark, order_) != Order_Mark)
        return walker_ != Book_Walker::lister && Fail("%s is not a valid Tabulon Book.\n", shown_.c_str());
    sections_ = Number_At<std::uint16_t>(mark + sizeof(std::uint16_t), order_);
    return true;
}

bool Book_Source::Next_Record()
{
    if (!Skip_Rest())
        return false;
    const std::int64_t offset = file_->Position();
    std::byte head[Record_Head_Size];
    if (!file_->Read_Exactly(head, sizeof head))
        return Short_Read();
    const auto length = Number_At<std::int32_t>(head + sizeof(std::uint16_t), order_);
    record_ = {offset, length, record_.number + 1, Number_At<std::int16_t>(head, order_)};
    unread_ = std::max(length, 0);
    return (record_.type > 0 && length >= 0) || Corrupt();
}

bool Book_Source::Jump(std::int64_t offset)
{
    unread_ = 0;
    next_ = end_ = 0;
    return file_->Seek(offset) || Short_Read();
}

bool Book_Source::Skip_Rest()
{
    next_ = end_ = 0;
    if (unread_ == 0)
        return true;
    const std::int64_t behind = file_->Position() + unread_;
    if (behind > file_->Size())
        return Short_Read();
    if (unread_ <= static_cast<std::int64_t>(Bytes_At_Once)) {
        const auto count = static_cast<std::size_t>(unread_);
        unread_ = 0;
        return file_->Read_Exactly(block_.get(), count) || Short_Read();
    }
    unread_ = 0;
    return file_->Seek(behind) || Short_Read();
}

bool Book_Source::Copy_Rest(Output_File& target)
{
    target.Write(block_.get() + next_, end_ - next_);
    next_ = end_ = 0;
    const std::int64_t count = std::exchange(unread_, 0);
    return target.Copy_From(*file_, count) || (!target.Failed() && Short_Read());
}

bool Book_Source::Refill(std::size_t count)
{
    const std::size_t held = end_ - next_;
    std::memmove(block_.get(), block_.get() + next_, held);
    const auto more =
        static_cast<std::size_t>(std::min(unread_, static_cast<std::int64_t>(Bytes_At_Once - held)));
    const std::size_t got = file_->Read(block_.get() + held, more);
    unread_ -= static_cast<std::int64_t>(got);
    next_ = 0;
    end_ = held + got;
    return end_ >= count || Short_Read();
}

const std::byte* Book_Source::Take(std::size_t count)
{
    if (static_cast<std::int64_t>(count) > Left()) {
        Corrupt();
        return nullptr;
    }
    if (count > end_ - next_ && !Refill(count))
        return nullptr;
    const std::byte* const bytes = block_.get() + next_;
    next_ += count;
    return bytes;
}

bool Book_Source::Read_Bytes(std::int64_t length, std::size_t kept, std::string& text)
{
    text.clear();
    if (length > Left())
        return Corrupt();
    auto wanted = static_cast<std::size_t>(std::min(length, static_cast<std::int64_t>(kept)));
    const std::int64_t beyond = length - static_cast<std::int64_t>(wanted);
    while (wanted > 0) {
        const std::size_t part = std::min(wanted, Bytes_At_Once);
        const std::byte* const bytes = Take(part);
        if (bytes == nullptr)
            return false;
        text.append(reinterpret_cast<const char*>(bytes), part);
        wanted -= part;
    }
    return Skip(beyond);
}

bool Book_Source::Skip(std::int64_t count)
{
    while (count > 0) {
        const std::int64_t part = std::min(count, static_cast<std::int64_t>(Bytes_At_Once));
        if (Take(static_cast<std::size_t>(part)) == nullptr)
            return false;
        count -= part;
    }
    return true;
}

std::int32_t Book_Source::Read_Short_Text(std::string* text, std::size_t limit)
{
    std::uint8_t length;
    std::string passed_over;
    return Read(length)
                   && Read_Letters(length, text == nullptr ? 0 : limit, text == nullptr ? passed_over : *text)
               ? length
               : -1;
}

bool Book_Source::Read_Long_Text(std::string& text, std::size_t limit)
{
    std::int32_t length;
    return Read(length) && (length >= 0 || Corrupt()) && Read_Letters(length, limit, text);
}

bool Book_Source::Corrupt(const char* fault)
{
    const auto length = static_cast<long>(record_.length);
    const auto offset = static_cast<unsigned long>(record_.offset);
    if (walker_ == Book_Walker::updater)
        return Fail("Corrupt record found in Tabulon Book:\n%s at Offset %lX\nat Record Number %li, Type %i, "
                    "Length %li.\n",
                    shown_.c_str(), offset, record_.number, record_.type, length);
    if (walker_ == Book_Walker::reader && fault == nullptr)
        return Fail("Corrupt record found in Tabulon Book:\n%s at Offset %lX\nat Record Number %li, Type %i, "
                    "Length %li\n",
                    shown_.c_str(), offset, record_.number, record_.type, length);
    if (walker_ == Book_Walker::reader)
        return Fail("Corrupt record found in Tabulon Book:\n%s at Offset %lX\nat Record Number %li, Type %i, "
                    "Length %li\nFault: %s.\n",
                    shown_.c_str(), offset, record_.number, record_.type, length, fault);
    return false;
}

bool Book_Source::Short_Read()
{
    return walker_ != Book_Walker::lister
           && Fail("End of File found too soon in %s\nTabulon Book file is incomplete\nLast read record at "
                   "Offset %lX, Record Number %li, Type %i, Length %li.\n",
                   shown_.c_str(), static_cast<unsigned long>(record_.offset), record_.number, record_.type,
                   static_cast<long>(record_.length));
}

bool Book_Source::Peek_Page_Name(std::int64_t offset, std::string& name)
{
    constexpr std::size_t name_at = Record_Head_Size + Sheet_Facts_Size + 1;
    std::array<std::byte, name_at + Short_Text_Width> bytes;
    if (offset < 0 || !file_->Seek(offset))
        return false;
    const std::size_t got = file_->Read_Head(bytes.data(), bytes.size());
    if (got < name_at || Number_At<std::uint16_t>(bytes.data(), order_) != sheet_start_record
        || Number_At<std::int32_t>(bytes.data() + sizeof(std::uint16_t), order_)
               < static_cast<std::int32_t>(Sheet_Facts_Size + 1))
        return false;
    const auto length = std::to_integer<std::size_t>(bytes[name_at - 1]);
    if (got < name_at + length)
        return false;
    name.assign(reinterpret_cast<const char*>(bytes.data() + name_at), std::min(length, Page_Name_Width));
    Take_From_Host(name);
    return true;
}

}  // namespace ingester
