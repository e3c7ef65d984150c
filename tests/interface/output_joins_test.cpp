// Joins with an existing output, through the export.
#include "host_fixture.h"

namespace ingester {
namespace {

using Output_Joins = Host_Test;

const std::string Old = "plot,kind,yield\n1,oats,2.5\n2,rye,*\n3,oats,4\n";

TEST_F(Output_Joins, Put_Old_And_New_Data_Together)
{
    const struct {
        std::string input, in, out, text;
    } cases[] = {
        {"yield,plot\n7,4\n", "n.csv", "@", "plot,kind,yield|1,oats,2.5|2,rye,*|3,oats,4|4,,7|"},
        {"a,b\n4,wheat\n", "n.csv", "@=N", "plot,kind,yield|1,oats,2.5|2,rye,*|3,oats,4|4,wheat,*|"},
        {"plot,wet\n9,yes\n", "n.csv", "@,from,june",
         "plot,kind,yield,from,wet|1,oats,2.5,Original,|2,rye,*,Original,|3,oats,4,Original,|9,,*,june,yes|"},
        {"plot\n9\n", "n.csv", "@,from", "plot,kind,yield,from|1,oats,2.5,1|2,rye,*,1|3,oats,4,1|9,,*,2|"},
        {"yield,height\n1,2\n3,4\n5,6\n", "n.csv", "&",
         "plot,kind,yield,yield1,height|1,oats,2.5,1,2|2,rye,*,3,4|3,oats,4,5,6|"},
        {"YIELD,height\n1,2\n3,4\n5,6\n", "n.csv", "&U",
         "plot,kind,YIELD,height|1,oats,1,2|2,rye,3,4|3,oats,5,6|"},
        {"height\n2\n4\n6\n", "n.csv", "^from,'june'",
         "plot,kind,yield,height,from|1,oats,2.5,2,june|2,rye,*,4,june|3,oats,4,6,june|"},
        {"plot,b\n3,x\n9,y\n", "n.csv", "%", "plot,kind,yield,b|1,oats,2.5,|2,rye,*,|3,oats,4,x|9,,*,y|"},
        {"sort,b\nrye,1\noats,2\noats,3\noats,4\nbean,5\n", "k.csv", "%=1M",
         "plot,kind,yield,b|1,oats,2.5,2|2,rye,*,1|3,oats,4,3|3,oats,4,4|"},
        {"sort,yield\noats,9\nbean,5\n", "k.csv", "%=1UM", "plot,kind,yield|1,oats,9|2,rye,*|3,oats,9|"},
        {"x;plot;b\n7;2;u\n8;1;v\n", "two.csv/z=;", "%=4N",
         "plot,kind,yield,x,b|1,oats,2.5,8,v|2,rye,*,7,u|3,oats,4,*,|"},
        {"plot,kind,yield\n5,NA,6\n", "n.csv/x=NA/lt=0", "@/mv=*",
         "plot,kind,yield|1,oats,2.5|2,rye,*|3,oats,4|5,,6|"},
    };
    Put("k.mrg", "1\nkind=sort\n");
    Put("two.mrg", "1\nplot\n");
    for (const auto& one : cases) {
        Put("o.csv", Old);
        Put(one.in.substr(0, one.in.find('/')), one.input);
        EXPECT_EQ(Convert(one.in, "o.csv/h/-/u/" + one.out), (Host_Answer{0, ""})) << one.out;
        EXPECT_EQ(On_One_Line(Get("o.csv")), one.text) << one.out;
    }
}

TEST_F(Output_Joins, Factors_Of_A_Host_File_Take_The_Texts_Of_Others)
{
    Put("n.csv", "kind!,year!\noats,2001\nrye,2003\n");
    ASSERT_EQ(Convert("n.csv", "o.tss").first, 0);
    Put("n.csv", "kind,year\nbean,2002\nrye,2001\n");
    EXPECT_EQ(Convert("n.csv", "o.tss/@"),
              (Host_Answer{0, "Some column data has not been appended due to a data type mismatch.\n"
                              "(e.g. text column data cannot be inserted into numeric column).\n"
                              "Columns were:\nyear.\n:\n"}))
        << "2002 went to the nearest level";
    Put("n.csv", "year,rain\n2001,5\n2004,6\n2003,7\n");
    Put("n.mrg", "1\nyear\n");
    EXPECT_EQ(Convert("n.csv", "o.tss/%=1"), (Host_Answer{0, ""}));
    ASSERT_EQ(Convert("o.tss", "o.csv/h/-/u").first, 0);
    EXPECT_EQ(On_One_Line(Get("o.csv")),
              "kind,year,rain|oats,2001,5|rye,2003,7|bean,2001,5|rye,2001,5| ,2004,6|");
}

TEST_F(Output_Joins, Join_With_One_Sheet_Of_A_Book)
{
    const auto rows_of = [this](const std::string& sheet) {
        EXPECT_EQ(Call({Request_Name("o.tbk"), Request_Name("o.csv") + "/h/-/u/n", sheet}).first, 0);
        return std::ranges::count(Get("o.csv"), 'x');
    };
    const std::string unlike = "The table in the output has another number of rows than the new data.\n"
                               "Could not concatenate data.\n:\n";
    const auto not_found = [this](const std::string& sheet) {
        return "Warning: sheet " + sheet + " not found in file " + Request_Name("o.tbk") + ".\n:\n";
    };
    Put("n.csv", "plot,b\n1,x\n");
    for (const char* const book : {"o.tbk/a=A", "o.tbk/a=B", "i.tbk/a=B", "i.tbk/a=A"})
        ASSERT_EQ(Convert("n.csv", book).first, 0);
    const struct {
        std::string input, sheet, output, said;
        long rows_of_a, rows_of_b;
    } steps[] = {
        {"n.csv", "", "o.tbk/@/!=b", "", 1, 2},
        {"n.csv", "", "o.tbk/@", "Using sheet A within the file.\n:\n", 2, 2},
        {"n.csv", "", "o.tbk/%=U/!=none", not_found("none"), 2, 2},
        {"n.csv", "", "o.tbk/&/!='B'", unlike, 2, 2},
        {"n.csv", "b", "o.tbk/@", "", 2, 3},
        {"i.tbk", "2", "o.tbk/@", "", 3, 3},
        {"i.tbk", "A", "o.tbk/@/!=B", "", 3, 4},
        {"n.csv", "foo", "o.tbk/@", not_found("foo"), 4, 4},
    };
    for (const auto& [input, sheet, output, said, rows_of_a, rows_of_b] : steps) {
        EXPECT_EQ(Call({Request_Name(input), Request_Name(output), sheet}),
                  (Host_Answer{said == unlike ? 15 : 0, said}))
            << output;
        EXPECT_EQ(std::pair(rows_of("A"), rows_of("B")), std::pair(rows_of_a, rows_of_b)) << output;
    }
    EXPECT_EQ(Convert("o.tbk/w", "o.csv/h/-/u/n").first, 0);
    EXPECT_EQ(On_One_Line(Get("o.csv")), "A|B|");
}

TEST_F(Output_Joins, That_Fail_Or_Would_Lose_Old_Data_Leave_It_As_It_Was)
{
    const std::string appended = "Could not append data.\n";
    const std::string concatenated = "Could not concatenate data.\n";
    const std::string merged = "Could not merge data.\n";
    const std::string unwritten = "Output file not written.\n";
    const std::string kept = "Error: The output was left as it is, since ";
    const std::string words = "a,t\n5,two words\n";
    std::string names = "a,t";
    std::string row = "1,x";
    for (int i = 10000; i < 16000; ++i) {
        names += ",column" + std::to_string(i);
        row += ",1";
    }
    const struct {
        std::string old, input, keys, output;
        int status;
        std::string said;
    } cases[] = {
        {Old, "plot,month,name\n1,2,x\n", "", "o.csv/&", 15,
         "The table in the output has another number of rows than the new data.\n" + concatenated},
        {Old, "plot\n1\n", "", "o.csv/@,kind", 13,
         "Selected column to indicate append source is not a factor.\n" + appended},
        {Old, "plot\n1\n", "1\nabsent\n", "o.csv/%=1", 17,
         "Merge key absent in WITH not found in OUTFILE.\n" + merged},
        {Old, "plot,b\n1,2\n", "1\nplot=absent\n", "o.csv/%=1", 17,
         "Merge key absent in MATCH not found in " + Request_Name("o.csv") + ".\n" + merged},
        {Old, "plot\n1\n", "2\nplot\n", "o.csv/%=2", 17, "Merge columns not found in files.\n"},
        {Old, "plot\n1\n", "2\nplot\n\n", "o.csv/%=2", 17, "Merge columns not found in files.\n"},
        {Old, "plot\n1\n", "5\nplot\nx\nx\nx\nx\n", "o.csv/%=5", 17,
         "Warning: A merge has four keys at the most; the first four of 5 were used.\n"
         "Merge key x in WITH not found in OUTFILE.\n"
             + merged},
        {"", "a\n1\n", "", "o.csv/&", 2, "Input file is empty.\n" + concatenated},
        {"\1\2\3\4", "a\n1\n", "", "o.csv/%", 3, merged},
        {"PK\3\4", "a\n1\n", "", "o.csv/@", 11, appended},
        {"a,b\n", "a\n1\n", "", "o.csv/@", 4, appended},
        {"a,t\n1,x\n\n2,y\n", words, "", "o.csv/h/@", 13,
         "Warning: An empty line stands behind row 1, and what follows it was not read.\n" + kept
             + "lines behind an empty line of it would be lost.\n" + appended},
        {"a,t\n1," + std::string(10001, 'x') + "\n", words, "", "o.tab/@", 13,
         "Warning: 1 texts of more than 10000 characters were cut.\n" + kept + "texts of it would be cut.\n"
             + appended},
        {"a t b\n1 x 2\n3   4\n", words, "", "o.txt/@", 13,
         kept + "its lines differ in their number of fields.\n" + appended},
        {" a   t  u\n 1 a b   \n 2 xyz yy\n", words, "", "o.txt/@", 13,
         kept + "texts with blanks, or empty ones, have put its cells out of their columns.\n" + appended},
        {"\"a\" \"t\"\n1 x\n", words, "", "o.txt/@", 13,
         kept + "lines in quotes at its head would be lost.\n" + appended},
        {"a t\n1 x\n", words, "", "o.txt/@", 6,
         kept + "texts with blanks, or empty ones, can't be told apart in columns of fixed width.\n"
             + unwritten},
        {names + "\n" + row + "\n", words, "", "o.csv/h/@", 6,
         kept + "lines of it would be broken.\n" + unwritten},
    };
    for (const auto& [old, input, keys, output, status, said] : cases) {
        const std::string file = output.substr(0, output.find('/'));
        Put(file, old);
        Put("n.csv", input);
        Put("n.mrg", keys);
        const std::string before = Files();
        EXPECT_EQ(Convert("n.csv", output), (Host_Answer{status, said + ":\n"})) << old.substr(0, 50);
        EXPECT_EQ(Get(file), old);
        EXPECT_EQ(Files(), before);
    }
    EXPECT_EQ(Convert("n.csv", "absent.csv/@"),
              (Host_Answer{2, "Input file could not be opened.\n" + appended + ":\n"}));
}

TEST_F(Output_Joins, Know_Their_Own_Titles_And_Names)
{
    Put("n.csv", "a,t\n5,z\n");
    for (const char* const output : {"new.txt", "new.txt/@"})
        EXPECT_EQ(Convert("n.csv", output), (Host_Answer{0, ""})) << "its own title is no loss";
    const std::string joined = Get("new.txt");
    EXPECT_EQ(joined.substr(joined.find('\n')), "\n a t\r\n 5 z\r\n 5 z\r\n");
    Put("n.csv", "1,b\n7,8\n");
    Put("o.csv", "1,b\n5,6\n");
    EXPECT_EQ(Convert("n.csv/y", "o.csv/h/@"), (Host_Answer{0, ""}));
    EXPECT_EQ(Get("o.csv"), "%1,b\r\n5,6\r\n7,8\r\n") << "told that both have names";
    Put("n.csv", "a,t\n5,z\n*,y\n");
    for (const char* const output : {"new.csv/h/-/mv=none", "new.csv/h/-/mv=none/@"})
        EXPECT_EQ(Convert("n.csv", output), (Host_Answer{0, ""})) << "its own missing values are numbers";
    EXPECT_EQ(On_One_Line(Get("new.csv")), "a,t|5,z|none,y|5,z|none,y|");
}

}  // namespace
}  // namespace ingester
