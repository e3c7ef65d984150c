// Appends and merges of small random Sheets, held against nested loops over their rows as texts.
#include "model/calendar.h"
#include "model/factors.h"
#include "model/join/append.h"
#include "model/join/concatenate.h"
#include "model/join/factor_levels.h"
#include "model/join/join_sheets.h"
#include "model/join/merge.h"
#include "model/join/merge_keys.h"
#include "model/number_format.h"
#include "model/sort.h"
#include "model/told_sheets.h"

#include <algorithm>
#include <chrono>
#include <functional>
#include <map>
#include <random>

namespace ingester {
namespace {

using Join = Request_Test;
using Rows = std::vector<Texts>;  // by row, then column

/// Ways to hold three words, and "" for nothing, in a column.
enum Form { numbers, texts, labels, values, plain, both };
constexpr std::int32_t Type_Of_Form[] = {variate_column, text_column,   factor_column,
                                         factor_column,  factor_column, factor_column};

/// The words of a column, in their order, and the forms that can hold them.
struct Vocabulary {
    Texts words;
    std::vector<Form> forms;
    bool dates = false;
    bool for_people = false;  ///< as numbers, hosts print fifteen of their digits
};

std::string Long_Word(char first, std::size_t size)
{
    return std::string(size - 1, 'w') + first;  // all alike at their start
}

const Vocabulary Counts = {{"1", "2", "3"}, {numbers, texts, labels, values, plain}};
const Vocabulary Vocabularies[] = {
    Counts,
    {{"0.1", "0.25", "0.3"}, {numbers, texts, labels, values}},
    {{"1234567", "1234568", "1234569.5"}, {numbers, texts, labels, values}},
    {{"1234567890123456", "1234567890123457", "1234567890123458"},
     {numbers, texts, labels, values},
     false,
     true},
    {{"01", "1", "1.0"}, {texts, labels}},
    {{"01/02/2020", "02/02/2020", "03/02/2020"}, {numbers, labels, values}, true},
    {{Long_Word('a', 89), Long_Word('b', 91), Long_Word('c', 240)}, {texts, labels, both}},
};

/// `levels` of the words are those of a Factor.
void Add_Form(Sheet* sheet, Form form, const std::string& name, const Texts& cells,
              const Vocabulary& vocabulary = Counts, std::size_t levels = 3, std::int16_t date_form = 1)
{
    Column* const column =
        New_Data_Column(sheet, Type_Of_Form[form], name, static_cast<std::int32_t>(cells.size()));
    if (vocabulary.dates && (form == numbers || form == values))
        Look_Like_Dates(*column, date_form);
    const auto is_long = [](const std::string& cell) { return cell.size() > Text_Cell_Width; };
    if (form == texts && std::ranges::any_of(cells, is_long))
        Set_Column_Type(*column, long_text_column);
    if (form >= labels) {
        const Texts words(vocabulary.words.begin(),
                          vocabulary.words.begin() + static_cast<std::ptrdiff_t>(levels));
        std::vector<double> level_values;
        for (const std::string& word : words)
            level_values.push_back(form == both ? 10.5 * (1.0 + static_cast<double>(level_values.size()))
                                                : Number_Or_Date(*column, word));
        Put_Levels(*column, form == values || form == both ? level_values : std::vector<double>{},
                   form == labels || form == both ? words : Texts{});
        column->nlevels = static_cast<std::int32_t>(levels);
        column->factor_kind = form == plain ? plain_factor : column->factor_kind;
    }
    const std::string* text = cells.data();
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
        Set_Cell_From_Text(*column, *cell, *text++);
}

/// Of the first `levels` words, and of nothing.
Texts Random_Cells(std::minstd_rand& random, std::size_t rows, std::size_t levels,
                   const Vocabulary& vocabulary = Counts)
{
    Texts cells;
    while (cells.size() < rows) {
        const std::size_t value = random() % (levels + 1);
        cells.push_back(value == 0 ? "" : vocabulary.words[value - 1]);
    }
    return cells;
}

/// For people a Factor may lack levels that others have. Hosts leave the dates of levels in their own form.
TEST_F(Join, Appended_Data_Keep_Their_Meaning_In_Every_Form)
{
    std::minstd_rand random;
    for (int round = 0; round < 6000; ++round) {
        Start_Request("t");
        const Vocabulary& vocabulary = Vocabularies[random() % std::size(Vocabularies)];
        const bool people = vocabulary.for_people || random() % 2 == 0;
        request.people.set(static_cast<std::size_t>(People_Rule::kept_levels), people);
        const bool by_name = random() % 2 == 0;
        const std::vector<Form>& forms = vocabulary.forms;
        const bool dates_differ = vocabulary.dates && random() % 2 == 0;
        std::map<std::string, Texts> expected;  // by the column's final name
        Sheet* sheets[2];
        const std::size_t rows[] = {1 + random() % 4, 1 + random() % 4};
        const std::size_t counts[] = {1 + random() % 3, 1 + random() % 4};
        for (std::size_t side = 0; side < 2; ++side) {
            sheets[side] = New_Sheet_With_Rows(static_cast<std::int32_t>(rows[side]));
            for (std::size_t i = 0; i < counts[side]; ++i) {
                const bool paired = side == 0 || i < counts[0];
                const std::string name = (paired || by_name ? "c" : "d") + std::to_string(i);
                const std::size_t levels = people ? 1 + random() % 3 : 3;
                const Texts cells = Random_Cells(random, rows[side], levels, vocabulary);
                const Form form = dates_differ && !people ? numbers : forms[random() % forms.size()];
                Add_Form(sheets[side], form, name, cells, vocabulary, levels,
                         static_cast<std::int16_t>(!dates_differ || random() % 2 == 0));
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
        ASSERT_EQ(found, expected) << "round " << round << Messages();
    }
}

/// Every pairing of key forms that sorts the same way on both sides.
constexpr std::pair<Form, Form> Key_Forms[] = {
    {numbers, numbers}, {texts, texts},    {labels, labels},  {values, values},  {plain, plain},
    {labels, texts},    {texts, labels},   {values, numbers}, {numbers, values}, {plain, numbers},
    {numbers, plain},   {labels, numbers}, {numbers, labels}};

/// For people levels of all forms meet, and numbers with any of them.
constexpr std::pair<Form, Form> People_Key_Forms[] = {{plain, values},   {values, plain},  {labels, plain},
                                                      {plain, labels},   {values, labels}, {labels, values},
                                                      {values, numbers}, {plain, numbers}, {labels, numbers}};

/// Rows of keys, "a" and "u" with what rows of keys, "u" and "b" bring them.
Rows Merge_Plainly(const Rows& target, const Rows& source, const Merge_Request& wanted)
{
    const auto key_of = [](const Texts& row) { return Texts(row.begin(), row.end() - 2); };
    Rows result;
    const auto add = [&](Texts row, const Texts* from) {
        const std::string given = from == nullptr ? "" : from->end()[-2];
        const bool leave = from == nullptr || (wanted.keep_present && !row.back().empty())
                           || (wanted.skip_missing && given.empty());
        if (!wanted.update_columns)
            row.push_back(given);
        else if (!leave)
            row.back() = given;
        row.push_back(from == nullptr ? "" : from->back());
        result.push_back(row);
    };
    std::map<Texts, std::vector<const Texts*>> partners;  // in the order of the keys
    for (const Texts& row : source)
        partners[key_of(row)].push_back(&row);
    for (auto row = target.begin(); row != target.end(); ++row) {
        const Texts key = key_of(*row);
        const std::vector<const Texts*>& rows = partners[key];
        const auto same = [&](const Texts& other) { return key_of(other) == key; };
        const auto place = static_cast<std::size_t>(std::count_if(target.begin(), row, same));
        add(*row, rows.empty() ? nullptr : rows[std::min(place, rows.size() - 1)]);
        const bool copies = wanted.fill_mode >= fill_copies && std::none_of(row + 1, target.end(), same);
        for (std::size_t i = place + 1; copies && i < rows.size(); ++i) {
            Texts copy = *row;
            copy.back() = result.back()[key.size() + 1];
            add(copy, rows[i]);
        }
    }
    for (const auto& [key, rows] : partners) {
        Texts row = key;
        row.resize(key.size() + 2);
        const auto same = [&, &wanted_key = key](const Texts& other) { return key_of(other) == wanted_key; };
        if (wanted.fill_mode == fill_all && std::ranges::none_of(target, same))
            for (const Texts* const from : rows)
                add(row, from);
    }
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

TEST_F(Join, Merges_On_As_Many_Keys_As_A_Reader_Needs)
{
    Merge_Request wanted;
    wanted.key_count = Most_Merge_Keys;
    Sheet* const sheets[] = {New_Sheet_With_Rows(2), New_Sheet_With_Rows(2)};
    for (std::size_t key = 0; key < Most_Merge_Keys; ++key) {  // only the last tells the rows apart
        const std::string name = "k" + std::to_string(key);
        const bool last = key + 1 == Most_Merge_Keys;
        wanted.target_keys[key] = Add_Cells(sheets[0], variate_column, name, {"1", last ? "2" : "1"});
        wanted.source_keys[key] = Add_Cells(sheets[1], variate_column, name, {last ? "2" : "1", "1"});
    }
    Add_Cells(sheets[1], variate_column, "x", {"20", "10"});
    wanted.target = sheets[0];
    wanted.source = sheets[1];
    ASSERT_TRUE(Merge_Sheets(wanted));
    EXPECT_EQ(Numbers_Of(*sheets[0]->last_column), (std::vector<double>{10, 20}));
    ++wanted.key_count;
    EXPECT_FALSE(Merge_Sheets(wanted));
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
        const Vocabulary& vocabulary = Vocabularies[random() % 4];
        const bool people = vocabulary.for_people || random() % 2 == 0;
        request.people.set(static_cast<std::size_t>(People_Rule::kept_levels), people);
        std::pair<Form, Form> forms[3];
        for (auto& pair : forms)
            do
                pair = people && random() % 2 == 0 ? People_Key_Forms[random() % std::size(People_Key_Forms)]
                                                   : Key_Forms[random() % std::size(Key_Forms)];
            while (&vocabulary != &Vocabularies[0] && (pair.first == plain || pair.second == plain));
        Sheet* sheets[2];
        for (std::size_t side = 0; side < 2; ++side) {
            const std::size_t rows = 1 + random() % 6;
            sheets[side] = New_Sheet_With_Rows(static_cast<std::int32_t>(rows));
            for (std::size_t key = 0; key < static_cast<std::size_t>(wanted.key_count); ++key) {
                const std::size_t levels = people ? 1 + random() % 3 : 3;
                Add_Form(sheets[side], side == 0 ? forms[key].first : forms[key].second,
                         "k" + std::to_string(key), Random_Cells(random, rows, levels, vocabulary),
                         vocabulary, levels);
                (side == 0 ? wanted.target_keys : wanted.source_keys)[key] = sheets[side]->last_column;
            }
            Texts places;
            for (std::size_t row = 1; row <= rows; ++row)
                places.push_back(std::to_string(row));
            if (side == 0)
                Add_Form(sheets[side], numbers, "a", places);
            const std::size_t levels = people ? 1 + random() % 3 : 3;
            Add_Form(sheets[side], vocabulary.forms[random() % vocabulary.forms.size()], "u",
                     Random_Cells(random, rows, levels, vocabulary), vocabulary, levels);
            if (side == 1)
                Add_Form(sheets[side], numbers, "b", places);
        }
        wanted.target = sheets[0];
        wanted.source = sheets[1];
        const bool text_and_not = (sheets[0]->last_column->type == text_column)
                                  != (Find_Column(sheets[1], "u")->type == text_column);
        if (wanted.update_columns && text_and_not && sheets[0]->last_column->type != factor_column)
            continue;  // such a pair becomes two columns, which the case of names below looks at
        const Rows expected = Merge_Plainly(By_Row(*sheets[0]), By_Row(*sheets[1]), wanted);
        ASSERT_TRUE(Merge_Sheets(wanted)) << "round " << round << Messages();
        ASSERT_EQ(Check_Sheet(*sheets[0]), "") << "round " << round;
        ASSERT_EQ(By_Row(*sheets[0]), expected) << "round " << round;
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
        std::vector<std::int32_t> map;
        std::string target, said;
    } cases[] = {
        {{}, {}, {"b", "a"}, {"a", "c", "b"}, 0, false, {2, 3, 1}, "b,a,c", ""},
        {{}, {}, {"b", "A"}, {"a", "B"}, 0, true, {2, 1}, "b,A", ""},
        {{10, 20}, {20, 30}, {"x", "y"}, {"y", "z"}, 0, false, {2, 3}, "x=10,y=20,z=30", ""},
        {{10, 0}, {0, 10.005, -10}, {}, {}, 0, false, {2, 3, 4}, "10,0,10.005,-10", ""},
        {{10, 0}, {0, 10.005, 10.05}, {}, {}, 1.5, false, {2, 1, 3}, "10,0,10.05", ""},
        {{}, {5, 6, 7}, {"x", "y"}, {}, 0, false, {}, "x,y,3", warning},
        {{5, 6}, {}, {}, {"p", "q", "r"}, 0, false, {}, "5,6,3", warning},
    };
    for (const auto& one : cases) {
        Start_Request("t");
        Sheet* const sheet = New_Sheet_With_Rows(1);
        Column* const target = New_Data_Column(sheet, factor_column, "t", 1);
        Column* const source = New_Data_Column(sheet, factor_column, "s", 1);
        Put_Levels(*target, one.target_values, one.target_labels);
        Put_Levels(*source, one.source_values, one.source_labels);
        std::vector<std::int32_t> map;
        EXPECT_TRUE(Merge_Factor_Levels(*target, *source, map, one.tolerance, one.ignore_case));
        EXPECT_EQ(map, one.map) << one.target;
        EXPECT_EQ(Levels_Of(*target), one.target);
        EXPECT_EQ(target->nlevels, 1 + std::ranges::count(one.target, ','));
        EXPECT_EQ(Messages(), one.said);
    }
}

TEST_F(Join, Refuses_Keys_That_Do_Not_Go_Together)
{
    const std::string types = "Columns k and k data types do not match.\n";
    const std::string no_labels = "Factor k does not have labels to match with text column k.\n";
    const std::string orders = "Mixed column types for k and k caused a clash of sort orders.\n";
    const std::tuple<Form, Form, std::string> cases[] = {
        {numbers, texts, types},    {texts, numbers, types}, {plain, texts, no_labels},
        {texts, values, no_labels}, {texts, labels, orders}, {numbers, values, orders}};
    for (const auto& [first, second, said] : cases) {
        Start_Request("t");
        Sheet* const target = New_Sheet_With_Rows(1);
        Sheet* const source = New_Sheet_With_Rows(1);
        Add_Form(target, first, "k", {"1"});
        Add_Form(source, second, "k", {"1"});
        Merge_Request wanted = By_First_Column(target, source);
        if (Column* const mixed = wanted.source_keys[0]; mixed->labels != nullptr)  // and not in order
            mixed->labels->value.text = mixed->texts.Store("z");
        else if (mixed->level_values != nullptr)
            mixed->level_values->value.number = 9;
        Add_Form(target, plain, "l", {"1"});
        Add_Form(source, plain, "l", {"1"});
        wanted.key_count = 2;
        wanted.target_keys[1] = Column_At(target, 2);
        wanted.source_keys[1] = Column_At(source, 2);
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
        EXPECT_FALSE(Merge_Sheets(By_First_Column(sheet, source)));
        EXPECT_FALSE(Append_Sheet(sheet, {.source = source}));
        EXPECT_EQ(Concatenate_Sheets(sheet, source, false), false) << refused;
    }
    EXPECT_FALSE(Append_Sheet(sheet, {.source = sheet}));
}

TEST_F(Join, Dates_Texts_And_Tolerances_Match)
{
    Sheet* const target = Sheet_Of("d V61|100|*");
    Sheet* const source = Sheet_Of("d V109612|*|109573.25; x V1|2|3");
    Column* const serials = Column_At(target, 1);
    Column* const days = Column_At(source, 1);
    serials->format = days->format = date_format_mark;
    days->date_form = 1;
    Row_At(target, 1)->restricted = 1;
    target->restricted_rows = target->restriction_active = 1;
    Merge_Request merge = By_First_Column(target, source);
    merge.tolerance = 0.5;
    ASSERT_TRUE(Merge_Sheets(merge));
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
        Sheet* const target = Sheet_Of(type == matrix_sheet ? "c M1" : "c V1", type);
        Sheet* const source = Sheet_Of("c Tx|y", type);
        source->label_state = label_state;
        ASSERT_TRUE(Append_Sheet(target, {.source = source}));
        EXPECT_EQ(Render(target, false).substr(1), std::string("1|") + cells);
        EXPECT_EQ(Messages(), said + ":\n");
    }
}

// A Vector of a file may have columns that end early: what moves rows gives them all of theirs first.
TEST_F(Join, Short_Columns_Lose_Nothing)
{
    const std::tuple<std::function<bool(Sheet*, Sheet*)>, const char*> cases[] = {
        {[](Sheet* target, Sheet* source) { return Append_Sheet(target, {.source = source}); },
         "k V4|3|2|1|2|9; t Tx|y|||p|q"},
        {[](Sheet* target, Sheet* source) {
             Merge_Request wanted = By_First_Column(target, source);
             wanted.update_columns = true;
             return Merge_Sheets(wanted);
         },
         "k V4|3|2|1|9; t Tx|y|p||q"},
        {[](Sheet* target, Sheet*) { return Sort_Sheet({.sheet = target, .key_index = {1}}); },
         "k V1|2|3|4; t T||y|x"},
    };
    for (const auto& [join, expected] : cases) {
        Start_Request("t");
        Sheet* const target = Sheet_Of("k V4|3|2|1; t Tx|y");
        target->has_short_columns = 1;
        ASSERT_TRUE(join(target, Sheet_Of("k V2|9; t Tp|q")));
        EXPECT_EQ(Check_Sheet(*target), "");
        EXPECT_EQ(Render(target), expected);
    }
}

TEST_F(Join, Matrices_Replace_Their_Columns_And_Diagonal_Ones_Take_None)
{
    Sheet* const target = Sheet_Of("a M1|2; b M3|4", matrix_sheet);
    EXPECT_TRUE(Concatenate_Sheets(target, Sheet_Of("B M5|6", matrix_sheet), true));
    EXPECT_EQ(Render(target, false), "M1|2; M5|6");
    EXPECT_FALSE(Append_Sheet(Sheet_Of("d M1|2", diagonal_matrix_sheet), {.source = Sheet_Of("e V7")}));
}

TEST_F(Join, Columns_Stand_Beside_Each_Other_Or_Take_The_Place_Of_Others)
{
    const std::pair<bool, const char*> cases[] = {
        {false, "A V1|2; b Tx|y; A_1 V7|8; B Tp|q; long Lr|s; d F1|2"},
        {true, "A V7|8; B Tp|q; long Lr|s; d F1|2"},
    };
    Sheet* const longer = Sheet_Of("long Tx|y");
    EXPECT_TRUE(Concatenate_Sheets(longer, Sheet_Of("LONG Lr|s"), true)) << "it was a Text before";
    EXPECT_EQ(Render(longer), "LONG Lr|s");
    for (const auto& [unique, expected] : cases) {
        Start_Request("t");
        Sheet* const target = Sheet_Of("A V1|2; b Tx|y");
        Sheet* const source = Sheet_Of("A V7|8; B Tp|q; long Lr|s; d F1|2");
        EXPECT_TRUE(Concatenate_Sheets(target, source, unique));
        EXPECT_EQ(Check_Sheet(*target), "");
        EXPECT_EQ(Render(target), expected);
        EXPECT_FALSE(Concatenate_Sheets(target, source, false)) << "nothing is left to move";
        EXPECT_FALSE(Concatenate_Sheets(target, New_Sheet_With_Rows(3), false));
    }
}

}  // namespace
}  // namespace ingester
