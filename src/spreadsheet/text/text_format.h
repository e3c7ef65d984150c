// What the rooms of the text reader share: the memory image, the options of a scan, the fields.
#pragma once

#include "model/sheet.h"
#include "platform/file_image.h"
#include "platform/files.h"
#include "platform/text_codes.h"
#include "spreadsheet/dialect/text_dialect.h"
#include "support/byte_scan.h"
#include "support/fixed_text.h"
#include "support/utf8.h"

#include <cstdint>
#include <exception>
#include <limits>
#include <string_view>
#include <vector>

namespace ingester {

/// Longest line, or joined record, in characters.
constexpr std::size_t Greatest_Line = 262140;

/// Stand behind the name in the title that is written over columns of fixed width.
constexpr std::string_view Title_Words = " (Created by Ingester: ";

/// The lines of a text in memory, the last one ended like the others.
struct Text_Buffer {
    char* first = nullptr;
    char* last = nullptr;
    std::int64_t lines_before = 0;  ///< lines of the file that were cut off in front
    bool watched = false;           ///< it may turn out that this is no UTF-8

    [[nodiscard]] std::string_view Text() const { return {first, static_cast<std::size_t>(last - first)}; }
    [[nodiscard]] bool Holds(char c) const { return Text().find(c) != std::string_view::npos; }
};

/// What is known of the code of a text.
struct Text_Code_State {
    std::size_t head = 0;           ///< bytes in front of the text that tell its code
    bool watched = false;           ///< taken for UTF-8 until something else is met
    Text_Code code = nullptr;       ///< as it was found so far; null where nothing was looked for
    Text_Code otherwise = nullptr;  ///< what it is then; malformed UTF-8 where that was told or declared
};

/// Finds what code the file's bytes are in, and brings them into that of all letters, unless they are taken
/// for UTF-8: those are looked at while they are read. False after a message.
bool Settle_Code(const std::string& name, File_Image& image, Text_Code_State& state);

/// A text that was watched is not UTF-8: brings it into the code of all letters. False after a message.
bool Convert_Malformed(const std::string& name, const Text_Code_State& state, File_Image& image,
                       Text_Buffer& buffer);

/// The same for a text of one line that tells no code.
bool Take_Line_Into_Code(std::string& line);

/// Loads the lines that the request's options keep into `image`. `strip_titles` drops the quoted
/// lines that a text begins with. `buffer` is empty for no lines; `rewritten` tells that the image
/// no longer is the file's. False after a message.
bool Load_Text_Image(Input_File& file, bool strip_titles, File_Image& image, Text_Buffer& buffer,
                     Text_Code_State& code, bool& rewritten);

/// Whether a line, with its end or without, is of a length that is read; false after a message that
/// calls it line `number`.
bool Line_Is_Short_Enough(std::string_view line, std::int64_t number);

enum Names_Mode : std::int32_t { names_decided = 0, names_given = 1, names_absent = 2 };

/// How a text is cut and what its first line is.
struct Text_Scan_Options {
    std::int32_t names_mode = names_decided;
    bool separators_given = false;
    Fixed_Text<20> separators;
    bool trim_cells = true;
    const Text_Dialect* dialect = nullptr;  ///< as it was found for people; null for hosts
    bool cells_may_shift = false;           ///< nothing stands for an empty text, nor around one with blanks
};

/// A field between its separators; the blanks in front are not part of it.
struct Text_Field {
    const char* first;
    const char* last;  ///< at the separator or line end behind it
};

/// What a field says: without outer blanks and tabs, and without the pair of quotes around it; but
/// such quotes inside are doubled still.
struct Field_Content {
    std::string_view text;
    char quote = '\0';  ///< the pair that was taken away
};

/// The line end that a text stopped with is gone: its file was changed while it was read.
struct Text_Changed : std::exception {};

/// A text that was taken for UTF-8 is none.
struct Text_Malformed : std::exception {};

/// Walks the fields of a text, behind which `Readable_Behind` bytes may be read. The places of separators,
/// line ends and quotes are found for a window of the text at once, so that cutting a field is looking up
/// where the next of them stands. NULs become blanks ahead of the walk. Throws `Text_Changed` and, where the
/// text is watched, `Text_Malformed`.
class Field_Walker {
public:
    Field_Walker(const Text_Scan_Options& options, const Text_Buffer& buffer);

