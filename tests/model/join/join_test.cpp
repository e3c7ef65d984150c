// Appends and merges of small random Sheets, held against nested loops over their rows as texts.
#include "model/join/append.h"
#include "model/join/concatenate.h"
#include "model/join/factor_levels.h"
#include "model/join/merge.h"
#include "model/join/merge_keys.h"
#include "model/number_format.h"
#include "model/sort.h"
#include "support/cell_lists.h"
#include "support/check_sheet.h"

#include <algorithm>
#include <functional>
#include <map>
#include <random>

namespace ingester {
namespace {

using Join = Request_Test;
using Rows = std::vector<Texts>;  // by row, then column

/// Ways to hold "1", "2", "3" and "" (for nothing) in a column.
enum Form { numbers, texts, labels, values, plain };
constexpr std::int32_t Type_Of_Form[] = {variate_column, text_column, factor_column, factor_column,
                                         factor_column};

void Add_Form(Sheet* sheet, Form form, const std::string& name, const Texts& cells)
{
    Column* const column =
        New_Data_Column(sheet, Type_Of_Form[form], name, static_cast<std::int32_t>(cells.size()));
    if (form >= labels)
        Put_Levels(*column, {1, 2, 3}, {"1", "2", "3"});
    if (form == values || form == plain)
        Free_Cell_Nodes(column, label_nodes);
    if (form == labels || form == plain)
        Free_Cell_Nodes(column, level_value_nodes);
    column->factor_kind = form == labels   ? factor_with_labels
                          : form == values ? factor_with_levels
                                           : plain_factor;
    if (form >= labels)
        column->nlevels = 3;
    const std::string* text = cells.data();
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
        Set_Cell_From_Text(*column, *cell, *text++);
}

Texts Plain_Cells(const Column& column)
{
    char room[Number_Text_Room];
    Texts cells;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        cells.emplace_back(Cell_Is_Present(column, *cell) ? Format_Cell(column, *cell, room) : "");
    return cells;
}

Texts Random_Cells(std::minstd_rand& random, std::size_t rows, unsigned choices)
{
    Texts cells;
    while (cells.size() < rows) {
        const auto value = random() % choices;
        cells.push_back(value == 0 ? "" : std::to_string(value));
    }
    return cells;
}

TEST_F(Join, Appended_Data_Keep_Their_Meaning_In_Every_Form)
{
    std::minstd_rand random;
    for (int round = 0; round < 3000; ++round) {
        Start_Request("t");
        const bool by_name = random() % 2 == 0;
        std::map<std::string, Texts> expected;  // by the column's final name
        Sheet* sheets[2];
        const std::size_t rows[] = {1 + random() % 4, 1 + random() % 4};
        const std::size_t counts[] = {1 + random() % 3, 1 + random() % 4};
        for (std::size_t side = 0; side < 2; ++side) {
            sheets[side] = New_Sheet_With_Rows(static_cast<std::int32_t>(rows[side]));
            for (std::size_t i = 0; i < counts[side]; ++i) {
                const bool paired = side == 0 || i < counts[0];
                const std::string name = (paired || by_name ? "c" : "d") + std::to_string(i);
                const Texts cells = Random_Cells(random, rows[side], 4);
                Add_Form(sheets[side], static_cast<Form>(random() % 5), name, cells);
                Texts& all = expected[name];
                all.resize(side == 0 ? 0 : rows[0]);
                all.insert(all.end(), cells.begin(), cells.end());
            }
        }
        for (auto& [name, cells] : expected)
            cells.resize(rows[0] + rows[1]);
        const bool marked = random() % 2 == 0;
        Append_Request wanted{.source = sheets[1], .by_name = by_name};
        if (marked) {
            wanted.source_column_name = "from";
            wanted.new_label = "new";
            Texts& marks = expected["from"];
            marks.assign(rows[0], "Original");
            marks.resize(rows[0] + rows[1], "new");
        }
        ASSERT_TRUE(Append_Sheet(sheets[0], wanted));
        ASSERT_EQ(Check_Sheet(*sheets[0]), "");
        std::map<std::string, Texts> found;
        for (const Column* column = sheets[0]->first_column->next; column != nullptr; column = column->next)
            found[std::string(column->name)] = Plain_Cells(*column);
        ASSERT_EQ(found, expected) << "round " << round;
    }
}

/// Every pairing of key forms that sorts the same way on both sides.
constexpr std::pair<Form, Form> Key_Forms[] = {{numbers, numbers}, {texts, texts},    {labels, labels},
                                               {values, values},   {plain, plain},    {labels, texts},
                                               {texts, labels},    {values, numbers}, {numbers, values},
                                               {plain, numbers},   {numbers, plain}};

struct Plain_Sheet {
    Rows keys;      ///< by row
    Texts updated;  ///< the column that both have
};

/// Keys, "a" of the target, "u" of both, "b" of the source; by row.
Rows Merge_Plainly(const Plain_Sheet& target, const Plain_Sheet& source, const Merge_Request& wanted)
{
    Rows result;
    const auto add = [&](const Texts& keys, const std::string& a, std::string u, int s) {
        std::string b;
        std::string other;
        if (s >= 0) {
            const std::string& given = source.updated[static_cast<std::size_t>(s)];
            const bool leave = (wanted.keep_present && !u.empty()) || (wanted.skip_missing && given.empty());
            if (wanted.update_columns)
                u = leave ? u : given;
            else
                other = given;
            b = std::to_string(s + 1);
        }
        Texts row = keys;
        row.insert(row.end(), {a, u});
        if (!wanted.update_columns)
            row.push_back(other);
        row.push_back(b);
        result.push_back(row);
    };
    const auto equal = [](const Rows& rows, const Texts& key) {
        std::vector<int> found;
        for (std::size_t i = 0; i < rows.size(); ++i)
            if (rows[i] == key)
                found.push_back(static_cast<int>(i));
        return found;
    };
    for (std::size_t t = 0; t < target.keys.size(); ++t) {
        const Texts& key = target.keys[t];
        const std::vector<int> like = equal(target.keys, key);
        const std::vector<int> partners = equal(source.keys, key);
        const auto place = static_cast<std::size_t>(std::find(like.begin(), like.end(), t) - like.begin());
        const int partner = partners.empty() ? -1 : partners[std::min(place, partners.size() - 1)];
        add(key, std::to_string(t + 1), target.updated[t], partner);
        if (place + 1 == like.size() && wanted.fill_mode >= fill_copies)
            for (std::size_t i = place + 1; i < partners.size(); ++i)
                add(key, std::to_string(t + 1), result.back()[key.size() + 1], partners[i]);
    }
    std::vector<std::pair<Texts, int>> unmatched;
    for (std::size_t s = 0; s < source.keys.size(); ++s)
        if (equal(target.keys, source.keys[s]).empty())
            unmatched.emplace_back(source.keys[s], static_cast<int>(s));
    std::sort(unmatched.begin(), unmatched.end());
    if (wanted.fill_mode == fill_all)
        for (const auto& [key, s] : unmatched)
            add(key, "", "", s);
    return result;
}

Rows By_Row(const Sheet& sheet)
{
    Rows rows(static_cast<std::size_t>(sheet.row_count));
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next) {
        const Texts cells = Plain_Cells(*column);
        for (std::size_t row = 0; row < rows.size(); ++row)
            rows[row].push_back(cells[row]);
    }
    return rows;
}

TEST_F(Join, Merges_As_Nested_Loops_Do)
{
    std::minstd_rand random;
    for (int round = 0; round < 6000; ++round) {
        Start_Request("t");
        Merge_Request wanted;
        wanted.key_count = 1 + static_cast<std::int32_t>(random() % 3);
        wanted.update_columns = random() % 2 == 0;
        wanted.fill_mode = static_cast<std::int32_t>(random() % 3);
        wanted.keep_present = random() % 4 == 0;
        wanted.skip_missing = random() % 4 == 0;
        wanted.ignore_case = random() % 4 == 0;
        std::pair<Form, Form> forms[3];
        for (auto& pair : forms)
            pair = Key_Forms[random() % std::size(Key_Forms)];
        Plain_Sheet plains[2];
        Sheet* sheets[2];
        for (std::size_t side = 0; side < 2; ++side) {
            const std::size_t rows = 1 + random() % 6;
            sheets[side] = New_Sheet_With_Rows(static_cast<std::int32_t>(rows));
            plains[side].keys.resize(rows);
            for (std::size_t key = 0; key < static_cast<std::size_t>(wanted.key_count); ++key) {
                Texts cells = Random_Cells(random, rows, 4);
                const Form form = side == 0 ? forms[key].first : forms[key].second;
                if (forms[key] == std::pair(plain, numbers))
                    cells[0] = "2";  // numbers without any can't be levels
                Add_Form(sheets[side], form, "k" + std::to_string(key), cells);
                for (std::size_t row = 0; row < rows; ++row)
                    plains[side].keys[row].push_back(cells[row]);
                (side == 0 ? wanted.target_keys : wanted.source_keys)[key] = sheets[side]->last_column;
            }
            plains[side].updated = Random_Cells(random, rows, 4);
            Texts places;
            for (std::size_t row = 1; row <= rows; ++row)
                places.push_back(std::to_string(row));
            if (side == 0)
                Add_Form(sheets[side], numbers, "a", places);
            Add_Form(sheets[side], static_cast<Form>(random() % 5), "u", plains[side].updated);
            if (side == 1)
                Add_Form(sheets[side], numbers, "b", places);
        }
        wanted.target = sheets[0];
        wanted.source = sheets[1];
        const bool text_and_not = (sheets[0]->last_column->type == text_column)
                                  != (Find_Column(sheets[1], "u")->type == text_column);
        if (wanted.update_columns && text_and_not && sheets[0]->last_column->type != factor_column)
            continue;  // such a pair becomes two columns, which the case of names below looks at
        ASSERT_TRUE(Merge_Sheets(wanted)) << "round " << round << Messages();
        ASSERT_EQ(Check_Sheet(*sheets[0]), "") << "round " << round;
        ASSERT_EQ(By_Row(*sheets[0]), Merge_Plainly(plains[0], plains[1], wanted)) << "round " << round;
    }
}

TEST_F(Join, Levels_Are_Told_By_Labels_Values_Or_Numbers)
{
    const std::string warning =
        "Factors t and s do not match with respect to the presence of labels and levels.\n"
        "The matched rows may not be as expected.\n:\n";
    const struct {
        std::vector<double> target_values, source_values;
        Texts target_labels, source_labels;
        double tolerance;
        bool ignore_case;
        std::string map, target, said;
    } cases[] = {
        {{}, {}, {"b", "a"}, {"a", "c", "b"}, 0, false, "2 3 1 ", "b a c ", ""},
        {{}, {}, {"b", "A"}, {"a", "B"}, 0, true, "2 1 ", "b A ", ""},
        {{10, 20}, {20, 30}, {"x", "y"}, {"y", "z"}, 0, false, "2 3 ", "x=10 y=20 z=30 ", ""},
        {{10, 0}, {0, 10.005, -10}, {}, {}, 0, false, "2 3 4 ", "10 0 10.005 -10 ", ""},
        {{10, 0}, {0, 10.005, -10}, {}, {}, 1.5, false, "2 1 3 ", "10 0 -10 ", ""},
        {{}, {5, 6, 7}, {"x", "y"}, {}, 0, false, "", "x y 3 ", warning},
        {{5, 6}, {}, {}, {"p", "q", "r"}, 0, false, "", "5 6 3 ", warning},
    };
    for (const auto& one : cases) {
        Start_Request("t");
        Sheet* const sheet = New_Sheet_With_Rows(1);
        Column* const factors[] = {New_Data_Column(sheet, factor_column, "t", 1),
                                   New_Data_Column(sheet, factor_column, "s", 1)};
        for (int side = 0; side < 2; ++side) {
            const auto& values = side == 0 ? one.target_values : one.source_values;
            const Texts& labels = side == 0 ? one.target_labels : one.source_labels;
            Put_Levels(*factors[side], std::vector<double>(std::max(values.size(), labels.size()), 0.0),
                       labels);
            Level_Node* node = factors[side]->level_values;
            for (const double value : values) {
                node->value.number = value;
                node = node->next;
            }
            if (values.empty())
                Free_Cell_Nodes(factors[side], level_value_nodes);
            if (labels.empty())
                Free_Cell_Nodes(factors[side], label_nodes);
        }
        std::vector<std::int32_t> map;
        EXPECT_TRUE(Merge_Factor_Levels(*factors[0], *factors[1], map, one.tolerance, one.ignore_case));
        std::string text;
        for (const std::int32_t level : map)
            text += std::to_string(level) + " ";
        EXPECT_EQ(text, one.map) << one.target;
        text.clear();
        const Level_Node* value = factors[0]->level_values;
        const Level_Node* label = factors[0]->labels;
        for (std::int32_t level = 0; level < factors[0]->nlevels; ++level) {
            text.append(label == nullptr ? "" : label->Text());
            text += label != nullptr && value != nullptr ? "=" : "";
            text += value == nullptr ? "" : Format_Text("%g", value->value.number);
            text += " ";
            label = label == nullptr ? nullptr : label->next;
            value = value == nullptr ? nullptr : value->next;
        }
        EXPECT_EQ(text, one.target);
        EXPECT_EQ(Messages(), one.said);
    }
}

TEST_F(Join, Refuses_Keys_That_Do_Not_Go_Together)
{
    const std::tuple<Form, Form, std::string> cases[] = {
        {numbers, texts, "Columns k and k data types do not match.\n"},
        {texts, numbers, "Columns k and k data types do not match.\n"},
        {plain, texts, "Factor k does not have labels to match with text column k.\n"},
        {texts, values, "Factor k does not have labels to match with text column k.\n"},
        {texts, labels, "Mixed column types for k and k caused a clash of sort orders.\n"},
        {numbers, values, "Mixed column types for k and k caused a clash of sort orders.\n"},
    };
    for (const auto& [first, second, said] : cases) {
        Start_Request("t");
        Sheet* const target = New_Sheet_With_Rows(1);
        Sheet* const source = New_Sheet_With_Rows(1);
        Merge_Request wanted{.target = target, .source = source, .key_count = 2};
        for (Sheet* const sheet : {target, source}) {
            Add_Form(sheet, sheet == target ? first : second, "k", {"1"});
            Add_Form(sheet, plain, "l", {"1"});
            auto& keys = sheet == target ? wanted.target_keys : wanted.source_keys;
            keys[0] = Column_At(sheet, 1);
            keys[1] = Column_At(sheet, 2);
        }
        if (Column* const mixed = wanted.source_keys[0]; said.starts_with("Mixed")) {
            if (mixed->labels != nullptr)
                mixed->labels->value.text = mixed->texts.Store("z");
            else
                mixed->level_values->value.number = 9;
        }
        EXPECT_FALSE(Merge_Sheets(wanted));
        EXPECT_EQ(Messages(), said + ":\n");
    }
    Sheet* const sheet = New_Sheet_With_Rows(1);
    Add_Form(sheet, numbers, "k", {"1"});
    for (const std::int32_t refused : {0, 1, 2, 3}) {
        Sheet* const source = New_Sheet_With_Rows(refused == 0 ? 0 : 1);
        Add_Form(source, numbers, "k", refused == 0 ? Texts{} : Texts{"1"});
        sheet->read_only = refused == 1 ? 1 : 0;
        sheet->type = refused == 2 ? symmetric_matrix_sheet : refused == 3 ? scalar_sheet : vector_sheet;
        EXPECT_FALSE(Merge_Sheets({.target = sheet,
                                   .source = source,
                                   .key_count = 1,
                                   .target_keys = {Column_At(sheet, 1)},
                                   .source_keys = {Column_At(source, 1)}}));
        EXPECT_FALSE(Append_Sheet(sheet, {.source = source}));
        EXPECT_EQ(Concatenate_Sheets(sheet, source, false), false) << refused;
    }
    EXPECT_FALSE(Append_Sheet(sheet, {.source = sheet}));
}

TEST_F(Join, Dates_Texts_And_Tolerances_Match)
{
    Sheet* const target = New_Sheet_With_Rows(3);
    Sheet* const source = New_Sheet_With_Rows(3);
    Column* const serials = Add_Cells(target, variate_column, "d", {"61", "100", "*"});
    Column* const days = Add_Cells(source, variate_column, "d", {"109612", "*", "109573.25"});
    Add_Cells(source, variate_column, "x", {"1", "2", "3"});
    serials->format = days->format = date_format_mark;
    days->date_form = 1;
    Row_At(target, 1)->restricted = 1;
    target->restricted_rows = target->restriction_active = 1;
    ASSERT_TRUE(Merge_Sheets({.target = target,
                              .source = source,
                              .key_count = 1,
                              .target_keys = {serials},
                              .source_keys = {days},
                              .tolerance = 0.5}));
    EXPECT_EQ(Render(target), "d V61|100|*; x V3|1|2");
    EXPECT_EQ(target->restricted_rows + target->restriction_active + Row_At(target, 1)->restricted, 0);
    Append_Request wanted{.source = source};
    ASSERT_TRUE(Append_Sheet(target, wanted));
    EXPECT_EQ(Render(target), "d V61|100|*|100|*|61.25; x V3|1|2|1|2|3");
}

TEST_F(Join, A_Column_That_Cannot_Take_The_Data_Is_Told)
{
    const std::string words = "Some column data has not been appended due to a data type mismatch.\n";
    const std::tuple<std::int32_t, std::int32_t, const char*, std::string> cases[] = {
        {vector_sheet, 0, "x|y",
         "Text column c appended to variate column c.\nConverting c to a text for compatibility.\n"},
        {matrix_sheet, 2, "*|*",
         words + "(e.g. text column data cannot be inserted into numeric column).\nColumns were:\nc.\n"},
        {matrix_sheet, 0, "*|*", words + "(e.g. text column data cannot be inserted to numeric column).\n"},
    };
    for (const auto& [type, label_state, cells, said] : cases) {
        Start_Request("t");
        Sheet* const target = New_Sheet_With_Rows(1);
        Sheet* const source = New_Sheet_With_Rows(2);
        for (Sheet* const sheet : {target, source}) {
            sheet->type = type;
            sheet->label_state = label_state;
        }
        Add_Cells(target, type == matrix_sheet ? matrix_column : variate_column, "c", {"1"});
        Add_Cells(source, text_column, "c", {"x", "y"});
        ASSERT_TRUE(Append_Sheet(target, {.source = source}));
        EXPECT_EQ(Render(target, false).substr(1), std::string("1|") + cells);
        EXPECT_EQ(Messages(), said + ":\n");
    }
}

// A Vector of a file may have columns that end early: what moves rows gives them all of theirs first.
TEST_F(Join, Short_Columns_Lose_Nothing)
{
    const auto table = [](const Texts& keys, const Texts& cells) {
        Sheet* const sheet = New_Sheet_With_Rows(static_cast<std::int32_t>(keys.size()));
        Add_Cells(sheet, variate_column, "k", keys);
        Add_Cells(sheet, text_column, "t", cells);
        sheet->has_short_columns = cells.size() < keys.size() ? 1 : 0;
        return sheet;
    };
    const std::tuple<std::function<bool(Sheet*, Sheet*)>, const char*> cases[] = {
        {[](Sheet* target, Sheet* source) { return Append_Sheet(target, {.source = source}); },
         "k V4|3|2|1|2|9; t Tx|y|||p|q"},
        {[](Sheet* target, Sheet* source) {
             return Merge_Sheets({.target = target,
                                  .source = source,
                                  .key_count = 1,
                                  .target_keys = {Column_At(target, 1)},
                                  .source_keys = {Column_At(source, 1)},
                                  .update_columns = true});
         },
         "k V4|3|2|1|9; t Tx|y|p||q"},
        {[](Sheet* target, Sheet*) { return Sort_Sheet({.sheet = target, .key_index = {1}}); },
         "k V1|2|3|4; t T||y|x"},
    };
    for (const auto& [join, expected] : cases) {
        Start_Request("t");
        Sheet* const target = table({"4", "3", "2", "1"}, {"x", "y"});
        ASSERT_TRUE(join(target, table({"2", "9"}, {"p", "q"})));
        EXPECT_EQ(Check_Sheet(*target), "");
        EXPECT_EQ(Render(target), expected);
    }
}

TEST_F(Join, Matrices_Replace_Their_Columns_And_Diagonal_Ones_Take_None)
{
    Sheet* const sheets[] = {New_Sheet_With_Rows(2), New_Sheet_With_Rows(2), New_Sheet_With_Rows(2)};
    for (Sheet* const sheet : sheets)
        sheet->type = matrix_sheet;
    Add_Cells(sheets[0], matrix_column, "a", {"1", "2"});
    Add_Cells(sheets[0], matrix_column, "b", {"3", "4"});
    Add_Cells(sheets[1], matrix_column, "B", {"5", "6"});
    EXPECT_TRUE(Concatenate_Sheets(sheets[0], sheets[1], true));
    EXPECT_EQ(Numbers_Of(*Column_At(sheets[0], 2)), (std::vector<double>{5, 6}));
    sheets[2]->type = diagonal_matrix_sheet;
    Add_Cells(sheets[2], diagonal_matrix_column, "d", {"1", "2"});
    Sheet* const more = New_Sheet_With_Rows(1);
    Add_Cells(more, variate_column, "e", {"7"});
    EXPECT_FALSE(Append_Sheet(sheets[2], {.source = more}));
}

TEST_F(Join, Columns_Stand_Beside_Each_Other_Or_Take_The_Place_Of_Others)
{
    const Texts names = {"a", "B", "long", "d"};
    const std::tuple<bool, bool, std::string> cases[] = {
        {false, true, "A V1|2; b Tx|y; A_1 V7|8; B Tp|q; long Lr|s; d F1|2"},
        {true, true, "A V7|8; B Tp|q; long Lr|s; d F1|2"},
    };
    for (const auto& [unique, result, expected] : cases) {
        Start_Request("t");
        Sheet* const target = New_Sheet_With_Rows(2);
        Add_Cells(target, variate_column, "A", {"1", "2"});
        Add_Cells(target, text_column, "b", {"x", "y"});
        Sheet* const source = New_Sheet_With_Rows(2);
        Add_Cells(source, variate_column, "A", {"7", "8"});
        Add_Cells(source, text_column, "B", {"p", "q"});
        Add_Cells(source, long_text_column, "long", {"r", "s"});
        Add_Form(source, labels, "d", {"1", "2"});
        EXPECT_EQ(Concatenate_Sheets(target, source, unique), result);
        EXPECT_EQ(Check_Sheet(*target), "");
        EXPECT_EQ(Render(target), expected);
        EXPECT_EQ(Concatenate_Sheets(target, source, false), false) << "nothing is left to move";
        EXPECT_EQ(Concatenate_Sheets(target, New_Sheet_With_Rows(3), false), false);
    }
}

}  // namespace
}  // namespace ingester
