// The clipboard of a real display, which is there for as long as a test runs.
#include "host_fixture.h"

#include <csignal>
#include <cstdio>
#include <cstdlib>

#include <unistd.h>

namespace ingester {
namespace {

class Clipboard_Test : public Host_Test {
protected:
    void SetUp() override
    {
        Host_Test::SetUp();
        ::unsetenv("WAYLAND_DISPLAY");
        int number = 0;
        server_ = ::popen("echo $$; exec Xvfb -displayfd 1 -screen 0 64x64x8 2>/dev/null", "r");
        if (server_ == nullptr || std::fscanf(server_, "%d %d", &process_, &number) != 2)
            GTEST_SKIP() << "Xvfb is not installed, or does not run here";
        if (std::system("command -v xclip >/dev/null") != 0)
            GTEST_SKIP() << "xclip is not installed";
        ::setenv("DISPLAY", (":" + std::to_string(number)).c_str(), 1);
    }
    void TearDown() override
    {
        ::unsetenv("DISPLAY");
        if (process_ > 0)
            ::kill(process_, SIGTERM);
        if (server_ != nullptr)
            ::pclose(server_);
        Host_Test::TearDown();
    }

    /// Whether the clipboard holds that text; an owner before may still answer for a moment.
    [[nodiscard]] bool Comes_To_Hold(const std::string& text) const
    {
        const std::string get = "xclip -selection clipboard -o -t UTF8_STRING >" + Path("held");
        for (int tries = 0; tries < 100; ++tries, ::usleep(50'000))
            if (std::system(get.c_str()) == 0 && Get("held") == text)
                return true;
        return false;
    }

private:
    std::FILE* server_ = nullptr;
    int process_ = 0;
};

const std::string Took = "Data read from the clipboard.\n:\n";
const std::string Gave = "Data written to the clipboard.\n:\n";

TEST_F(Clipboard_Test, Takes_And_Gives_Text)
{
    EXPECT_EQ(Convert("none.csv", "o.tab").first, 2);
    EXPECT_EQ(Call({"clipboard", Request_Name("o.tab")}),
              (Host_Answer{9, "Clipboard does not contain text.\n:\n"}));
    Put("c.csv", "plot,kind\n1,oats\n2,rye\n");
    EXPECT_EQ(Call({Request_Name("c.csv"), "clipboard.tab/p"}), (Host_Answer{0, Gave}));
    EXPECT_FALSE(std::filesystem::exists("clipboard.$V$")) << "in the folder of the test";
    EXPECT_EQ(Files(), "c.csv");
    for (const char* const name : {"clipboard", "Clipboard.tab"}) {
        EXPECT_EQ(Call({name, Request_Name("o.csv") + "/h"}), (Host_Answer{0, Took})) << name;
        EXPECT_EQ(Get("o.csv"), "plot,kind\r\n1,\"oats\"\r\n2,\"rye\"\r\n");
        std::filesystem::remove(Path("o.csv"));
    }
    EXPECT_EQ(Files(), "c.csv");
}

TEST_F(Clipboard_Test, Converts_Its_Text)
{
    const std::string head =
        "a,b\r\n" + std::string(60, 'x') + ",y\r\n";  // a text is known by its first bytes
    const std::pair<std::string, std::string> cases[] = {
        {"Gr\xC3\xBCn,\xE2\x82\xAC\r\n", "Gr\xFCn,\x80\r\n"},
        {"Gr\xFCn,x\r\n", "Gr\xFCn,x\r\n"},  // no UTF-8
        {"x,\xC5\x91\r\n", "x,?\r\n"},
        {std::string("x,y\r\n\0z,z\r\n", 11), "x,y\r\n"},
    };
    for (const auto& [carried, text] : cases) {
        Put("carried", head + carried);
        ASSERT_EQ(std::system(("xclip -selection clipboard -i <" + Path("carried")).c_str()), 0);
        ASSERT_TRUE(Comes_To_Hold(head + carried));
        EXPECT_EQ(Call({"clipboard.csv", Request_Name("o.csv") + "/h/-"}), (Host_Answer{0, Took}));
        EXPECT_EQ(Get("o.csv"), head + text);
    }
    for (const char* const written : {"Gr\xFCn,x\r\n", "Gr\xC3\xBCn,x\r\n"}) {
        Put("c.csv", head + written);
        EXPECT_EQ(Call({Request_Name("c.csv"), "clipboard.csv/h/-"}), (Host_Answer{0, Gave}));
        EXPECT_TRUE(Comes_To_Hold(head + "Gr\xC3\xBCn,x\r\n"));
    }
}

}  // namespace
}  // namespace ingester