    /// Goes to the start of a line, wherever the walk has come to.
    void Go_To(const char* at);

    /// The first of the lines that count: without separators, quoted lines at the head don't.
    [[nodiscard]] const char* First_Line() const;

    /// Cuts the next field.
    [[nodiscard]] Text_Field Next()
    {
        while (*at_ == ' ')
            ++at_;
        if (quotes_ && (*at_ == '"' || *at_ == '\'')) [[unlikely]]
            return Next_Quoted();
        const char* const first = at_;
        at_ = Next_End(first);
        return {first, at_};
    }

    /// Whether another field follows in the line; steps over the separator then, otherwise over the
    /// line's end. Blanks at a line's end separate nothing.
    [[nodiscard]] bool Has_More()
    {
        const char end = *at_++;
        if (end == '\n')
            return false;
        if (end == ' ' || end == '\r') [[unlikely]]
            return More_Behind(end);
        return true;
    }

    /// Passes over what is left of the line.
    void Skip_Line();

    /// Whether a line stands here that isn't empty: the first empty one ends a text's rows.
    [[nodiscard]] bool At_Line() const { return at_ < text_.last && *at_ != '\n' && *at_ != '\r'; }

    /// The same where empty lines and comments are passed over, which is for people.
    [[nodiscard]] bool At_Row()
    {
        passed_empty_ = false;
        if (at_<text_.last&& * at_> '%') [[likely]]  // neither a line end, a blank nor the mark of a comment
            return true;
        return dialect_ == nullptr ? At_Line() : Find_Row();
    }

    /// Whether an empty line was passed over on the way to this row.
    [[nodiscard]] bool Passed_Empty_Line() const { return passed_empty_; }

    /// Whether the line that starts at `line` and ends here holds nothing but blanks.
    [[nodiscard]] bool Is_Blank_Line(const char* line) const;

    /// NULs found so far.
    [[nodiscard]] long Nuls() const { return nuls_; }

    /// Quotes at the start of fields that none closes, for people.
    [[nodiscard]] long Open_Quotes() const { return open_quotes_; }

    /// Comments that were passed over.
    [[nodiscard]] std::int64_t Comments() const { return comments_; }

    [[nodiscard]] const char* Place() const { return at_; }

    /// What a field of this text says.
    [[nodiscard]] Field_Content Content(const Text_Field& field) const;

private:
    /// The next separator or line end at or behind `from`.
    [[nodiscard]] const char* Next_End(const char* from)
    {
        const char* end;
        do {
            if (next_ == found_) [[unlikely]]
                Look_At_Next_Window();
            end = window_ + places_[next_++];
        } while (end < from || !ends_.Holds(*end));
        return end;
    }
    [[nodiscard]] const char* Next_Quote(const char* from, char quote);
    [[nodiscard]] Text_Field Next_Quoted();
    [[nodiscard]] Text_Field Next_Quoted_For_People();
    [[nodiscard]] const char* Behind_Quotes(const char* first);
    [[nodiscard]] bool Is_Comment() const;
    [[nodiscard]] bool Find_Row();
    [[nodiscard]] bool More_Behind(char end);
    void Look_At_Next_Window();
    void Check_Window();
    void Blank_Out_Nuls();

