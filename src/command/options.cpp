#include "command/options.h"

#include "command/usage.h"
#include "interface/paths.h"
#include "interface/people_options.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <array>
#include <cstdio>

namespace ingester {

namespace {

constexpr Task_Name Tasks[] = {
    {Task::convert, "",
     "Converts a table from one file format to another.\n"
     "The input's content decides how it is read, the output's extension how it is written."},
    {Task::info, "info", "Tells what a file is, and what each of its columns holds."},
    {Task::head, "head",
     "Shows the first rows of a table: beside each other on a terminal, with tabs between them elsewhere."},
    {Task::summary, "summary", "Tells the type and statistics of each column."},
    {Task::sheets, "sheets",
     "Lists the sheets of a file, a line each, in their order.\n"
     "A file of a format that holds one table has one sheet."},
    {Task::formats, "formats",
     "Lists the formats that are read and written.\n"
     "Inputs are known by their content, outputs by their extension."},
};

constexpr const char* Examples = R"(Examples:
  ingester crops.csv crops.tab
      comma text becomes tab-separated text
  ingester crops.csv - | head
      comma text on standard output
  ingester crops.csv.gz crops.tab
      compressed input is read as what it holds
  sort crops.txt | ingester - crops.tab
      the table comes from standard input
  ingester --force yields.csv yields.tab
      replaces an older yields.tab
  ingester --range 3:40 field.txt field.csv
      lines 3 to 40 of the text; the first of them may hold the names
  ingester --lines-per-record 2 --no-names long.csv long.tab
      two lines make one record, and no line holds names
  ingester --missing NA --write-missing . field.csv other.csv
      NA means missing in the input; missing cells are written as a point
  ingester --in-options '/x=NA' --out-options '/mv=.' field.csv other.csv
      the same, in the option language of requests
  ingester crops.csv crops.gen --keep plot,yield --rename plot=Plot --type plot=factor
      two columns, one of them under another name and as a factor
  ingester crops.csv all.tbk --add-sheet Crops
      one more sheet in the book all.tbk, which is made where there is none
  ingester sheets all.tbk
      the sheets that the book holds; --sheet NAME reads one of them
  ingester june.csv all.csv --append
      the rows of june.csv go beneath those of all.csv
  ingester heights.csv plots.csv --merge plot
      rows are joined by the column plot
  ingester info crops.csv
      what the file and each of its columns hold; --json tells it to programs
  ingester head crops.csv -n 5 --keep plot,yield
      its first rows
  ingester summary crops.csv
      statistics of each column
  ingester formats
      the formats that are read and written

Exit status: 0 when the output is complete; 1 to 19 when a request failed, as messages on standard
error say (6: the output; 7: the table has no rows); 64 when the command line is wrong.)";

std::string Check_Merge_Key(const std::string& key)
{
    const std::size_t equals = key.find('=');
    const bool empty = equals == 0 || equals + 1 == key.size() || key.empty();
    return empty || key.find_first_of("\r\n") != std::string::npos
               ? "a key is the name of a column, or two names with '=' between them"
               : "";
}

/// "/%=1UN": the number of keys, U for columns of equal names, and which rows make new ones. The letters
/// for these change places behind U.
std::string Merge_Option(std::size_t keys, const Merge_Choice& choice)
{
    std::string option = "/%=" + std::to_string(keys);
    if (choice.into_equal_names)
        option += 'U';
    if (choice.rows != "all")
        option += (choice.rows == "none") != choice.into_equal_names ? 'N' : 'M';
    return option;
}

std::string Check_Not_Empty(const std::string& text)
{
    return text.empty() ? "the name is empty" : "";
}

std::string Check_Slash_Options(const std::string& text)
{
    return text.empty() || text.front() == '/' ? "" : "options begin with '/', as in '/csv=2/n'";
}

/// In front of those that were written as they stand, where a value without an end takes all that follows;
/// but a pointer's name does so, too.
bool Add_Named_Options(Command_Options& options)
{
    const std::string fault = Fault_Of_Options(options.named_input_options);
    const std::string& told = fault.empty() ? Fault_Of_Options(options.named_output_options) : fault;
    if (!told.empty()) {
        std::fprintf(stderr, "ingester: %s\nRun with --help for more information.\n", told.c_str());
        return false;
    }
    for (const auto& [text, named] : {std::pair(&options.input_options, &options.named_input_options),
                                      std::pair(&options.output_options, &options.named_output_options)})
        if (const std::string_view key = Key_Given_Twice(*text, *named); !key.empty()) {
            std::fprintf(stderr, "ingester: %s is given twice, in the option language and by its name\n",
                         std::string(key).c_str());
            return false;
        }
    const std::string named = Spell_Options(options.named_input_options);
    const bool takes_the_rest = named.find("/p=") != std::string::npos;
    options.input_options.insert(takes_the_rest ? options.input_options.size() : 0, named);
    options.output_options.insert(0, Spell_Options(options.named_output_options));
    return true;
}

bool Add_Merge_Option(Command_Options& options)
{
    constexpr std::size_t most_keys = 4;
    if (options.merge_keys.empty())
        return true;
    const char* fault = nullptr;
    if (options.merge_keys.size() > most_keys)
        fault = "a merge has four keys at the most";
    else if (Is_Url(options.input))
        fault = "an input from elsewhere can't be merged by named keys; fetch it first";
    else if (options.output_options.find("/%") != std::string::npos)
        fault = "/% is given twice, in the option language and by its name";
    if (fault != nullptr) {
        std::fprintf(stderr, "ingester: --merge: %s\n", fault);
        return false;
    }
    options.output_options.insert(0, Merge_Option(options.merge_keys.size(), options.merge));
    return true;
}

/// The command asks for all rules for people; a flag each does without one.
void Offer_Host_Rules(CLI::App& app, std::bitset<People_Rule_Count>& host_rules)
{
    const char* const group = "Rules of hosts in the place of those for people";
    app.add_flag_callback(
           "--host-rules", [&host_rules] { host_rules.set(); }, "All of these: convert as for a host")
        ->group(group);
    for (const People_Rule_Option& option : People_Rule_Options())
        app.add_flag_callback(
               "--" + std::string(option.host_flag),
               [&host_rules, &option] { host_rules.set(static_cast<std::size_t>(option.rule)); },
               std::string(option.host_help))
            ->group(group);
}

void Offer_Input(CLI::App& app, Command_Options& options)
{
    app.add_option(options.task == Task::convert ? "INPUT" : "FILE", options.input,
                   "File or URL to read; - is standard input")
        ->required()
        ->check(Check_Not_Empty);
    if (options.task == Task::convert)
        app.add_option("OUTPUT", options.output, "File to write; - is comma text on standard output")
            ->required()
            ->check(Check_Not_Empty);
    app.add_option("--sheet", options.sheet, "Sheet to read, of a file that holds several")
        ->type_name("NAME");
    app.add_option("--range", options.range, "Cells to read; of text files, lines as FIRST:LAST")
        ->type_name("TEXT");
    app.add_option("--in-options", options.input_options, "Slash options of the input")
        ->type_name("TEXT")
        ->check(Check_Slash_Options);
    app.add_flag("-q,--quiet", options.quiet, "Show no progress");
    Offer_Choices(app, options.chosen);
    Offer_Host_Rules(app, options.host_rules);
    const std::array input_tables = {People_Options(), Genotype_Options(), Input_Options()};
    Offer_Named_Options(app, "Options of the input", input_tables, options.named_input_options);
}

void Offer_Merge(CLI::App& app, Command_Options& options)
{
    app.add_option("--merge", options.merge_keys,
                   "Merge with the existing output by this column, or two of different names: of the output "
                   "and of the input; up to four times")
        ->type_name("KEY[=KEY]")
        ->allow_extra_args(false)
        ->check(Check_Merge_Key);
    app.add_flag("--merge-equal-names", options.merge.into_equal_names,
                 "With --merge: columns of equal names are written into those of the output");
    app.add_option("--merge-rows", options.merge.rows,
                   "With --merge: input rows that make new ones: all without a partner, copies for keys "
                   "that are there, or none")
        ->check(CLI::IsMember({"all", "copies", "none"}));
}

void Offer_Output(CLI::App& app, Command_Options& options)
{
    app.add_option("--out-options", options.output_options,
                   "Slash options of the output; folders in values take backslashes")
        ->type_name("TEXT")
        ->check(Check_Slash_Options);
    Offer_Merge(app, options);
    app.add_flag("--padded", options.padded, "Comma text with blanks that keep its columns in line");
    app.add_flag("-f,--force", options.force, "Replace an output that exists");
    app.add_flag("--dry-run", options.dry_run, "Print the request that would be sent, and stop");
    const std::array output_tables = {Output_Options()};
    Offer_Named_Options(app, "Options of the output", output_tables, options.named_output_options);
}

std::string Check_Row_Count(const std::string& text)
{
    constexpr std::size_t most_digits = 9;
    const bool number = !text.empty() && text.find_first_not_of("0123456789") == std::string::npos;
    return number && text.size() <= most_digits ? "" : "give a number of rows, as 20";
}

/// Options that only one task has.
void Offer_Own_Options(CLI::App& app, Command_Options& options)
{
    if (options.task == Task::convert)
        Offer_Output(app, options);
    if (options.task == Task::info)
        app.add_flag("--json", options.json, "Print all of it as JSON, for programs");
    if (options.task == Task::head)
        app.add_option("-n,--lines", options.rows, "Rows to show, 10 without this option")
            ->type_name("N")
            ->check(Check_Row_Count);
}

/// What a task that writes nothing asks of the library. A table is looked at with all that the file holds.
void Ask_For_Task(Command_Options& options)
{
    constexpr std::string_view keep_empty_columns = "/k";
    const bool looks = options.task == Task::info || options.task == Task::head;
    if (options.task == Task::summary) {
        options.output = "/dev/null";
        options.input_options.insert(0, "/db");
    } else if (options.task == Task::sheets) {
        // The list is a table of one column: its cells alone, without names and quotes.
        options.input_options.insert(0, "/w");
        options.output_options = "/h/n/-";
    } else if (looks) {
        options.output_options = "/e";
        if (options.input_options.find(keep_empty_columns) == std::string::npos)
            options.input_options.insert(0, keep_empty_columns);
    }
    if (options.task == Task::sheets || looks)
        options.output = Standard_Stream;
}

}  // namespace

