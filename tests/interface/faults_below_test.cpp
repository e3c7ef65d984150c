// Whole requests on a system that refuses: whatever they ask of it, one thing after the other.
#include "faults_below_kinds.h"
#include "host_fixture.h"
#include "platform/gzip_file.h"
#include "support/refusing.h"

#include <cctype>
#include <map>

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace ingester {
namespace {

const std::string Table = "plot,kind!,name,day,yield\n1,oats,ann,3/2/2001,2.5\n2,rye,bob,4/2/2001,*\n"
                          "3,oats,cy,5/2/2001,4\n4,bean,,6/2/2001,5\n5,rye,\"d, e\",*,6.25\n";

using Files_And_Bytes = std::map<std::string, std::string>;

/// What goes wrong. Where others follow the first, nobody asks for words: they may be refused as well.
const Refusal Ways[] = {
    {},
    {.kinds = {Asked::memory}, .onwards = true},
    {.kinds = {Asked::write, Asked::close}, .onwards = true},
    {.kinds = {Asked::open, Asked::read, Asked::seek}, .onwards = true},
};

constexpr int no_rows = 7;  ///< the status of requests that join lines

/// Where a list of columns goes that can't be beside the output.
constexpr const char* other_list = "o.VAR";

/// What a request left.
struct Outcome {
    Host_Answer answer;
    Files_And_Bytes files;
    int asked = 0;
    std::optional<Asked> refused;
    bool not_begun = false;  ///< the pass file lies there as it was
    std::string faults;      ///< of the process
};

/// Whether `one` is among `files`, with the same bytes.
bool Holds(const Files_And_Bytes& files, const Files_And_Bytes::value_type& one)
{
    const auto found = files.find(one.first);
    return found != files.end() && found->second == one.second;
}

std::string Seed(const std::string& name)
{
    constexpr std::size_t choices = 2;
    std::ifstream file(std::string(INGESTER_PROJECT "/fuzz/seeds/") + name, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(file), {}).substr(choices);
}

class Faults_Below : public Host_Test, public testing::WithParamInterface<Request_Kind> {
protected:
    void SetUp() override
    {
        Host_Test::SetUp();
        std::string rows = "plot,yield\n";
        for (int row = 0; row < 5000; ++row)
            rows += std::to_string(row) + "," + std::to_string(row % 7) + ".5\n";
        Put("long.csv", rows);
        Put("in.csv", Table);
        Put("o.csv", "plot,kind!,wet\n3,rye,0\n4,oats,1\n9,rice,2\n10,rice,2\n11,rye,4\n");
        for (const char* const name : {"o.txt", "o.gen", "o.$V$"})
            Put(name, "old\n");
        Put("in.VAR", "5\nplot\nsort!\nname\nday\nweight\n");
        Put("in.mrg", "1\nplot\n");
        Put("columns", "2\nV\nplot\nyield\n");
        Put("rows", "5\n1\n0\n1\n1\n0\n");
        for (const auto& [seed, name] : Taken_Seeds)
            Put(name, Seed(seed));
        for (const auto& [input, output] : Made)
            ASSERT_EQ(Convert(input, output).first, 0) << output;
        for (const char* const name : {"in.csv", "in.tbk", "o.csv", "o.tbk"})
            ASSERT_TRUE(Compress_File(Request_Name(name), Request_Name(name) + ".gz"));
        stock_ = All_Files();
        testing::internal::CaptureStdout();  // summaries of columns go there
    }
    void TearDown() override
    {
        static_cast<void>(testing::internal::GetCapturedStdout());
        EXPECT_EQ(faults_, "");
        Host_Test::TearDown();
    }

    [[nodiscard]] Files_And_Bytes All_Files() const
    {
        Files_And_Bytes files;
        for (const auto& entry : std::filesystem::directory_iterator(Path("")))
            files[entry.path().filename()] = Get(entry.path().filename());
        return files;
    }

    [[nodiscard]] Files_And_Bytes Files_Before(const Request_Kind& kind) const
    {
        Files_And_Bytes files;
        for (const std::string& name : kind.before)
            files[name] = stock_.at(name);
        return files;
    }

    void Prepare(const Request_Kind& kind) const
    {
        for (const auto& entry : std::filesystem::directory_iterator(Path("")))
            std::filesystem::remove(entry.path());
        for (const auto& [name, bytes] : Files_Before(kind))
            Put(name, bytes);
        Put_Pass_File(kind);
    }

    /// The end to read of a pipe that holds a table; there is one at a time.
    [[nodiscard]] static int Filled_Pipe()
    {
        static int ends[2] = {-1, -1};
        ::close(ends[0]);
        EXPECT_EQ(::pipe(ends), 0);
        EXPECT_GT(::write(ends[1], Table.data(), Table.size()), 0);
        ::close(ends[1]);
        return ends[0];
    }

    void Put_Pass_File(const Request_Kind& kind) const
    {
        Texts records = kind.records;
        for (const std::size_t name : {0U, 1U, 4U})
            if (name < records.size())
                records[name] = Request_Name(records[name]);
        if (kind.records[0] == "url")
            records[0] = "file:\\\\" + Request_Name("in.csv");
        if (kind.records[0] == "pipe")
            records[0] = Request_Path("/dev/fd/" + std::to_string(Filled_Pipe()));
        Put(Stem() + ".inp", Pass_Bytes(static_cast<double>(records.size()), records));
    }

    /// Carries out the request whose pass file is there.
    [[nodiscard]] Outcome Run(const Refusal& refusal) const
    {
        Outcome outcome;
        request = Request_Globals{};
        Start_Request("t");
        const std::string pass = Get(Stem() + ".inp");
        const int descriptors = Descriptors();
        const long blocks = Living_Blocks();
        {
            const Refusing refusing(refusal);
            INGESTER("", "", 0, 0);
            outcome.asked = refusing.Count();
            outcome.refused = refusing.Refused();
        }
        request = Request_Globals{};
        Start_Request("t");
        // A libcurl that is refused memory may close the standard input.
        if (::fcntl(STDIN_FILENO, F_GETFD) < 0)
            static_cast<void>(::open("/dev/null", O_RDONLY | O_CLOEXEC));
        if (Living_Blocks() != blocks)
            outcome.faults += " memory is lost,";
        if (Descriptors() != descriptors)
            outcome.faults += " a file stays open,";
        outcome.not_begun = Get(Stem() + ".inp") == pass;
        std::filesystem::remove(Path(Stem() + ".inp"));
        outcome.answer = Take_Answer(Stem(), Stem() + ".out");
        outcome.files = All_Files();
        return outcome;
    }

    /// What a request that was refused something did wrong; empty for nothing.
    [[nodiscard]] std::string Faults_Of(const Request_Kind& kind, const Outcome& plain,
                                        const Outcome& disturbed, bool onwards) const
    {
        std::string faults = disturbed.faults;
        const Files_And_Bytes before = Files_Before(kind);
        const auto& [status, said] = disturbed.answer;
        const auto says = [&said = said](const char* words) { return said.find(words) != std::string::npos; };
        const bool may_stay =
            disturbed.refused == Asked::remove || says("Document is saved in Temporary file only.\n");
        for (const auto& one : disturbed.files)
            if (!Holds(before, one) && !Holds(plain.files, one)
                && (one.first != other_list || one.second != plain.files.at("o.$V$"))
                && (before.contains(one.first) || plain.files.contains(one.first) || !may_stay))
                faults += " " + one.first + " is neither old nor new,";
        bool whole = true;
        for (const auto& one : plain.files) {
            whole = whole && Holds(disturbed.files, one);
            if (before.contains(one.first) && !disturbed.files.contains(one.first))
                faults += " " + one.first + " is lost,";
        }
        const bool good = status == plain.answer.first;
        // Of lines joined and of a list beside the output the words tell alone.
        const bool told = says("Warning: The list of columns") || disturbed.files.contains(other_list)
                          || (says("\n") && status == no_rows);
        if (good && !whole && !told)
            faults += " good status without the output,";
        if (!good && status >= 0 && whole)
            faults += " bad status " + std::to_string(status) + " with the output,";
        if (!whole && !told && said.empty() && !onwards && !disturbed.not_begun)
            faults += " nothing is said,";
        if (good && whole && said != plain.answer.second && !said.empty())
            faults += " other words: " + said;
        return faults;
    }

    Files_And_Bytes stock_;
    std::string faults_;  ///< told at the end, when there is a standard output again
};

TEST_P(Faults_Below, Leave_The_Old_Output_Or_The_New_One)
{
    const Request_Kind& kind = GetParam();
    Prepare(kind);
    static_cast<void>(Run({}));  // what is made once is made now
    Prepare(kind);
    const Outcome plain = Run({});
    std::map<std::string, std::string> found;
    found[plain.faults] += " for nothing";
    if ((plain.answer.first != 0 && plain.answer.first != no_rows) || plain.asked < 60)
        found[" fails by itself: " + plain.answer.second];
    for (Refusal refusal : Ways)
        for (std::optional<Asked> refused = Asked::memory; refused;) {
            ++refusal.number;
            Prepare(kind);
            const Outcome disturbed = Run(refusal);
            refused = disturbed.refused;
            if (refused)
                found[Faults_Of(kind, plain, disturbed, refusal.onwards)] +=
                    Format_Text(" %li/%li", static_cast<long>(refusal.number), static_cast<long>(*refused));
        }
    found.erase("");
    for (const auto& [faults, numbers] : found)
        faults_ += kind.records[0] + " to " + kind.records[1] + ":" + faults + " refused" + numbers + "\n";
}

TEST_P(Faults_Below, Leave_The_Old_Output_Or_The_New_One_When_The_Process_Ends)
{
    const Request_Kind& kind = GetParam();
    Prepare(kind);
    const Outcome plain = Run({});
    const Files_And_Bytes before = Files_Before(kind);
    int how = SIGKILL;
    for (int number = 1; WIFSIGNALED(how); ++number) {
        Prepare(kind);
        const ::pid_t child = ::fork();
        if (child == 0) {
            Put_Pass_File(kind);  // named by the process
            const Refusing refusing(
                {.number = number, .kinds = {Asked::write, Asked::rename}, .kills = true});
            ::_exit(INGESTER("", "", 0, 0));
        }
        ::waitpid(child, &how, 0);
        const std::string name = kind.records[0] + " to " + kind.records[1] + Format_Text(" %i: ", number);
        const Files_And_Bytes left = All_Files();
        bool untouched = true;
        for (const auto& one : before) {
            const auto made = plain.files.find(one.first);
            const bool is_new = made == plain.files.end() ? !left.contains(one.first) : Holds(left, *made);
            untouched = untouched && Holds(left, one);
            if (!Holds(left, one) && !is_new)
                faults_ += name + one.first + " is neither old nor new\n";
        }
        // What lies about doesn't keep the next request from its work.
        Put_Pass_File(kind);
        const Outcome next = Run({});
        for (const auto& one : plain.files)
            if (untouched && !Holds(next.files, one))
                faults_ += name + one.first + " is not made the next time\n";
    }
}

std::string Name_Of(const testing::TestParamInfo<Request_Kind>& kind)
{
    std::string name = kind.param.records[0] + " to " + kind.param.records[1];
    for (char& character : name)
        if (std::isalnum(static_cast<unsigned char>(character)) == 0)
            character = '_';
    return std::to_string(kind.index) + "_" + name;
}

INSTANTIATE_TEST_SUITE_P(Kinds, Faults_Below, testing::ValuesIn(Kinds), Name_Of);

}  // namespace
}  // namespace ingester
