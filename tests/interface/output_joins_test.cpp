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
        {"yield,plot\n7,4\n", "n.csv", "o.csv/h/-/u/@",
         "plot,kind,yield\r\n1,oats,2.5\r\n2,rye,*\r\n3,oats,4\r\n4,,7\r\n"},
        {"a,b\n4,wheat\n", "n.csv", "o.csv/h/-/u/@=N",
         "plot,kind,yield\r\n1,oats,2.5\r\n2,rye,*\r\n3,oats,4\r\n4,wheat,*\r\n"},
        {"plot,wet\n9,yes\n", "n.csv", "o.csv/h/-/u/@,from,june",
         "plot,kind,yield,from,wet\r\n1,oats,2.5,Original,\r\n2,rye,*,Original,\r\n3,oats,4,Original,\r\n9,,*"
         ",june,yes\r\n"},
        {"plot\n9\n", "n.csv", "o.csv/h/-/u/@,from",
         "plot,kind,yield,from\r\n1,oats,2.5,1\r\n2,rye,*,1\r\n3,oats,4,1\r\n9,,*,2\r\n"},
        {"yield,height\n1,2\n3,4\n5,6\n", "n.csv", "o.csv/h/-/u/&",
         "plot,kind,yield,yield1,height\r\n1,oats,2.5,1,2\r\n2,rye,*,3,4\r\n3,oats,4,5,6\r\n"},
        {"YIELD,height\n1,2\n3,4\n5,6\n", "n.csv", "o.csv/h/-/u/&U",
         "plot,kind,YIELD,height\r\n1,oats,1,2\r\n2,rye,3,4\r\n3,oats,5,6\r\n"},
        {"height\n2\n4\n6\n", "n.csv", "o.csv/h/-/u/^from,'june'",
         "plot,kind,yield,height,from\r\n1,oats,2.5,2,june\r\n2,rye,*,4,june\r\n3,oats,4,6,june\r\n"},
        {"plot,b\n3,x\n9,y\n", "n.csv", "o.csv/h/-/u/%",
         "plot,kind,yield,b\r\n1,oats,2.5,\r\n2,rye,*,\r\n3,oats,4,x\r\n9,,*,y\r\n"},
        {"sort,b\nrye,1\noats,2\noats,3\noats,4\nbean,5\n", "k.csv", "o.csv/h/-/u/%=1M",
         "plot,kind,yield,b\r\n1,oats,2.5,2\r\n2,rye,*,1\r\n3,oats,4,3\r\n3,oats,4,4\r\n"},
        {"sort,yield\noats,9\nbean,5\n", "k.csv", "o.csv/h/-/u/%=1UM",
         "plot,kind,yield\r\n1,oats,9\r\n2,rye,*\r\n3,oats,9\r\n"},
        {"x;plot;b\n7;2;u\n8;1;v\n", "two.csv/z=;", "o.csv/h/-/u/%=4N",
         "plot,kind,yield,x,b\r\n1,oats,2.5,8,v\r\n2,rye,*,7,u\r\n3,oats,4,*,\r\n"},
        {"plot,kind,yield\n5,NA,6\n", "n.csv/x=NA/lt=0", "o.csv/h/-/u/@/mv=*",
         "plot,kind,yield\r\n1,oats,2.5\r\n2,rye,*\r\n3,oats,4\r\n5,,6\r\n"},
    };
    Put("k.mrg", "1\nkind=sort\n");
    Put("two.mrg", "1\nplot\n");
    for (const auto& one : cases) {
        Put("o.csv", Old);
        Put(one.in.substr(0, one.in.find('/')), one.input);
        EXPECT_EQ(Convert(one.in, one.out), (Host_Answer{0, ""})) << one.out;
        EXPECT_EQ(Get("o.csv"), one.text) << one.out;
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
    EXPECT_EQ(Get("o.csv"),
              "kind,year,rain\r\noats,2001,5\r\nrye,2003,7\r\nbean,2001,5\r\nrye,2001,5\r\n ,2004,6\r\n");
}

