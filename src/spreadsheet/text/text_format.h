// What the rooms of the text reader share: the memory image, the options of a scan, the fields.
#pragma once

#include "model/sheet.h"
#include "platform/files.h"
#include "support/fixed_text.h"

#include <array>
#include <cstdint>
#include <limits>
#include <memory>
#include <string_view>
#include <vector>

namespace ingester {

/// Longest line, or joined record, in characters.
constexpr std::size_t Greatest_Line = 262140;

/// The kept lines of a text, each ended by one LF, in one buffer with a NUL behind.
struct Text_Image {
    std::unique_ptr<char, Free_Deleter> bytes;
    std::size_t length = 0;

    [[nodiscard]] std::string_view Text() const { return {bytes.get(), length}; }
};

/// Loads the lines that the request's options keep. `strip_titles` drops the quoted lines that a
/// text begins with. False after a message, or when the file could not be read.
bool Load_Text_Image(Input_File& file, bool strip_titles, Text_Image& image);

/// Walks a text line by line; CR, LF and CR LF end one. A text given starts a walk, an empty view
/// with a null pointer goes on. False at the end.
bool Next_Text_Line(std::string_view text, std::string_view& line, bool& has_end);

enum Names_Mode : std::int32_t { names_decided = 0, names_given = 1, names_absent = 2 };

/// How a text is cut and what its first line is.
struct Text_Scan_Options {
    std::int32_t names_mode = names_decided;
    bool separators_given = false;
    Fixed_Text<20> separators;
    bool auto_factors = true;
    bool trim_cells = true;
    bool delete_empty_rows = true;
};

/// A field between its separators; the blanks in front are not part of it.
struct Text_Field {
    const char* first;
    const char* last;     ///< at the separator or line end behind it
    bool quoted = false;  ///< starts with a quote that is closed
};

/// Cuts the lines of an image into fields. Every line must end with LF.
class Field_Cutter {
public:
    explicit Field_Cutter(const Text_Scan_Options& options);

    [[nodiscard]] bool Ends_Field(char c) const { return ends_[static_cast<unsigned char>(c)]; }

    /// The field that starts at `at`.
    [[nodiscard]] Text_Field Cut(const char* at) const
    {
        while (*at == ' ')
            ++at;
        if (quotes_ && (*at == '"' || *at == '\''))
            return Cut_Quoted(at);
        return {at, Field_End(at), false};
    }

    /// Whether another field follows one that ended at `at`; steps over the separator then. Blanks
    /// at a line's end separate nothing.
    [[nodiscard]] bool Step_Over_Separator(const char*& at) const
    {
        if (*at == '\n')
            return false;
        if (*at++ != ' ')
            return true;
        while (*at == ' ')
            ++at;
        return *at != '\n';
    }

    /// A digit, point, sign or exponent letter separates fields, so numbers must be cut first.
    [[nodiscard]] bool Numbers_May_Run_On() const { return numbers_run_on_; }

    /// The first of the lines that count: without separators, quoted lines at the head don't.
    [[nodiscard]] const char* First_Line(std::string_view text) const;

    /// The field's text as it stands: no outer blanks and tabs, no pair of quotes around it, but
    /// quotes inside still doubled.
    [[nodiscard]] std::string_view Content(const Text_Field& field) const;

private:
    [[nodiscard]] const char* Field_End(const char* at) const
    {
        while (!Ends_Field(*at))
            ++at;
        return at;
    }
    [[nodiscard]] Text_Field Cut_Quoted(const char* at) const;

    std::array<bool, 256> ends_{};
    bool quotes_ = false;
    bool numbers_run_on_ = false;
};

/// The type of a column about which its fields have said nothing yet.
constexpr std::int32_t Undecided_Type = 99;

/// A column as the scan sees it.
struct Column_Scan {
    std::int32_t type = Undecided_Type;
    bool make_factor = false;  ///< marked for a Factor: the final type is negated
};

/// The shape of a text.
struct Text_Shape {
    std::int64_t rows = 0;     ///< lines up to the first empty one, the line of names included
    std::int32_t columns = 0;  ///< the most fields in a line
    bool has_names = false;
    std::vector<Column_Scan> types;
};

constexpr std::int64_t All_Lines = std::numeric_limits<std::int64_t>::max();

/// Finds the shape of `text`. The fields of at most `field_lines` lines are looked at: with fewer
/// than all, `columns` and `types` are what those lines say, and columns may stay undecided.
void Scan_Text_Dimensions(Text_Shape& shape, const Text_Scan_Options& options, std::string_view text,
                          std::int64_t field_lines = All_Lines);

/// Whether a text of so many bytes may ask for the cells of `shape`. False after a message.
bool Text_Fits_In_Memory(const Text_Shape& shape, std::size_t bytes);

/// Makes the Sheet of a shape: one column a type, undecided ones of `default_type`. Null after a
/// message; the earlier `Current_Sheet` is back then.
Sheet* Setup_Text_Sheet(const Text_Shape& shape, std::int32_t default_type);

/// Puts the fields of `text` into the Sheet. Undecided columns stay numeric for as long as their
/// fields are numbers, and become Text with the first that isn't; columns that the scan did not see
/// are added. False after a message.
bool Fill_Text_Sheet(Sheet* sheet, Text_Shape& shape, const Text_Scan_Options& options, std::string_view text,
                     bool tab_file);

/// From the image to the `Current_Sheet`.
bool Parse_Text_Buffer(std::string_view text, bool tab_file, bool csv_file, bool blank_separated);

/// What a field says of its column's type: nothing, a number, or text.
enum class Field_Kind : std::uint8_t { nothing, number, text };
[[nodiscard]] Field_Kind Kind_Of_Field(std::string_view content, bool quoted, double& value);

/// From so many characters on, text needs a Long Text column.
constexpr std::size_t Long_Field = Text_Cell_Width + 1;

}  // namespace ingester
