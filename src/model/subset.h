// The columns that a request keeps, by their names or by their places.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <string_view>
#include <unordered_set>
#include <vector>

namespace ingester {

/// The request's list of columns, made ready for being looked up.
class Column_Subset {
public:
    Column_Subset();

    /// Whether the column of that place (from 1) and name goes on. Without a list, every column does. A
    /// name of the list may be spelled as in the file, or as the host accepts it.
    [[nodiscard]] bool Keeps(std::int32_t ordinal, std::string_view name) const;

private:
    struct Text_Hash {
        using is_transparent = void;
        std::size_t operator()(std::string_view text) const { return std::hash<std::string_view>{}(text); }
    };

    std::unordered_set<long> numbers_;
    std::unordered_set<std::string, Text_Hash, std::equal_to<>> names_;
};

/// The columns that the names of a list stand for, null for those that aren't there. A column is found by its
/// name, which the list may spell as the host wouldn't, or else by the name that it has in the input.
[[nodiscard]] std::vector<Column*> Find_Listed(const Sheet& sheet, std::span<const std::string> names);

/// How the lines of a list go with the columns that a subset has left.
enum class List_Pairing { by_order, by_input_place, unknown };

/// The pairing of a list that counts `count` lines with `columns` columns. A list that counts more was
/// written for all columns, and their places tell which line is whose.
[[nodiscard]] List_Pairing Pairing_Of_List(std::int64_t count, std::int64_t columns);

/// Tells of names that were not found, up to ten of them, by a warning that takes the name.
class Missing_Names {
public:
    explicit Missing_Names(const char* warning) : warning_(warning) {}
    void Tell(const std::string& name);

private:
    const char* warning_;
    int told_ = 0;
};

/// For each data Column of a Sheet, by its place, whether the request's list has it; with a list, each notes
/// its `input_place`. Names must be as they are to stay.
[[nodiscard]] std::vector<bool> Wanted_Columns(Sheet& sheet);

/// Takes the others out. The stages behind the reader leave the columns as they are then.
void Keep_Wanted_Columns(Sheet& sheet, const std::vector<bool>& wanted);

/// Both, before there are cells: the Columns by their place in the input, null for those that were left out.
/// A range of columns stays with the stages, which count it in what the request has made of the Sheet.
[[nodiscard]] std::vector<Column*> Narrow_Columns(Sheet& sheet);

/// The rows that a request keeps.
struct Row_Selection {
    bool active = false;
    std::span<const std::int32_t> flags;  ///< rows beyond are left out

    [[nodiscard]] bool Keeps(std::int64_t row) const
    {
        return !active || (row < std::ssize(flags) && flags[static_cast<std::size_t>(row)] != 0);
    }
    /// How many of the first `rows`.
    [[nodiscard]] std::int32_t Count(std::int32_t rows) const;
    /// The places (from 0) that an active selection gives the first `rows`, -1 for one that is left out.
    [[nodiscard]] std::vector<std::int32_t> New_Rows(std::int32_t rows) const;
};

/// The request's rows, for a reader that makes no others: the stages behind it leave the rows as they are
/// then.
[[nodiscard]] Row_Selection Narrow_Rows();

/// Leaves the request's columns in a Sheet. The leading Factors of a Table stay, since its cells belong to
/// them. False when no data column is left.
bool Keep_Column_Subset(Sheet* sheet);

/// Tells the names of the list that the Sheet doesn't have.
void Tell_Missing_Columns(const Sheet& sheet);

}  // namespace ingester