TEST_F(Output_Joins, Join_With_One_Sheet_Of_A_Book)
{
    const auto Sheets = [this] {
        std::string text;
        for (const char* const name : {"A", "B"}) {
            EXPECT_EQ(Call({Request_Name("o.tbk"), Request_Name("o.csv") + "/h/-/u/n", name}).first, 0);
            text += Get("o.csv") + "|";
        }
        EXPECT_EQ(Call({Request_Name("o.tbk") + "/w", Request_Name("o.csv") + "/h/-/u/n"}).first, 0);
        text += Get("o.csv");
        std::erase(text, '\r');
        std::ranges::replace(text, '\n', ' ');
        return text;
    };
    Put("n.csv", "plot,b\n1,x\n");
    ASSERT_EQ(Convert("n.csv", "o.tbk/a=A").first, 0);
    ASSERT_EQ(Convert("n.csv", "o.tbk/a=B").first, 0);
    ASSERT_EQ(Convert("n.csv", "i.tbk/a=B").first, 0);
    ASSERT_EQ(Convert("n.csv", "i.tbk/a=A").first, 0);
    const struct {
        std::string input, sheet, output, said, sheets;
    } steps[] = {
        {"n.csv", "", "o.tbk/@/!=b", "", "1,x |1,x 1,x |A B "},
        {"n.csv", "", "o.tbk/@", "Using sheet A within the file.\n:\n", "1,x 1,x |1,x 1,x |A B "},
        {"n.csv", "", "o.tbk/%=U/!=none",
         "Warning: sheet none not found in file " + Request_Name("o.tbk") + ".\n:\n",
         "1,x 1,x |1,x 1,x |A B "},
        {"n.csv", "", "o.tbk/&/!='B'", "Could not concatenate data.\n:\n", "1,x 1,x |1,x 1,x |A B "},
        {"n.csv", "b", "o.tbk/@", "", "1,x 1,x |1,x 1,x 1,x |A B "},
        {"i.tbk", "2", "o.tbk/@", "", "1,x 1,x 1,x |1,x 1,x 1,x |A B "},
        {"i.tbk", "A", "o.tbk/@/!=B", "", "1,x 1,x 1,x |1,x 1,x 1,x 1,x |A B "},
        {"n.csv", "foo", "o.tbk/@",
         "Warning: sheet foo not found in file " + Request_Name("o.tbk") + ".\n:\n",
         "1,x 1,x 1,x 1,x |1,x 1,x 1,x 1,x |A B "},
    };
    for (const auto& [input, sheet, output, said, sheets] : steps) {
        EXPECT_EQ(Call({Request_Name(input), Request_Name(output), sheet}),
                  (Host_Answer{said.starts_with("Could") ? 15 : 0, said}))
            << output;
        EXPECT_EQ(Sheets(), sheets) << output;
    }
}

TEST_F(Output_Joins, That_Fail_Leave_The_Old_Output_As_It_Was)
{
    const std::string f = Request_Name("");
    const std::string appended = "Could not append data.\n";
    const std::string concatenated = "Could not concatenate data.\n";
    const std::string merged = "Could not merge data.\n";
    Put("n.csv", "plot,month,name\n1,2,x\n");
    Put("n.mrg", "1\nabsent\n");
    Put("m.csv", "plot,b\n1,2\n");
    Put("m.mrg", "1\nplot=absent\n");
    Put("t.csv", "plot,b\n1,2\n");
    Put("t.mrg", "1\nkind=plot\n");
    Put("one.csv", "plot\n1\n");
    Put("two.mrg", "2\nplot\n");
    Put("two.csv", "plot\n1\n");
    Put("gap.csv", "plot\n1\n");
    Put("gap.mrg", "2\nplot\n\n");
    Put("five.csv", "plot\n1\n");
    Put("five.mrg", "5\nplot\nx\nx\nx\nx\n");
    Put("zip.csv", "PK\3\4");
    Put("none.csv", "");
    Put("odd.csv", std::string("\1\2\3\4", 4));
    Put("head.csv", "a,b\n");
    const std::tuple<std::string, std::string, int, std::string> cases[] = {
        {"n.csv", "o.csv/&", 15, concatenated},
        {"n.csv", "o.csv/@,kind", 13,
         "Selected column to indicate append source is not a factor.\n" + appended},
        {"n.csv", "o.csv/%=1", 17, "Merge key absent in WITH not found in OUTFILE.\n" + merged},
        {"m.csv", "o.csv/%=1", 17, "Merge key absent in MATCH not found in " + f + "o.csv.\n" + merged},
        {"t.csv", "o.csv/%=1", 17, "Columns kind and plot data types do not match.\n" + merged},
        {"two.csv", "o.csv/%=2", 17, "Merge columns not found in files.\n"},
        {"gap.csv", "o.csv/%=2", 17, "Merge columns not found in files.\n"},
        {"five.csv", "o.csv/%=5", 17,
         "Warning: A merge has four keys at the most; the first four of 5 were used.\n"
         "Merge key x in WITH not found in OUTFILE.\n"
             + merged},
        {"n.csv", "absent.csv/@", 2, "Input file could not be opened.\n" + appended},
        {"n.csv", "none.csv/&", 2, "Input file is empty.\n" + concatenated},
        {"n.csv", "odd.csv/%", 3, merged},
        {"n.csv", "zip.csv/@", 11, appended},
        {"n.csv", "head.csv/@", 4, appended},
    };
    for (const auto& [input, output, status, said] : cases) {
        Put("o.csv", Old);
        const std::string before = Files();
        EXPECT_EQ(Convert(input, output), (Host_Answer{status, said + ":\n"})) << output;
        EXPECT_EQ(Get("o.csv"), Old);
        EXPECT_EQ(Files(), before);
    }
}

