// Between what the user types and the strings of a request: which names a request can carry, what
// options ask for, and messages told in the user's own names.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

/// One file of a request, by both its names.
struct Sent_Name {
    std::string native;   ///< as the user knows it
    std::string request;  ///< as the request carries it
};

/// Why a request can't carry `native` as the name of a file, and what to do; empty when it can.
[[nodiscard]] std::string Fault_Of_Name(std::string_view native);

/// The output options ask for an addition to the output, so an existing one is what they expect.
[[nodiscard]] bool Options_Add_To_Output(std::string_view options);

/// The output options ask for a table that is joined with the one in an existing output.
[[nodiscard]] bool Options_Join_With_Output(std::string_view options);

/// The output options ask for lines that hold so many fields, in the place of a table; 0 when they don't.
[[nodiscard]] std::int32_t Options_Rewrite_Lines(std::string_view options);

/// The output options give a name to a sheet although the result keeps that of the sheet it is joined with.
[[nodiscard]] bool Options_Name_Joined_Sheet(std::string_view options);

/// The input options keep a range of columns.
[[nodiscard]] bool Options_Keep_Columns(std::string_view options);

/// The input options ask for a summary on standard output.
[[nodiscard]] bool Options_Print_Summary(std::string_view options);

/// The file into which the input options have losses written; empty for none.
[[nodiscard]] std::string Report_Of_Options(std::string_view options);

/// `message` with the request form of both names turned into the native one: in full, cut short as
/// messages cut long names, without extension, or the folder alone. All else stays.
[[nodiscard]] std::string With_Native_Names(std::string_view message, const Sent_Name& input,
                                            const Sent_Name& output);

}  // namespace ingester
