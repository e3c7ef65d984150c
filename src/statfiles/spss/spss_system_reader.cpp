// The head of a system file, and its cases.
#include "statfiles/spss/spss_system_reader.h"

#include "request/messages.h"
#include "request/people_rules.h"
#include "request/request.h"
#include "statfiles/spss/coded_cases.h"
#include "statfiles/spss/spss.h"
#include "support/progress.h"

#include <algorithm>
#include <limits>

namespace ingester {

namespace {

bool Read_Magic(Spss_System_Reading& reading)
{
    std::string magic;
    if (!reading.source.Read_Bytes(Spss_Magic_Length, Spss_Magic_Length, magic))
        return false;
    reading.packed = magic == Spss_Packed_Magic && For_People(People_Rule::further_types);
    return reading.packed || magic == Spss_Magic;
}

bool Read_Product(Spss_System_Reading& reading)
{
    std::string product;
    if (!reading.source.Read_Bytes(Spss_Product_Length, Spss_Product_Length, product))
        return false;
    if (!product.starts_with(Spss_Product))
        Fail("Warning: %s may not be in standard SPSS windows format.\n",
             reading.source.File().Name().c_str());
    return true;
}

constexpr std::int32_t Usual_Layout = 2;
constexpr std::int32_t Unusual_Layout = 3;

/// The layout code tells the byte order as well.
bool Read_Layout(Spss_System_Reading& reading)
{
    Field_Source& source = reading.source;
    std::uint8_t bytes[sizeof(std::int32_t)];
    if (!source.Read_Numbers(std::span(bytes)))
        return false;
    for (const std::endian order : {std::endian::little, std::endian::big}) {
        source.order = order;
        const auto layout = Number_At<std::int32_t>(bytes, order);
        if (layout == Unusual_Layout)
            Fail("Warning: %s is not in standard SPSS windows format.\n", source.File().Name().c_str());
        if (layout == Usual_Layout || layout == Unusual_Layout)
            return true;
    }
    return false;
}

bool Read_Head(Spss_System_Reading& reading)
{
    Spss_Head& head = reading.head;
    return Read_Magic(reading) && Read_Product(reading) && Read_Layout(reading)
           && reading.source.Read_Record(head, Spss_Head_Fields) && head.cases != 0 && head.slots >= 1
           && reading.source.Skip(Spss_Head_Rest);
}

std::int64_t Claimed_Cases(const Spss_Head& head)
{
    return head.cases < 0 ? std::numeric_limits<std::int64_t>::max() : head.cases;
}

bool Read_Plain_Cases(Spss_System_Reading& reading, Row_Filler& filler)
{
    Input_File& file = reading.source.File();
    const std::int64_t left = file.Size() - file.Position();
    filler.Expect(std::min(Claimed_Cases(reading.head), left / static_cast<std::int64_t>(filler.Row_Size())));
    return Fill_From_File(filler, file, file.Size(), Claimed_Cases(reading.head));
}

bool Decode_Cases(Case_Decoder& decoder, Row_Filler& filler, std::int64_t most, const Input_File& file)
{
    const std::size_t slots = filler.Row_Size() / Slot_Size;
    std::vector<std::byte> block(filler.Row_Size() * filler.Rows_Per_Block());
    for (bool ended = false; !ended && most > 0;) {
        std::size_t count = 0;
        while (!ended && count < filler.Rows_Per_Block() && most > 0) {
            ended = decoder.Read_Compressed_Case(block.data() + count * filler.Row_Size(), slots) <= 0;
            count += ended ? 0 : 1;
            most -= ended ? 0 : 1;
        }
        if (!filler.Take(block.data(), count))
            return false;
        Show_Progress("Reading", file.Position(), file.Size());
    }
    return !file.Failed();
}

/// Packed cases tell behind the dictionary where their blocks end.
bool Read_Packed_Head(Spss_System_Reading& reading, std::int64_t& end)
{
    std::int64_t head_place;
    std::int64_t tail_length;
    return reading.source.Read(head_place, end, tail_length) && end >= reading.source.Position();
}

/// What follows a damaged block can't be unpacked.
void Tell_Damage(const Case_Bytes& bytes)
{
    if (bytes.Is_Damaged())
        request.losses.Note_Unread("cases behind a damaged block");
}

bool Read_Coded_Cases(Spss_System_Reading& reading, Row_Filler& filler)
{
    Input_File& file = reading.source.File();
    std::int64_t packed_end = -1;
    if (reading.packed && reading.head.compression == packed_cases && !Read_Packed_Head(reading, packed_end))
        return false;
    const std::int64_t left = file.Size() - file.Position();
    filler.Expect(std::min(Claimed_Cases(reading.head),
                           left / static_cast<std::int64_t>(filler.Row_Size() / Slot_Size)));
    Case_Bytes bytes(file, packed_end);
    Case_Decoder decoder(bytes, reading.head.bias, reading.source.order);
    const bool read = Decode_Cases(decoder, filler, Claimed_Cases(reading.head), file);
    Tell_Damage(bytes);
    return read;
}

/// A file that was cut short holds fewer cases than its head says.
void Tell_Lacking_Cases(const Spss_Head& head, std::int64_t rows)
{
    if (head.cases > rows)
        request.losses.Note_Unread("cases that its head counts and it doesn't hold", head.cases - rows);
}

bool Read_Cases(Spss_System_Reading& reading)
{
    constexpr std::int64_t most_in_packed_byte = 32;
    Spss_Reading& common = reading.common;
    Row_Filler filler(*common.sheet, common.dictionary.case_size,
                      Plan_Of_Cases(common, Fill_Doubles(reading.source.order)), Texts_Of_Cases(common),
                      reading.source.File().Size() * (reading.packed ? most_in_packed_byte : 1));
    const bool plain = reading.head.compression == plain_cases;
    const bool read = plain ? Read_Plain_Cases(reading, filler) : Read_Coded_Cases(reading, filler);
    if (!read || !filler.Finish())
        return false;
    Tell_Lacking_Cases(reading.head, filler.Rows());
    filler.Held().Report(Greater_Numbers_Were_Set);
    return true;
}

}  // namespace

bool Read_Spss_System(Input_File& file)
{
    Spss_System_Reading reading{.source = Field_Source(file)};
    if (!Read_Head(reading) || !Read_Spss_Records(reading) || !Apply_Spss_Extensions(reading)
        || !Make_Spss_Columns(reading.common) || !Read_Cases(reading))
        return file.Failed() && Fail_To_Read(file.Name());  // silent by design: the pipeline tells
    Label_Spss_Columns(reading.common);
    Current_Sheet = reading.common.sheet;
    return true;
}

bool Read_Spss_System_File(const char* file_name)
{
    Input_File file;
    return file.Open(file_name) && Read_Spss_System(file);  // silent by design
}

}  // namespace ingester
