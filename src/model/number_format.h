// Numbers printed by a Column's format code.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <string_view>

namespace ingester {

/// Prints `value` by a format code and its decimals; a value not above `missing` prints "*". Dates print
/// in the request's `Current_Date_Form` and `Current_Date_Format`.
/// `target` has `Number_Text_Room`. Returns the end of the text.
char* Format_Number(char* target, double value, std::int32_t format, std::int32_t decimals, double missing);

/// The printed form of a present number of `column`, a date in the column's own form, or "*".
char* Format_Cell_Number(char* target, const Column& column, double value);

/// What a cell of any type prints as: a text itself, a Factor's label, level value or number, "*" for a
/// missing number and no text for a missing level with a label. A number whose column says nothing of
/// decimals keeps all its digits. Valid until `target` (of `Number_Text_Room`) changes.
[[nodiscard]] std::string_view Format_Cell(const Column& column, const Cell_Node& cell, char* target);

/// The same of a present or missing number: fifteen digits, for people as many as it needs.
char* Format_Cell_Fully(char* target, const Column& column, double value);

/// What a level value prints as: its Factor's decimals say how, or it keeps all digits that tell it from
/// others.
char* Format_Level_Value(char* target, const Column& factor, double value);

/// What level `level` (from 1) of a Factor prints as: its label, its level value or its number. Valid until
/// `target` (of `Number_Text_Room`) changes.
[[nodiscard]] std::string_view Factor_Label_Or_Level(const Column& column, std::int32_t level, char* target);

}  // namespace ingester