    Text_Buffer text_;
    Byte_Finder ends_;   ///< separators, LF and CR
    Byte_Finder marks_;  ///< the same, and quotes
    bool quotes_;        ///< quotes around fields count
    const Text_Dialect* dialect_;
    bool passed_empty_ = false;
    const char* open_until_ = nullptr;  ///< quotes in front of it were not closed
    long open_quotes_ = 0;
    std::int64_t comments_ = 0;
    long nuls_ = 0;
    const char* at_;
    char* window_;
    char* window_end_;
    char* clean_end_;                    ///< no NULs up to here, which is a window further
    std::vector<std::uint32_t> places_;  ///< of the marks in the window
    std::size_t next_ = 0;
    std::size_t found_ = 0;
    Utf8_Check check_;               ///< of a text that is watched
    const char* checked_ = nullptr;  ///< up to here
};

/// The type of a column about which its fields have said nothing yet.
constexpr std::int32_t Undecided_Type = 99;

/// A column as the scan sees it.
struct Column_Scan {
    std::int32_t type = Undecided_Type;
    bool has_data = false;     ///< a field is not missing
    bool make_factor = false;  ///< marked: becomes a Factor when it is filled
    bool make_date = false;    ///< marked for dates
    bool make_time = false;    ///< marked for times
};

/// The shape of a text, or of the lines of it that were looked at.
struct Text_Shape {
    std::int64_t rows = 0;     ///< lines up to the first empty one, the line of names included
    std::int32_t columns = 0;  ///< the most fields in a line
    bool has_names = false;
    bool whole = false;     ///< every line was looked at
    std::size_t bytes = 0;  ///< of the lines looked at
    long nuls = 0;          ///< NULs that became blanks
    std::vector<Column_Scan> types;
};

constexpr std::int64_t All_Lines = std::numeric_limits<std::int64_t>::max();

/// Finds the shape of a text by its first `lines` lines. False after a message. With fewer than
/// all, columns whose type isn't sure stay undecided.
bool Scan_Text_Dimensions(Text_Shape& shape, const Text_Scan_Options& options, const Text_Buffer& buffer,
                          std::int64_t lines = All_Lines);

/// Whether the first lines don't tell which columns a list of types is for: it counts those that hold data.
bool Wanted_Types_Need_All_Lines(const Text_Shape& shape);

/// For each column the type that a list asks for, or 0. `kept` tells which columns go on.
std::vector<std::int32_t> Wanted_Types(const Sheet& sheet, const Text_Shape& shape,
                                       const std::vector<bool>& kept);

/// Makes the Sheet of a shape, without rows: one column a type, undecided ones of `default_type`.
/// Null when it can't be made; the earlier `Current_Sheet` is back then.
Sheet* Setup_Text_Sheet(const Text_Shape& shape, std::int32_t default_type);

/// Puts the fields of a text into the Sheet, row by row, up to the first empty line. Undecided
/// columns stay numeric for as long as their fields are numbers, and become Text with the first that
/// isn't; columns that the scan did not see are added. `image`, when given, may let go of what has
/// been read. False after a message, or without rows.
bool Fill_Text_Sheet(Sheet* sheet, Text_Shape& shape, const Text_Scan_Options& options,
                     const Text_Buffer& buffer, File_Image* image);

/// How a text is cut as people mean it: finds its `dialect`, and leaves in `buffer` the table alone.
/// `rewritten` becomes true where the text itself had to be changed.
[[nodiscard]] Text_Scan_Options Options_For_People(const std::string& name, Text_Buffer& buffer,
                                                   bool& rewritten, Text_Dialect& dialect);

/// From a text in memory to the `Current_Sheet`, which stays as it is when there is no table.
bool Parse_Text_Buffer(const Text_Buffer& buffer, const Text_Scan_Options& options,
                       File_Image* image = nullptr);

/// What a field says of its column's type: nothing, a number, or text.
enum class Field_Kind : std::uint8_t { nothing, number, text };
[[nodiscard]] Field_Kind Kind_Of_Field(const Field_Content& content, double& value);

}  // namespace ingester