TEST_F(Output_Joins, That_Would_Lose_Old_Data_Are_Refused)
{
    const std::string kept = "Error: The output was left as it is, since ";
    const std::string appended = "Could not append data.\n";
    const std::string end = "Warning: An empty line stands behind row 1, and what follows it was not read.\n";
    std::string names = "a,t";
    std::string row = "1,x";
    for (int i = 10000; i < 16000; ++i) {
        names += ",column" + std::to_string(i);
        row += ",1";
    }
    const std::tuple<std::string, std::string, int, std::string> cases[] = {
        {"a,t\n1,x\n\n2,y\n", "o.csv", 13,
         end + kept + "lines behind an empty line of it would be lost.\n" + appended},
        {"a,t\n1," + std::string(10001, 'x') + "\n", "o.tab", 13,
         "Warning: 1 texts of more than 10000 characters were cut.\n" + kept + "texts of it would be cut.\n"
             + appended},
        {"a t b\n1 x 2\n3   4\n", "o.txt", 13,
         kept + "its lines differ in their number of fields.\n" + appended},
        {"a\n1\n2 3\n", "o.txt", 13, kept + "its lines differ in their number of fields.\n" + appended},
        {" a   t  u\n 1 a b   \n 2 xyz yy\n", "o.txt", 13,
         kept + "texts with blanks, or empty ones, have put its cells out of their columns.\n" + appended},
        {"\"a\" \"t\"\n1 x\n", "o.txt", 13, kept + "lines in quotes at its head would be lost.\n" + appended},
        {"a t\n1 x\n", "o.txt", 6,
         kept
             + "texts with blanks, or empty ones, can't be told apart in columns of fixed width.\n"
               "Output file not written.\n"},
        {names + "\n" + row + "\n", "o.csv", 6,
         kept + "lines of it would be broken.\nOutput file not written.\n"},
    };
    for (const auto& [old, output, status, said] : cases) {
        Put(output, old);
        Put("n.csv", "a,t\n5,two words\n");
        EXPECT_EQ(Convert("n.csv", output + "/h/@"), (Host_Answer{status, said + ":\n"}))
            << old.substr(0, 50);
        EXPECT_EQ(Get(output), old);
    }
    Put("n.csv", "a,t\n5,z\n");
    for (const char* const output : {"new.txt", "new.txt/@"})
        EXPECT_EQ(Convert("n.csv", output), (Host_Answer{0, ""})) << "its own title is no loss";
    const std::string joined = Get("new.txt");
    EXPECT_EQ(joined.substr(joined.find('\n')), "\n a t\r\n 5 z\r\n 5 z\r\n");
    Put("n.csv", "1,b\n7,8\n");
    Put("o.csv", "1,b\n5,6\n");
    EXPECT_EQ(Convert("n.csv/y", "o.csv/h/@"), (Host_Answer{0, ""}));
    EXPECT_EQ(Get("o.csv"), "%1,b\r\n5,6\r\n7,8\r\n") << "told that both have names";
}

}  // namespace
}  // namespace ingester
