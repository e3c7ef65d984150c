// One row of the table of formats: all that the pipeline needs to know of a format.
#pragma once

#include "model/sheet.h"
#include "request/request.h"

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// Readers leave their Sheet in `Current_Sheet`; false after a message. Formats that share a reader are told
/// apart by their code.
using Reader = bool (*)(const char* file_name, std::int32_t code);
using Writer = bool (*)(Sheet* sheet, const char* file_name);
/// Writes a new file of several Sheets.
using Sheets_Writer = bool (*)(std::span<Sheet* const> sheets, const char* file_name);
/// Puts a Sheet into a file that is there, or in the place of its sheet `page`. False after a message, and
/// the file is as it was.
using Sheet_Adder = bool (*)(Sheet* sheet, const char* file_name);
using Sheet_Replacer = bool (*)(Sheet* sheet, const char* file_name, std::string_view page);
/// The names of a file's sheets, in order; nothing for a file that can't be understood.
using Sheet_Lister = std::optional<std::vector<std::string>> (*)(const char* file_name);

/// What an output takes for the name of a column.
enum class Held_Names : std::uint8_t {
    valid,            ///< a name that the host holds valid
    free_for_people,  ///< any text; but for hosts names are made valid
    free,             ///< any text; for hosts too, where no marks are asked for behind names
};

/// One format. Detection gives inputs their code, the extension gives it to outputs. A format that this
/// build knows by name only has neither `read` nor `write`.
struct Format_Driver {
    std::int32_t code = 0;
    std::string_view name = {};

    // As an input.
    Reader read = nullptr;
    std::string_view options = {};       ///< keys of input options that its reader acts on, of those that
                                         ///< most readers don't; with blanks between them
    Sheet_Lister sheet_names = nullptr;  ///< of formats that hold several sheets
    bool lists_sheets = false;           ///< the reader makes the list of sheets that a request asks for

    // As an output.
    std::string_view extensions = {};            ///< with blanks between them
    std::string_view people_extensions = {};     ///< those that only people mean by them
    std::string_view clipboard_extensions = {};  ///< of "clipboard.EXTENSION"
    Writer write = nullptr;
    std::string_view instead = {};  ///< of formats that people ask for and that can't be written: what can
    Sheets_Writer write_sheets = nullptr;
    Sheet_Adder add = nullptr;  ///< of formats that can be added to; `replace` comes with it
    Sheet_Replacer replace = nullptr;
    Held_Names names = Held_Names::valid;
    bool unique_names = false;  ///< columns are told by their names
    std::int32_t max_columns = Default_Max_Columns;
};

/// A reader that its format's code doesn't matter to.
template <bool (*Read)(const char* file_name)> bool Any_Code(const char* file_name, std::int32_t /*code*/)
{
    return Read(file_name);
}

}  // namespace ingester