std::span<const Task_Name> Task_Names()
{
    return Tasks;
}

const Task_Name& Name_Of(Task task)
{
    return *std::ranges::find(Tasks, task, &Task_Name::task);
}

std::string_view Command_Examples()
{
    return Examples;
}

void Offer_Options(CLI::App& app, Command_Options& options)
{
    app.set_version_flag("--version", "ingester " INGESTER_VERSION);
    app.set_help_flag("-h,--help", "Print this help and exit");
    if (options.task == Task::convert)
        app.footer(Examples);
    Offer_Input(app, options);
    Offer_Own_Options(app, options);
}

namespace {

/// The words of a command line, backwards as their parser takes them. The value of --names may be a word of
/// its own, though the option needs none.
std::vector<std::string> Words_To_Parse(int argc, const char* const* argv)
{
    constexpr std::string_view with_value = "--names";
    std::vector<std::string> words;
    for (int i = 1; i < argc; ++i) {
        const std::string_view word = argv[i];
        const bool count = !word.empty() && word.find_first_not_of("0123456789") == std::string_view::npos;
        if (!words.empty() && words.back() == with_value && (count || word == "none"))
            words.back().append("=").append(word);
        else
            words.emplace_back(word);
    }
    std::ranges::reverse(words);
    return words;
}

}  // namespace

std::optional<int> Parse_Command_Line(int argc, const char* const* argv, Command_Options& options)
{
    const Task_Name& task = Name_Of(options.task);
    CLI::App app{std::string(task.description),
                 std::string("ingester").append(task.name.empty() ? "" : " ").append(task.name)};
    Offer_Options(app, options);
    try {
        app.parse(Words_To_Parse(argc, argv));
    } catch (const CLI::ParseError& end) {
        return End_Parsing(app, end);
    }
    if (!Add_Named_Options(options) || !Add_Merge_Option(options))
        return Usage_Error;
    Ask_For_Task(options);
    return std::nullopt;
}

}  // namespace ingester
