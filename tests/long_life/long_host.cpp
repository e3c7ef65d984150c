// A host that lives long: thousands of requests of all kinds in one process. Each has the answer that it gets
// in a process of its own and leaves the process as it was, and together they leave no memory behind.
// Usage: ingester_long_host LIBRARY; the variable INGESTER_LONG_REQUESTS holds their number.
#include <algorithm>
#include <bit>
#include <cfenv>
#include <csignal>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include <dlfcn.h>
#include <malloc.h>
#include <sys/wait.h>
#include <unistd.h>
#include <utime.h>

/// The clock stands still, for the library as well: outputs tell when they were made.
extern "C" __attribute__((visibility("default"))) std::time_t time(std::time_t* target) noexcept
{
    constexpr std::time_t now = 1700000000;
    if (target != nullptr)
        *target = now;
    return now;
}

namespace {

namespace fs = std::filesystem;

using Ingester = std::int32_t (*)(const char*, const char*, std::int32_t, std::int32_t);

struct Request {
    std::string records;          ///< a bar between; empty for no pass file at all
    std::string old_output = {};  ///< the file below in/ that the output is before
    std::string list = {};        ///< what temp/list holds
    bool muted = false;           ///< no message can be written
};

const std::vector<Request> Plain_Requests = {
    {"in\\crops.csv|out\\o.tab", "crops.csv"},
    {"in\\crops.csv/v|out\\o.tss"},
    {"in\\large.csv|out\\o.tab/rewrite=7"},
    {"in\\made.tss|%TMP%\\T181D1.TSS"},
    {"in\\made.tbk/w|out\\o.tab"},
    {"in\\made.tbk|out\\o.tab|S:no such sheet"},
    {"in\\crops.csv|out\\o.tbk/a=B", "made.tbk"},
    {"in\\more.csv|out\\o.tbk/r=B", "made.tbk"},
    {"in\\more.csv|out\\o.tbk.gz/a=C", "made.tbk.gz"},
    {"http:\\\\localhost:9\\none.csv|out\\o.tab"},
    {"in\\crops.csv|out\\o.tab|||temp\\list/s", "", "2\nV\nyield\nplot\n"},
    {"in\\made.tss|out\\o.tss|||temp\\list/s", "", "3\n#\n1\n3\n99\n"},
    {"in\\crops.csv|out\\o.tab|||temp\\list/r", "", "4\n0\n1\n0\n1\n"},
    {"in\\crops.csv|out\\o.csv/@", "none.csv"},
    {"in\\crops.csv|in\\crops.csv"},
    {"in\\crops.csv|out\\o.dbf"},
    {"in\\crops.csv|out\\no\\o.tab"},
    {"in\\crops.csv|\\proc\\version"},
    {"in\\large.csv|out\\full.tab"},
    {"Clipboard.csv|out\\o.tab"},
    {"in\\crops.csv|clipboard.tab"},
    {"in\\none.csv|out\\o.tab", "", "", true},
    {"in\\large.csv/c=2|out\\o.tab", "", "", true},
    {"in\\none.csv|out\\o.tab|sheet|2:3|none/s"},
    {"in\\crops.csv"},
    {""},
};

std::string Get(const fs::path& name)
{
    std::ifstream file(name, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

void Put(const fs::path& name, const std::string& bytes)
{
    constexpr ::utimbuf then{1600000000, 1600000000};
    std::ofstream(name, std::ios::binary) << bytes;
    ::utime(name.c_str(), &then);
}

[[noreturn]] void Give_Up(const std::string& what, const Request& last = {""})
{
    std::fprintf(stderr, "%s\nafter: %s (%s)\n", what.c_str(), last.records.c_str(), last.old_output.c_str());
    std::exit(1);
}

template <class T> void Add(std::string& bytes, T value)
{
    bytes.append(reinterpret_cast<const char*>(&value), sizeof value);
    if constexpr (std::endian::native == std::endian::big)
        std::reverse(bytes.end() - sizeof value, bytes.end());
}

std::string Pass_Bytes(const std::string& records)
{
    std::string bytes;
    Add(bytes, 1.0 + static_cast<double>(std::ranges::count(records, '|')));
    std::istringstream stream(records);
    for (std::string record; std::getline(stream, record, '|'); bytes += record) {
        Add(bytes, 0);
        Add(bytes, static_cast<std::int32_t>(record.size()));
    }
    return bytes;
}

/// By the names of a host without a carrier, since they don't hold the number of the process.
void Run(Ingester ingester, const Request& request)
{
    const std::string out = request.records.substr(request.records.find('|') + 1);
    if (fs::exists("in/" + request.old_output) && !request.old_output.empty())
        Put("out/" + out.substr(4, out.find_first_of("/|") - 4), Get("in/" + request.old_output));
    if (!request.list.empty())
        Put("temp/list", request.list);
    if (request.muted)
        fs::create_directory("temp/TxtToNum.ERR");
    if (!request.records.empty())
        Put("temp/ingester.inp", Pass_Bytes(request.records));
    if (ingester("", "", 0, 0) != 0)
        Give_Up("the export returned a fault", request);
}

/// The files that a request left, with their names; they are removed.
std::string Take_Answer(const Request& request)
{
    std::set<fs::path> paths;
    for (const char* const folder : {"temp", "out"})
        paths.insert(fs::directory_iterator(folder), fs::directory_iterator());
    std::string answer;
    for (const fs::path& path : paths) {
        const std::string name = path;
        if (fs::is_symlink(path))
            continue;
        if (name != "temp/TxtToNum.ERR" && !name.starts_with("temp/ingester.") && name != "temp/T181D1.TSS"
            && (!name.starts_with("out/o.") || path.extension() == ".$$$"))
            Give_Up("a scratch file stays behind: " + name, request);
        answer += name + '\n' + (fs::is_directory(path) ? "" : Get(path)) + '\n';
        fs::remove(path);
    }
    return answer;
}

Ingester Load(const std::string& library)
{
    void* const loaded = ::dlopen(library.c_str(), RTLD_NOW | RTLD_LOCAL);
    void* const symbol = loaded == nullptr ? nullptr : ::dlsym(loaded, "INGESTER");
    if (symbol == nullptr)
        Give_Up(::dlerror());
    return reinterpret_cast<Ingester>(symbol);
}

/// The answer of a process that loads the library for this request.
std::string Fresh_Answer(const std::string& library, const Request& request)
{
    int how = -1;
    if (::fork() == 0) {
        Run(Load(library), request);
        ::_exit(0);
    }
    ::wait(&how);
    if (how != 0)
        Give_Up("a process ended with " + std::to_string(how), request);
    return Take_Answer(request);
}

/// A new folder that holds the temporary one.
std::string Enter_Folder()
{
    std::string folder = fs::temp_directory_path() / "ingester-long-XXXXXX";
    fs::current_path(::mkdtemp(folder.data()));
    for (const char* const name : {"in", "out", "temp"})
        fs::create_directory(name);
    fs::create_symlink("/dev/full", "out/full.tab");
    ::setenv("TMPDIR", (folder + "/temp").c_str(), 1);
    ::setenv("no_proxy", "*", 1);
    ::unsetenv("DISPLAY");
    ::unsetenv("WAYLAND_DISPLAY");
    return folder;
}

void Make_Inputs(const std::string& library)
{
    std::string large = "plot,kind!,yield,words\n";
    for (int row = 1; row <= 100000; ++row)
        large += std::to_string(row) + (row % 3 == 0 ? ",oats," : ",rye,") + std::to_string(row * 0.37) + ",w"
                 + std::to_string(row % 1000) + '\n';
    Put("in/large.csv", large);
    Put("in/crops.csv", "plot,kind!,sown:D,yield,notes$\n1,oats,12/03/2024,2.5,NA\n2,rye,13/03/2024,*,lodged "
                        "early\n3,rye,14/03/2024,1e9,x\n4,oats,*,0.1,tall\n");
    Put("in/crops.VAR", "5\nPlot#\n\n*\nYield!\nwords:E\n");
    Put("in/more.csv", "plot,height,yield\n2,71.5,3\n9,70,4\n1,69,5\n4,68,6\n");
    Put("in/more.mrg", "1\nplot\n");
    Put("in/void.csv", "a,b\n,\n,\n");
    for (const auto& [records, name] : {std::pair("in\\crops.csv|out\\o.tss", "made.tss"),
                                        {"in\\crops.csv|out\\o.tbk/x=A", "made.tbk"},
                                        {"in\\more.csv|out\\o.tbk/a=B", "made.tbk"}}) {
        const std::string answer = Fresh_Answer(library, {records, name});
        const std::size_t begin = answer.find('\n') + 1;
        Put(std::string("in/") + name, answer.substr(begin, answer.find("\ntemp/", begin) - begin));
    }
    if (std::system("cd in && gzip -kn crops.csv made.tbk") != 0)
        Give_Up("gzip is not there");
}

/// Inputs, and outputs to append to, as they come from broken disks and from people who mean ill.
void Add_Hostile_Requests(std::vector<Request>& requests)
{
    std::minstd_rand random;
    for (const std::string base : {"crops.csv", "made.tss", "made.tbk", "crops.csv.gz"})
        for (char number = '0'; number <= '9'; ++number) {
            const std::string name = number + base;
            std::string bytes = Get("in/" + base);
            for (auto count = random() % 8; count > 0; --count)
                bytes[random() % bytes.size()] = "\0\1\x7F\xFF\t,9*"[random() % 8];
            if (random() % 3 == 0)
                bytes.resize(random() % bytes.size());
            Put("in/" + name, bytes);
            requests.push_back({"in\\" + name + "|out\\o.csv"});
            requests.push_back({"in\\more.csv|out\\o" + base.substr(base.find('.')) + "/@", name});
        }
}

/// What the options of one leave behind would reach the next.
void Add_Random_Requests(std::vector<Request>& requests)
{
    const std::vector<std::string> inputs = {"crops.csv", "more.csv", "none.csv", "void.csv"};
    const std::vector<std::string> ins = {"/n", "/x=1",   "/c=2:3", "/k",   "/b",   "/o=V", "/z=;", "/lt=1",
                                          "/u", "/csv=2", "/y",     "/s=1", "/e=2", "/tr",  "/#",   "/g=9"};
    const std::vector<std::string> outs = {"/n", "/mv=NA", "/d", "/f", "/e", "/h", "/-",
                                           "/u", "/z",     "/m", "/q", "/b", "/p", "/av"};
    const std::vector<std::string> endings = {".tab", ".csv", ".txt", ".gen", ".tss"};
    std::minstd_rand random;
    const auto one_of = [&](const auto& texts) { return texts[random() % texts.size()]; };
    for (const std::string join : {"/@", "/@,when", "/&", "/&U", "/%=1", "/%=1UM"})
        for (const std::string old : {"crops.csv", "made.tss", "made.tbk"})
            requests.push_back({"in\\more.csv|out\\o" + old.substr(old.find('.')) + join, old});
    for (int i = 0; i < 200; ++i) {
        std::string records = "in\\" + one_of(inputs) + one_of(ins) + one_of(ins);
        records += "|out\\o" + one_of(endings) + one_of(outs) + one_of(outs);
        requests.push_back({records, i % 5 == 0 ? "crops.csv" : ""});
    }
}

std::vector<Request> Make_Requests()
{
    std::vector<Request> requests = Plain_Requests;
    std::string folder = fs::current_path();
    std::ranges::replace(folder, '/', '\\');  // a slash begins an option
    for (const std::string name : {"made.tbk", "none.csv"})
        requests.push_back({"file:\\\\" + folder + "\\in\\" + name + "|out\\o.tab"});
    Add_Hostile_Requests(requests);
    Add_Random_Requests(requests);
    return requests;
}

/// Arithmetic and signals as a host may have set them for itself.
void Be_A_Peculiar_Host()
{
    static char handler_stack[1 << 16];
    const stack_t stack = {.ss_sp = handler_stack, .ss_flags = 0, .ss_size = sizeof handler_stack};
    ::sigaltstack(&stack, nullptr);
    struct sigaction action = {};
    action.sa_handler = [](int) { ::_exit(99); };
    action.sa_flags = SA_ONSTACK;
    ::sigaddset(&action.sa_mask, SIGUSR1);
    for (const int number : {SIGFPE, SIGSEGV, SIGBUS, SIGPIPE})
        ::sigaction(number, &action, nullptr);
    std::fesetround(FE_UPWARD);
    ::feenableexcept(FE_DIVBYZERO | FE_OVERFLOW);
}

/// What no request may change. A thread that has been waited for is listed a moment longer.
std::string State()
{
    constexpr int set_by_the_system = 0x04000000;
    std::string state = fs::current_path();
    const auto add = [&](auto value) { state += " " + std::to_string(value); };
    const auto count_in = [](const char* list) {
        return std::distance(fs::directory_iterator(list), fs::directory_iterator());
    };
    for (int wait = 0; wait < 1000 && count_in("/proc/self/task") > 1; ++wait)
        ::usleep(1000);
    add(count_in("/proc/self/task"));
    add(count_in("/proc/self/fd"));
    add(std::fegetround());
    add(::fegetexcept());
    add(std::fetestexcept(FE_ALL_EXCEPT));
    stack_t stack = {};
    ::sigaltstack(nullptr, &stack);
    add(reinterpret_cast<std::uintptr_t>(stack.ss_sp));
    for (int number = 1; number < NSIG; ++number) {
        struct sigaction action = {};
        ::sigaction(number, nullptr, &action);
        add(reinterpret_cast<std::uintptr_t>(action.sa_sigaction));
        add(action.sa_flags & ~set_by_the_system);
        add(::sigismember(&action.sa_mask, SIGUSR1));
    }
    return state;
}

struct Memory {
    long resident = 0;
    long in_use = 0;
};

/// Without what the heap keeps for later.
Memory Used_Memory()
{
    long pages = 0;
    ::malloc_trim(0);
    std::ifstream file("/proc/self/statm");
    file >> pages >> pages;
    const struct mallinfo2 heap = ::mallinfo2();
    return {pages * ::sysconf(_SC_PAGESIZE), static_cast<long>(heap.uordblks + heap.hblkhd)};
}

#ifdef INGESTER_SANITIZED
constexpr Memory Most_Growth = {1L << 40, 1L << 40};  // what is freed stays for a while
#else
constexpr Memory Most_Growth = {2 << 20, 64 << 10};
#endif

}  // namespace

int main(int count, char** arguments)
{
    const char* const wanted = std::getenv("INGESTER_LONG_REQUESTS");
    const long total = wanted == nullptr ? 2000 : std::atol(wanted);
    if (count != 2)
        Give_Up("usage: ingester_long_host LIBRARY");
    const std::string library = fs::absolute(arguments[1]);
    const std::string folder = Enter_Folder();
    Make_Inputs(library);
    const std::vector<Request> requests = Make_Requests();
    std::vector<std::string> answers;
    std::vector<std::size_t> order;
    int good = 0;
    for (const Request& request : requests) {
        answers.push_back(Fresh_Answer(library, request));
        order.push_back(order.size());
        good += answers.back().find(std::string("ingester.out\n\0", 14)) != std::string::npos ? 1 : 0;
    }
    if (good < 50)
        Give_Up("too few requests succeed");

    Be_A_Peculiar_Host();
    const Ingester ingester = Load(library);
    const std::string state = State();
    std::minstd_rand random;
    Memory before;
    long done = 0;
    for (int round = 0; done < total || round < 4; ++round) {
        for (const std::size_t i : order) {
            Run(ingester, requests[i]);
            if (const std::string now = State(); now != state)
                Give_Up("the process was:\n" + state + "\nand is:\n" + now, requests[i]);
            if (Take_Answer(requests[i]) != answers[i])
                Give_Up("the answer is not that of a process of its own", requests[i]);
        }
        done += std::ssize(order);
        std::ranges::shuffle(order, random);
        const Memory now = Used_Memory();
        if (round < 3 || done <= total / 10)
            before = now;
        if (done >= total
            && (now.resident - before.resident > Most_Growth.resident
                || now.in_use - before.in_use > Most_Growth.in_use))
            Give_Up("memory grows");
        std::fprintf(stderr, "%ld requests, %ld KiB resident, %ld bytes in use\n", done, now.resident >> 10,
                     now.in_use);
    }
    fs::current_path("/");
    fs::remove_all(folder);
    return 0;
}
