// Other programs read what is written here, and what they write is read, where they are installed.
#include "statfiles/sas/sas.h"
#include "statfiles/shared/stat_fixture.h"
#include "statfiles/spss/spss.h"

#include <cstdio>
#include <memory>
#include <random>

namespace ingester {

namespace {

std::string Output_Of(const std::string& command)
{
    struct Close {
        void operator()(std::FILE* pipe) const { ::pclose(pipe); }
    };
    const std::unique_ptr<std::FILE, Close> pipe(::popen((command + " 2>/dev/null").c_str(), "r"));
    std::string text;
    char block[4096];
    while (const std::size_t got = std::fread(block, 1, sizeof block, pipe.get()))
        text.append(block, got);
    return text;
}

/// A program, and how it prints the numbers of column `x` of a transport file, a line each.
struct Judge {
    std::string name, found, command;
};

const std::string Print_X = "writeLines(ifelse(is.na(d[[1]]),\"*\",sprintf(\"%.17g\",d[[1]])))'";

const Judge Judges[] = {
    {"haven", "Rscript -e 'cat(requireNamespace(\"haven\"))'",
     "Rscript -e 'd<-haven::read_xpt(\"w.xpt\");" + Print_X},
    {"foreign", "Rscript -e 'cat(requireNamespace(\"foreign\"))'",
     "Rscript -e 'd<-foreign::read.xport(\"w.xpt\");" + Print_X},
    {"pandas", "/usr/bin/python3 -c 'import pandas; print(\"TRUE\")'",
     "/usr/bin/python3 -c 'import pandas as p\nfor v in p.read_sas(\"w.xpt\").iloc[:,0]: print(\"*\" if v!=v "
     "else "
     "\"%.17g\"%v)'"},
};

class Stat_Judges : public Stat_Test {
protected:
    [[nodiscard]] std::string In_Folder(const std::string& command) const
    {
        return Output_Of("cd '" + Path("") + "' && " + command);
    }
    [[nodiscard]] bool Is_There(const std::string& found) const
    {
        return In_Folder(found).find("TRUE") != std::string::npos;
    }
};

TEST_F(Stat_Judges, Read_What_Is_Written)
{
    constexpr std::int32_t rows = 500;
    std::mt19937_64 random(11);
    Column& column = *Lone_Column(variate_column, Texts(rows, "*"));
    Add_Cells(column.sheet, text_column, "t", Texts(rows, "text"));
    std::string expected;
    for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        if (random() % 10 != 0)
            cell->value.number = std::ldexp(1 + std::ldexp(static_cast<double>(random() >> 12), -52),
                                            static_cast<int>(random() % 400) - 200)
                                 * (random() % 2 == 0 ? 1 : -1);
        expected += Is_Present(*column.sheet, cell->value.number) ? Format_Text("%.17g\n", cell->value.number)
                                                                  : "*\n";
    }
    ASSERT_TRUE(Write_Sas_Transport(column.sheet, Path("w.xpt").c_str()));
    bool any = false;
    for (const Judge& judge : Judges)
        if (Is_There(judge.found)) {
            any = true;
            EXPECT_TRUE(In_Folder(judge.command) == expected) << judge.name;
        } else {
            std::printf("%s is not installed, and was not asked\n", judge.name.c_str());
        }
    if (!any)
        GTEST_SKIP() << "none of the programs is installed";
}

TEST_F(Stat_Judges, Write_What_Is_Read)
{
    if (!Is_There(Judges[0].found))
        GTEST_SKIP() << "haven is not installed";
    ASSERT_NE(In_Folder("Rscript -e 'library(haven); d <- data.frame(x=c(0.1,NA,-3e70), "
                        "t=c(\"ab\",\"\",strrep(\"y\",300)),"
                        "d=as.Date(c(\"1960-01-01\",\"2024-02-29\",NA)));"
                        "d$l <- labelled(c(1,2,NA), c(one=1,two=2,three=3));"
                        "write_sav(d,\"a.sav\",compress=\"none\");write_sav(d,\"b.sav\",compress=\"byte\");"
                        "write_sav(d,\"c.sav\",compress=\"zsav\");d$t <- substr(d$t,1,80);"
                        "write_xpt(d,\"a.xpt\",version=5);write_xpt(d,\"b.xpt\",version=8);cat(\"done\")'"),
              "");
    for (const char* const name : {"a.sav", "b.sav", "c.sav"}) {
        EXPECT_EQ(Render(Read_Bytes(Read_Spss_System, Get(name), name, All_For_People)),
                  "x V0.1|*|-3e+70; t Lab||300 characters; d V131428|154863|*; l F1|2|*");
        EXPECT_EQ(Levels_Of(Current_Sheet, 4), "one two");
    }
    for (const char* const name : {"a.xpt", "b.xpt"})
        EXPECT_EQ(Render(Read_Bytes(Read_Sas_Transport, Get(name), name, All_For_People)),
                  "x V0.1|*|-3e+70; t Tab||" + std::string(80, 'y') + "; d V131428|154863|*; l V1|2|*");
}

TEST_F(Stat_Judges, Portable_Files_Hold_The_Same)
{
    if (Output_Of("pspp --version").empty())
        GTEST_SKIP() << "pspp is not installed";
    Put("make.sps", "DATA LIST LIST /x (F8.2) t (A12).\nBEGIN DATA\n-5.5 \"a text\"\n900 \"\"\n. \"b\"\n.125 "
                    "\"c\"\nEND DATA.\n"
                    "VALUE LABELS x 900 \"many\".\nSAVE OUTFILE=\"a.sav\".\nEXPORT OUTFILE=\"a.por\".\n");
    static_cast<void>(In_Folder("pspp make.sps"));
    const std::string cells = " F1|3|*|2; ";
    EXPECT_EQ(Render(Read_Bytes(Read_Spss_System, Get("a.sav"), "a.sav")), "x" + cells + "t Ta text||b|c");
    EXPECT_EQ(Levels_Of(Current_Sheet), "-5.5=-5.5 0.125=0.125 900=many");
    EXPECT_EQ(Render(Read_Bytes(Read_Spss_Portable, Get("a.por"), "a.por")), "X" + cells + "T Ta text||b|c");
    EXPECT_EQ(Levels_Of(Current_Sheet), "-5.5=-5.5 0.125=0.125 900=many");
}

}  // namespace

}  // namespace ingester
