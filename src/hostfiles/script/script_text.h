// The text of a script: lines of limited length, escaped texts, and numbers.
#pragma once

#include "hostfiles/shared/host_text.h"
#include "model/cells.h"
#include "platform/files.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string_view>

namespace ingester {

/// A line is broken before a piece that would reach this column.
constexpr std::int64_t Script_Line_Limit = 78;

/// The script under way. Pieces are printed into it and pass on to the file by the blockful.
class Script_Buffer {
public:
    explicit Script_Buffer(Output_File& file) : file_(file) {}

    /// Room for a piece of up to `count` characters.
    char* Reserve(std::size_t count)
    {
        if (capacity_ - used_ < count + longest_break)
            Empty_For(count);
        return bytes_.get() + used_;
    }

    /// Takes the piece that was printed from `Reserve` up to `end`, after breaking the line if it
    /// must be. `keep_whole`: the line goes on inside a statement, so a break needs its mark.
    void Take(const char* end, bool keep_whole);

    /// The same for a piece of data without line feeds.
    void Take_Data(const char* end)
    {
        const std::int64_t size = end - (bytes_.get() + used_);
        if (column_ + size >= Script_Line_Limit) {
            Take(end, false);
            return;
        }
        column_ += size;
        used_ += static_cast<std::size_t>(size);
    }

    /// No line is broken until it is set back: a long text stands as it is.
    void Set_Verbatim(bool verbatim) { verbatim_ = verbatim; }

    [[nodiscard]] Host_Text_Out& Texts() { return texts_; }

    /// Ends the last line and hands everything to the file.
    void Flush();

    /// The file has refused something.
    [[nodiscard]] bool Failed() const { return file_.Failed(); }

private:
    static constexpr std::size_t first_capacity = 128002;
    static constexpr std::size_t longest_break = 2;

    void Empty_For(std::size_t count);
    [[nodiscard]] std::string_view Break_Before(std::string_view piece, bool keep_whole) const;

    Output_File& file_;
    Host_Text_Out texts_;
    std::size_t capacity_ = 0;
    std::unique_ptr<char[]> bytes_;
    std::size_t used_ = 0;
    std::int64_t column_ = 0;  ///< characters on the current line
    bool verbatim_ = false;
};

/// Puts a piece into the script. `flush` ends the line and hands everything to the file.
void Write_Script_Text(std::string_view text, bool keep_whole, bool flush, Script_Buffer& script);

/// A piece of a statement: where the line is full it goes on behind a continuation mark.
inline void Write_Statement(std::string_view piece, Script_Buffer& script)
{
    Write_Script_Text(piece, true, false, script);
}

/// A piece of data: where the line is full it goes on in the next one.
inline void Write_Data(std::string_view piece, Script_Buffer& script)
{
    Write_Script_Text(piece, false, false, script);
}

/// Copies up to `limit` characters of `text`: control characters become blanks, and what means
/// something inside the host's quotes is doubled. Returns the end; room for twice the characters.
char* Escape_Script_Text(char* target, std::string_view text, std::size_t limit);

/// The same in quotes, as a value between `before` and `after`.
void Write_Quoted(std::string_view before, std::string_view text, std::size_t limit, std::string_view after,
                  bool keep_whole, Script_Buffer& script);

/// A number as the host reads it, "*" for a missing one. `to_day_count`: a serial date, which the
/// host counts in its own way. Returns the end; `Number_Text_Room` characters are enough.
char* Format_Script_Number(char* target, double value, double missing, bool to_day_count);

/// How the numbers of a column print.
struct Script_Number_Form {
    double missing;
    bool to_day_count;
};

/// A number behind `before`, inside a statement.
void Write_Statement_Number(std::string_view before, double value, const Script_Number_Form& form,
                            Script_Buffer& script);

/// A number of data, with a blank behind it.
void Write_Data_Number(double value, const Script_Number_Form& form, Script_Buffer& script);

/// The numbers of a list of cells as data.
void Write_Data_Numbers(const Cell_Node* first, const Script_Number_Form& form, Script_Buffer& script);

/// The end of data that were read.
inline void Write_Data_End(Script_Buffer& script)
{
    Write_Data(":\n", script);
}

}  // namespace ingester
