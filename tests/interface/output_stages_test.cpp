// How outputs are written by what their format's row says, with rows of the test's own.
#include "interface/pipeline/stages.h"
#include "model/sheet.h"
#include "platform/files.h"
#include "support/request_fixture.h"

namespace ingester {
namespace {

class Output_Stages : public Request_Test {
protected:
    /// An output that is there, of a format that a test makes up.
    void Begin(Request_Run& run, const Format_Driver& format) const
    {
        Put("old.toy", "precious");
        run.outfile = Request_Name("old.toy");
        run.output = &format;
        New_Sheet_With_Rows(1);
        request.Add_To_Output = true;
        EXPECT_EQ(Name_Temporary_Output(run), Done);
    }
};

/// As a full disk leaves it.
bool Write_Half(Sheet* /*sheet*/, const char* file_name)
{
    Output_File file;
    if (!file.Open(file_name))
        return false;
    file.Write("half");
    return file.Close() && false;
}

std::optional<std::vector<std::string>> One_Sheet(const char* /*file_name*/)
{
    return std::vector<std::string>{"one"};
}

TEST_F(Output_Stages, Go_Around_An_Output_That_Can_Only_Be_Written_Anew)
{
    constexpr Format_Driver lists_sheets = {
        .code = 6, .name = "toy", .sheet_names = One_Sheet, .extensions = ".toy", .write = Write_Half};
    {
        Request_Run run;
        Begin(run, lists_sheets);
        EXPECT_EQ(run.temp_output, Request_Name("old.$$$"));
        EXPECT_NE(Write_Output(run), Done);
        EXPECT_EQ(Get("old.$$$"), "half");
    }
    EXPECT_EQ(Get("old.toy"), "precious");
    EXPECT_EQ(Files(), "old.toy t.ERR");
}

std::string replaced_page;

bool Add_One(Sheet* /*sheet*/, const char* /*file_name*/)
{
    replaced_page = "added";
    return true;
}

bool Replace_One(Sheet* /*sheet*/, const char* /*file_name*/, std::string_view page)
{
    replaced_page = page;
    return true;
}

TEST_F(Output_Stages, Add_And_Replace_By_The_Row)
{
    constexpr Format_Driver updates = {.code = 6,
                                       .name = "toy",
                                       .extensions = ".toy",
                                       .write = Write_Half,
                                       .add = Add_One,
                                       .replace = Replace_One};
    for (const bool replaces : {false, true}) {
        request.Replace_Sheet_Asked = replaces;
        request.Output_Sheet_Name = "two";
        Request_Run run;
        Begin(run, updates);
        EXPECT_EQ(run.temp_output, run.outfile);
        EXPECT_EQ(Write_Output(run), Done);
        EXPECT_EQ(replaced_page, replaces ? "two" : "added");
        run.writing = false;
    }
    EXPECT_EQ(Get("old.toy"), "precious");
}

TEST_F(Output_Stages, Adding_To_What_Is_Not_There_Writes_It)
{
    Put("a.csv", "k,v\n1,5\n");
    std::int32_t rows = 0;
    for (const char* const option : {"/a=Two", "/r=Two"}) {
        EXPECT_EQ(Process_Request(Request_Name("a.csv"), Request_Name("new.tab") + option, rows), Done);
        EXPECT_EQ(On_One_Line(Get("new.tab")), "k\tv|1\t5|");
        Start_Request("t");
        EXPECT_EQ(Process_Request(Request_Name("a.csv"), Request_Name("new.tab") + option, rows),
                  Request_Status::not_imported);
        EXPECT_EQ(On_One_Line(Get("new.tab")), "k\tv|1\t5|") << "comma text can't be added to";
        std::filesystem::remove(Path("new.tab"));
        Start_Request("t");
    }
}

}  // namespace
}  // namespace ingester
