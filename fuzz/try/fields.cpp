// The source of typed fields: the first bytes of an input say what is read, and how, from the rest.
#include "function.h"
#include "platform/field_source.h"

#include <algorithm>
#include <iterator>
#include <span>
#include <string>
#include <tuple>
#include <vector>

namespace ingester {

namespace {

constexpr std::size_t Head_Size = 16;
constexpr std::size_t Most_Kept = 1000;

struct Record {
    std::int8_t small = 0;
    std::uint16_t half = 0;
    std::int64_t word = 0;
    float real = 0;
};
constexpr std::tuple Record_Fields{&Record::half, &Record::small, &Record::real, &Record::word};

template <class Number> bool Take_Number(Field_Source& source)
{
    const std::int64_t before = source.Position();
    Number number;
    const bool good = source.Read(number);
    Must(!good || source.Position() == before + std::int64_t{sizeof number}, "a number has another size");
    return good;
}

template <class Length> bool Take_Text(Field_Source& source)
{
    std::string text;
    const bool good = source.Read_Text<Length>(Most_Kept, text);
    Must(text.size() <= Most_Kept, "more is kept than was asked");
    return good;
}

/// A list whose length the file tells.
bool Take_Numbers(Field_Source& source)
{
    std::int32_t count;
    if (!source.Read_Count(count))
        return false;
    const std::int64_t possible = source.Possible(count, sizeof(double));
    Must(possible * std::int64_t{sizeof(double)} <= source.File().Size() - source.Position(),
         "more numbers than the file has");
    std::vector<double> numbers(static_cast<std::size_t>(possible));
    return source.Read_Numbers(std::span(numbers));
}

bool Take_Place(Field_Source& source)
{
    std::int64_t place;
    if (!source.Read(place))
        return false;
    const bool good = source.Seek(place);
    Must(good == (place >= 0 && place <= source.File().Size()), "a position is taken for another");
    return good;
}

bool Pass_Over(Field_Source& source)
{
    std::int64_t count;
    if (!source.Read(count))
        return false;
    const std::int64_t before = source.Position();
    const bool good = source.Skip(count);
    Must(!good || source.Position() == before + std::max<std::int64_t>(count, 0), "a skip goes elsewhere");
    return good;
}

bool Take_Record(Field_Source& source)
{
    Record record;
    return source.Read_Record(record, Record_Fields);
}

constexpr bool (*Steps[])(Field_Source& source) = {
    Take_Number<std::int8_t>,
    Take_Number<std::uint16_t>,
    Take_Number<std::int32_t>,
    Take_Number<float>,
    Take_Number<double>,
    Take_Text<std::uint8_t>,
    Take_Text<std::int16_t>,
    Take_Text<std::int32_t>,
    Take_Text<std::int64_t>,
    Take_Numbers,
    Take_Place,
    Pass_Over,
    Take_Record,
};

/// The head: the order, and the steps, from the first again until one fails or all have come twice.
void Try_Fields(std::span<const std::byte> head, std::span<const std::byte> bytes)
{
    Input_File file(bytes);
    Field_Source source(file, head[0] == std::byte{'B'} ? std::endian::big : std::endian::little);
    for (std::size_t turn = 0; turn < 2 * (Head_Size - 1); ++turn) {
        const auto choice = std::to_integer<std::size_t>(head[1 + turn % (Head_Size - 1)]);
        const bool good = Steps[choice % std::size(Steps)](source);
        Must(source.Position() >= 0 && source.Position() <= file.Size(), "a position outside the file");
        if (!good)
            return;
    }
    Must(!source.Ended(), "all was there, and the file ended");
}

}  // namespace

/// The head: the order, and the first step; the text begins with the others.
void Try_Function(std::string_view head, std::string_view text)
{
    const std::string whole = std::string(head).append(text);
    const auto bytes = std::as_bytes(std::span(whole));
    if (bytes.size() >= Head_Size)
        Try_Fields(bytes.first(Head_Size), bytes.subspan(Head_Size));
}

}  // namespace ingester
