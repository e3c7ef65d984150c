#include "interface/format_drivers.h"

#include "interface/formats/host_formats.h"
#include "interface/formats/science_formats.h"
#include "interface/formats/spreadsheet_formats.h"
#include "interface/formats/statfiles_formats.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace ingester {

namespace {

/// The rows of all families, by code; rows of one code stay in their order.
template <std::size_t... Sizes> consteval auto Join(const Format_Driver (&... families)[Sizes])
{
    std::array<Format_Driver, (Sizes + ...)> all{};
    auto* end = all.begin();
    ((end = std::ranges::copy(families, end).out), ...);
    for (auto* row = all.begin(); row != all.end(); ++row)  // a stable sort that a compiler can run
        for (auto* place = row; place != all.begin() && place->code < (place - 1)->code; --place)
            std::swap(*place, *(place - 1));
    return all;
}

constexpr auto Format_Drivers = Join(Host_Formats, Spreadsheet_Formats, Statfiles_Formats, Science_Formats);

consteval bool Adders_Replace_As_Well()
{
    return std::ranges::all_of(Format_Drivers, [](const Format_Driver& driver) {
        return (driver.add == nullptr) == (driver.replace == nullptr);
    });
}

static_assert(Adders_Replace_As_Well());

/// Of outputs whose extension says nothing.
constexpr const Format_Driver& Fixed_Width_Text =
    *std::ranges::find_if(Format_Drivers, [](const Format_Driver& driver) {
        return driver.code == text_file && driver.extensions.empty();
    });

}  // namespace

std::span<const Format_Driver> All_Formats()
{
    return Format_Drivers;
}

const Format_Driver& Output_Driver_Of(std::string_view file_name)
{
    const bool further = For_People(People_Rule::further_endings);
    if (further)
        file_name = Name_Inside_Packing(file_name);
    for (const Format_Driver& driver : Format_Drivers)
        if (Ends_With_One_Of(file_name, driver.extensions)
            || (further && Ends_With_One_Of(file_name, driver.people_extensions)))
            return driver;
    return Fixed_Width_Text;
}

const Format_Driver* Driver_Of_Code(std::int32_t code)
{
    const auto* const found = std::ranges::find(Format_Drivers, code, &Format_Driver::code);
    return found == std::end(Format_Drivers) ? nullptr : found;
}

bool Is_Fixed_Width_Text(const Format_Driver& driver)
{
    return &driver == &Fixed_Width_Text;
}

std::optional<std::vector<std::string>> List_Sheet_Names(const std::string& file_name)
{
    constexpr std::size_t most_names = 4096;
    const std::int32_t type = Detect_File_Type(file_name);
    if (type == compressed_file && Detect_Compressed_File_Type(file_name) == book_file) {
        const Scratch_File scratch(Decompressed_Name(file_name));
        return Decompress_To(scratch.Name(), file_name.c_str()) ? Read_Page_Names(scratch.Name().c_str())
                                                                : std::nullopt;
    }
    if (type == unreadable_file)
        return std::nullopt;
    const Format_Driver* const driver = Driver_Of_Code(type);
    if (driver == nullptr || driver->sheet_names == nullptr)
        return std::vector<std::string>{};
    auto names = driver->sheet_names(file_name.c_str());
    if (names)
        names->resize(std::min(names->size(), most_names));
    return names;
}

bool Read_Data_File(const std::string& file_name, std::int32_t type, std::string_view source_name)
{
    request.Content_Code = type;
    request.Current_File_Name = request.Source_Url.empty() ? source_name : request.Source_Url.view();
    const Format_Driver* const driver = Driver_Of_Code(type);
    return driver != nullptr && driver->read != nullptr && driver->read(file_name.c_str(), type);
}

bool Is_Host_File(std::int32_t type)
{
    return type == spreadsheet_file || type == book_file;
}

bool A_Host_File_Was_Read()
{
    return Is_Host_File(request.Content_Code);
}

}  // namespace ingester
