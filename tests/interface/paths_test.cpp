// Names that stand for other names: tokens, variables, URLs; and what happens when the processor refuses.
#include "interface/paths.h"

#include "host_fixture.h"
#include "support/http_server.h"
#include "support/progress.h"

#include <cfenv>
#include <csignal>
#include <map>

#include <sys/wait.h>

namespace ingester {
namespace {

class Paths_Test : public Host_Test {
protected:
    void SetUp() override
    {
        Host_Test::SetUp();
        Put("settings.ini", "; of the host\n[options]\nAddInFolder = /add/ins/\n[Host]\nVersion=19.2\n"
                            "[Spreadsheet]\nAllow HTML Formatting=7\nOdd=yes\nSign=-\n");
        ::setenv("TABULON_SETTINGS", Path("settings.ini").c_str(), 1);
        ::setenv("INGESTER_PLACE", "/some/place/", 1);
        Start_Request("t");
    }
    void TearDown() override
    {
        ::unsetenv("TABULON_SETTINGS");
        Host_Test::TearDown();
    }

    static std::string Expanded(std::string name)
    {
        Expand_Path_Tokens(name, "\\t\\");
        return name;
    }
};

TEST_F(Paths_Test, Tokens_And_Variables_Become_Folders)
{
    const std::string install = Expanded("%TABDIR%");
    EXPECT_TRUE(install.ends_with("\\") && !install.ends_with("tests\\")) << install;
    const std::pair<std::string, std::string> cases[] = {
        {"C:\\x\\%TEMP%\\y.csv", "\\t\\y.csv"},
        {"%DATA%a.csv", install + "Data\\a.csv"},
        {"x%SystemAddins%%TMP%", "\\t\\"},
        {"%USERADDINS%b", "\\add\\ins\\b"},
        {"%TABDIR64%b", "%TABDIR64%b"},
        {"%INGESTER_PLACE%\\c\\d", "\\some\\place\\c\\d"},
        {"%INGESTER_NOWHERE%\\c", "%INGESTER_NOWHERE%\\c"},
        {"x%INGESTER_PLACE%\\c", "x%INGESTER_PLACE%\\c"},
        {"http:\\\\h\\%TEMP%", "http:\\\\h\\%TEMP%"},
        {"%TEMP%" + std::string(1000, 'x'), "\\t\\" + std::string(277, 'x')},
        {std::string(600, 'x'), std::string(600, 'x')},
        {"%TEMP%" + std::string(1200, 'x'), "%TEMP%" + std::string(1200, 'x')},
    };
    for (const auto& [name, expanded] : cases)
        EXPECT_EQ(Expanded(name), expanded);
}

TEST_F(Paths_Test, The_Hosts_Settings_Tell_Its_Version_And_Its_Scratch_Files)
{
    EXPECT_EQ(Read_Host_Setting("spreadsheet", "allow html formatting", 0, 1, 0), 0) << "out of its range";
    EXPECT_EQ(Read_Host_Setting("Spreadsheet", "Allow HTML Formatting", 0, 9, 0), 7);
    for (const char* const no_number : {"Odd", "Sign", "None"})
        EXPECT_EQ(Read_Host_Setting("Spreadsheet", no_number, 0, 9, 3), 3) << no_number;
    EXPECT_EQ(request.Return_Delete_Marker.view(), "T192D");
    EXPECT_TRUE(Is_Host_Scratch_File(Request_Name("t192d7.tbk")));
    for (const char* const other : {"T192D7.csv", "xT192D7.tss", "T181D7.tss"})
        EXPECT_FALSE(Is_Host_Scratch_File(Request_Name(other))) << other;
    EXPECT_FALSE(Is_Host_Scratch_File("T192D7.tss"));
    ::setenv("TABULON_SETTINGS", Path("none.ini").c_str(), 1);
    EXPECT_EQ(Host_Delete_Marker(), "T181D");
}

/// Whether a broken pipe is pending here, and whether it is held back.
std::pair<bool, bool> Broken_Pipe()
{
    sigset_t pending;
    sigset_t held;
    ::sigpending(&pending);
    ::pthread_sigmask(SIG_BLOCK, nullptr, &held);
    return {::sigismember(&pending, SIGPIPE) == 1, ::sigismember(&held, SIGPIPE) == 1};
}

TEST_F(Paths_Test, Broken_Pipes_Of_The_Host_Stay_Its_Own)
{
    const auto download = [this] {
        const std::string none = "file:\\\\" + Request_Name("none.csv");
        EXPECT_EQ(Call({none, Request_Name("p.tab")}),
                  (Host_Answer{19, "Could not download input URL:\n" + none + "\n:\n"}));
        EXPECT_EQ(Files(), "settings.ini");
    };
    download();
    EXPECT_EQ(Broken_Pipe(), std::pair(false, false));
    sigset_t broken_pipe;
    ::sigemptyset(&broken_pipe);
    ::sigaddset(&broken_pipe, SIGPIPE);
    ::pthread_sigmask(SIG_BLOCK, &broken_pipe, nullptr);
    ::raise(SIGPIPE);
    download();
    EXPECT_EQ(Broken_Pipe(), std::pair(true, true));
    int taken = 0;
    ::sigwait(&broken_pipe, &taken);
    ::pthread_sigmask(SIG_UNBLOCK, &broken_pipe, nullptr);
}

/// What the server of the test below says to each path.
std::string Web_Page(const std::string& path)
{
    const std::string good = "HTTP/1.1 200 OK\r\nConnection: close\r\n";
    const std::string crops = "\r\nplot,yield\n1,2.5\n";
    const std::string moved = "HTTP/1.1 302 Found\r\nContent-Length: 0\r\nConnection: close\r\nLocation: ";
    const std::map<std::string, std::string> pages = {
        {"/a/crops.csv?x=1", good + crops},
        {"/my%20crops.csv", good + crops},
        {"/moved.csv", moved + "/a/crops.csv?x=1\r\n\r\n"},
        {"/loop.csv", moved + "/loop.csv\r\n\r\n"},
        {"/home.csv", moved + "file:///etc/passwd\r\n\r\n"},
        {"/short.csv", good + "Content-Length: 1000\r\n" + crops},
        {"/huge.csv", good + "Content-Length: 9000000000000000000\r\n" + crops},
        {"/slow.csv", good + "\r\nplot~,~y~i~e~l~d"},
        {"/silent.csv", "~~~~~~"},
    };
    const auto page = pages.find(path);
    return page != pages.end() ? page->second : "HTTP/1.1 404 Not Found\r\nConnection: close\r\n" + crops;
}

TEST_F(Paths_Test, The_Web_Is_Read_And_Its_Faults_Leave_Nothing_Behind)
{
    const Http_Server server(Web_Page);
    if (server.Port() == 0)
        GTEST_SKIP() << "no server can be run here";
    Put("settings.ini", "[Download]\nConnectSeconds=1\nTotalSeconds=1\n");
    Put("o.tab", "old");
    const std::string host = "http:\\\\127.0.0.1:" + std::to_string(server.Port()) + "\\";
    for (const char* const good : {"a\\crops.csv?x=1", "my crops.csv", "moved.csv"}) {
        EXPECT_EQ(Call({host + good, Request_Name("o.tab")}), (Host_Answer{0, ""})) << good;
        EXPECT_EQ(Get("o.tab"), "plot\tyield\r\n1\t2.5\r\n");
        Put("o.tab", "old");
    }
    EXPECT_EQ(Call({host + "a\\crops.csv?x=1", Request_Name("o.tab") + "/%=2"}).first, 19) << "no keys there";
    EXPECT_EQ(Files() + Get("o.tab"), "o.tab settings.iniold");
    const std::string longest = host + std::string(1120 - host.size(), 'x');
    EXPECT_EQ(Call({longest, Request_Name("o.tab")}),
              (Host_Answer{19, "Could not download input URL:\n" + longest.substr(0, 500) + "\n:\n"}));
    for (const char* const bad :
         {"none.csv", "loop.csv", "home.csv", "short.csv", "huge.csv", "slow.csv", "silent.csv"}) {
        EXPECT_EQ(Call({host + bad, Request_Name("o.tab")}),
                  (Host_Answer{19, "Could not download input URL:\n" + host + bad + "\n:\n"}));
        EXPECT_EQ(Files() + Get("o.tab"), "o.tab settings.iniold") << bad;
    }
}

/// With signals for faults of that kind.
[[maybe_unused]] void Divide_By_Zero(int kind, double number)
{
    static volatile double zero = 0.0;
    feenableexcept(kind);
    zero = number / zero;
}

// A reader that does what it must not, in the middle of its work.
TEST_F(Paths_Test, Faults_Are_Told_And_Left_To_The_Host)
{
#ifdef INGESTER_SANITIZED
    GTEST_SKIP() << "the sanitizer takes such signals itself";
#else
    static volatile int zero = 0;
    const std::tuple<void (*)(), int, const char*> cases[] = {
        {[] { *reinterpret_cast<volatile int*>(zero + std::uintptr_t{8}) = 1; }, 100 + SIGSEGV,
         "Error: A Memory fault has occurred.\n:\n"},
        {[] { ::raise(SIGSEGV); }, 100 + SIGSEGV, "Error: A Memory fault has occurred.\n:\n"},
#ifdef __x86_64__
        {[] { zero = 7 / zero; }, 100 + SIGFPE, "Error: An Integer Division by Zero has occurred.\n:\n"},
        {[] { Divide_By_Zero(FE_DIVBYZERO, 1.0); }, 100 + SIGFPE,
         "Error: A Floating point Division by Zero has occurred.\n:\n"},
        {[] { Divide_By_Zero(FE_INVALID, 0.0); }, 0,
         "Warning: An Illegal Floating point calculation has occurred.\n:\n"},
#endif
    };
    Put("c.csv", "plot,yield\n1,2.5\n");
    for (const auto& [fault, status, said] : cases) {
        const ::pid_t child = ::fork();
        if (child == 0) {
            for (const int signal : {SIGFPE, SIGSEGV})
                std::signal(signal, [](int number) { ::_exit(100 + number); });  // the host's own handler
            static void (*at_work)();
            at_work = fault;
            progress_hook = [](const char*, std::int64_t, std::int64_t) { at_work(); };
            Put(Stem() + ".inp", Pass_Bytes(2, {Request_Name("c.csv"), Request_Name("o.tab")}));
            std::feclearexcept(FE_ALL_EXCEPT);
            INGESTER("", "", 0, 0);
            ::_exit(std::fetestexcept(FE_ALL_EXCEPT));  // as the host had it
        }
        int how = 0;
        ::waitpid(child, &how, 0);
        EXPECT_TRUE(WIFEXITED(how) && WEXITSTATUS(how) == status) << how << said;
        EXPECT_EQ(Get("IG" + std::to_string(child) + ".ERR"), said);
    }
#endif
}

}  // namespace
}  // namespace ingester
