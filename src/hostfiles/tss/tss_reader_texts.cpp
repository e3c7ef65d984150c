// The records of texts: commands, titles, names.
#include "hostfiles/tss/tss_reader_extras.h"
#include "request/messages.h"

#include <algorithm>
#include <string>

namespace ingester {

namespace {

struct Block_Messages {
    const char* too_many;
    const char* corrupt;
};

/// Counted texts into a block of `bytes`, a NUL behind each, and how many there were. Empty texts take no
/// room where they stand; where the block has some left, they come to its end.
bool Read_Text_Block(TSS_Source& source, std::int32_t bytes, std::string& block, std::int32_t& count,
                     const Block_Messages& messages)
{
    const auto size = static_cast<std::size_t>(bytes);
    std::int32_t stated;
    std::size_t empty_texts = 0;
    std::string text;
    if (!source.Read(stated))
        return false;
    for (count = 0; count < stated; ++count) {
        std::int32_t length;
        if (block.size() >= size)
            return Fail(messages.too_many);
        if (!source.Read(length))
            return false;
        if (length < 0 || block.size() + static_cast<std::size_t>(length) > size)
            return Fail(messages.corrupt);
        if (!source.Read_Bytes(length, size, text))
            return false;
        if (length > 0)
            block.append(text).push_back('\0');
        else
            ++empty_texts;
    }
    block.resize(std::max(block.size(), std::min(size, block.size() + empty_texts)));
    Take_From_Host(block);
    return true;
}

/// A block with its size in front; nothing else where that is 0.
bool Read_Commands(TSS_Source& source, std::string& block, std::int32_t& count, const char* bad_size,
                   const Block_Messages& messages)
{
    std::int32_t bytes;
    if (!source.Read(bytes))
        return false;
    if (bytes < 0 || bytes > Greatest_Text_Block)
        return Fail(bad_size);
    return bytes == 0 || Read_Text_Block(source, bytes, block, count, messages);
}

bool Read_Dummy_Name(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::int32_t length;
    std::string name;
    if (!reading.source.Read_Count(length) || !reading.source.Read_Letters(length, Name_Width + 1, name))
        return false;
    if (name.empty())
        return true;
    const bool marked = name.front() == '-';
    sheet.analysis_dummy_plain = marked ? 0 : 1;
    if (marked)
        name.erase(0, 1);
    if (length - (marked ? 1 : 0) > static_cast<std::int32_t>(Name_Width))
        Report_Message("Analysis dummy name truncated in reading TSS File.\n");
    if (!name.empty())
        sheet.analysis_dummy = Valid_Name_Of_No_Column(First_Letters(name, Name_Width));
    return true;
}

}  // namespace

bool Read_Analysis(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    return Read_Commands(reading.source, sheet.analysis_setup, sheet.analysis_setup_count,
                         "Invalid analysis setup length in TSS File.\n",
                         {"Analysis setup commands longer than specified length in TSS File.\n",
                          "Corrupt Analysis command in TSS file.\n"})
           && Read_Dummy_Name(reading)
           && Read_Commands(reading.source, sheet.analysis_commands, sheet.analysis_command_count,
                            "Invalid analysis command length in TSS File.\n",
                            {"Analysis commands longer than specified length in TSS File.\n",
                             "Corrupt Analysis command in TSS file\n"});
}

bool Read_Title(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::int32_t bytes;
    if (!reading.source.Read(bytes))
        return false;
    if (bytes > Greatest_Text_Block)
        return Fail("Invalid title length in TSS file.\n");
    const bool good = bytes <= 0
                      || Read_Text_Block(reading.source, bytes, sheet.title_lines, sheet.title_line_count,
                                         {"Title lines longer than specified length in TSS file.\n",
                                          "Corrupt Description in TSS file.\n"});
    sheet.title_bytes = static_cast<std::int32_t>(sheet.title_lines.size());
    sheet.title_cleared = 0;
    return good;
}

bool Read_Page_Name(TSS_Reading& reading)
{
    std::string name;
    if (!reading.source.Read_Text(decltype(Sheet::sheet_name)::width, name))
        return Fail("Spreadsheet Read Error: Invalid Sheet pagename.\n");
    reading.sheet->sheet_name = name;
    return true;
}

namespace {

bool Read_Pointer_Members(TSS_Source& source, Host_Pointer& pointer)
{
    std::int32_t count;
    if (!source.Read(count))
        return false;
    if (count < 0)
        return Fail("Bad pointer object in TSS file.\n");
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t length;
        if (!source.Read(length))
            return false;
        if (length < 0)
            return Fail("Bad pointer object in TSS file.\n");
        if (!source.Read_Letters(length, Name_Width, pointer.members.emplace_back()))
            return false;
    }
    return true;
}

}  // namespace

bool Read_Pointers(TSS_Reading& reading)
{
    constexpr std::int32_t greatest_kind = 7;
    TSS_Source& source = reading.source;
    std::int32_t count;
    if (!source.Read(count))
        return false;
    if (count < 0)
        return Fail("Bad pointer object in TSS file.\n");
    for (std::int32_t i = 0; i < count; ++i) {
        Host_Pointer pointer;
        std::int32_t length;
        if (!source.Read(pointer.kind))
            return false;
        if (pointer.kind < 0 || pointer.kind > greatest_kind)
            return Fail("Bad pointer object in TSS file.\n");
        if (!source.Read(length))
            return false;
        if (length < 0)
            return Fail("Bad pointer object in TSS file.\n");
        if (!source.Read_Letters(length, Name_Width, pointer.name)
            || (pointer.kind == 0 && !Read_Pointer_Members(source, pointer)))
            return false;
        reading.sheet->pointers.push_back(std::move(pointer));
    }
    return true;
}

}  // namespace ingester
