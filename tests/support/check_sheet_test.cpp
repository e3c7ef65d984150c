// A checker that says nothing is worth nothing: each broken Sheet must be found out.
#include "support/check_sheet.h"

#include "support/cell_lists.h"

namespace ingester {
namespace {

using Check_Sheet_Test = Request_Test;

Column& At(Sheet& sheet, std::int32_t index)
{
    return *Column_At(&sheet, index);
}

TEST_F(Check_Sheet_Test, Finds_Each_Fault_And_No_Other)
{
    const std::pair<const char*, void (*)(Sheet&)> cases[] = {
        {"columns: nodes in all: 5", [](Sheet& s) { ++s.column_count; }},
        {"columns: more nodes than 4", [](Sheet& s) { --s.column_count; }},
        {"rows: more nodes than -4", [](Sheet& s) { s.row_count = -4; }},
        {"rows: another last node", [](Sheet& s) { s.last_row = s.first_row; }},
        {"columns: another last node", [](Sheet& s) { s.last_column = nullptr; }},
        {"rows: no link back", [](Sheet& s) { s.first_row->next->prev = nullptr; }},
        {"column 2 (t): stands for position 7", [](Sheet& s) { At(s, 2).index = 7; }},
        {"another Sheet", [](Sheet& s) { At(s, 1).sheet = nullptr; }},
        {"no name", [](Sheet& s) { At(s, 1).name.clear(); }},
        {"length 2", [](Sheet& s) { At(s, 1).length = 2; }},
        {"nodes in all: 3", [](Sheet& s) { At(s, 1).length = 4; }},
        {"Row column", [](Sheet& s) { At(s, 1).type = row_column; }},
        {"remembered node at 1", [](Sheet& s) { At(s, 1).cursor_index = 1; }},
        {"long a text in cell 2", [](Sheet& s) { At(s, 2).last_cell->value = At(s, 3).first_cell->value; }},
        {"no such level", [](Sheet& s) { At(s, 4).last_cell->value.number = 1.5; }},
        {"level values are only 2", [](Sheet& s) { ++At(s, 4).nlevels; }},
        {"labels are only 0", [](Sheet& s) { At(s, 4).factor_kind = 2, ++At(s, 4).nlevels; }},
        {"nodes in all: 2", [](Sheet& s) { At(s, 4).level_values_count = 3; }},
    };
    for (const auto& [told, spoil] : cases) {
        Sheet* const sheet = New_Sheet_With_Rows(3);
        Add_Cells(sheet, variate_column, "n", {"1", "2", "3"});
        Add_Cells(sheet, text_column, "t", {"a", "", "c"});
        Add_Cells(sheet, long_text_column, "l", {std::string(91, 'x'), "", ""});
        Put_Levels(*Add_Cells(sheet, factor_column, "f", {"2", "*", "1"}), {10, 20});
        ASSERT_EQ(Check_Sheet(*sheet), "");
        spoil(*sheet);
        EXPECT_NE(Check_Sheet(*sheet).find(told), std::string::npos) << told << Check_Sheet(*sheet);
    }
}

}  // namespace
}  // namespace ingester
