#include "hostfiles/script/script_parser.h"

#include <algorithm>
#include <cctype>
#include <map>
#include <set>
#include <stdexcept>
#include <string_view>
#include <vector>

namespace ingester {

namespace {

using Items = std::vector<std::string>;

std::string Join(const Items& items, char separator)
{
    std::string joined;
    for (const std::string& item : items)
        joined += (&item == items.data() ? "" : std::string(1, separator)) + item;
    return joined;
}

/// Whether a line is one text in quotes, with no more than an attribute's name and a mark around it.
bool Is_One_Text(std::string_view line)
{
    const std::size_t quote = line.find_first_of("'\"");
    if (quote > 9)
        return false;
    std::size_t end = quote;
    do
        end = line.find(line[quote], end + 1);
    while (end != line.npos && end + 1 < line.size() && line[end + 1] == line[quote] && ++end > 0);
    return end != line.npos && line.size() - end <= 3;
}

/// Only what can't be divided is longer than 78: a text, or levels without blanks.
void Check_Lines(std::string_view script)
{
    if (!script.ends_with('\n'))
        throw std::runtime_error("an open last line");
    for (std::size_t end; (end = script.find('\n')) != script.npos; script.remove_prefix(end + 1)) {
        const std::string_view line = script.substr(0, end);
        const bool levels = line.find_first_not_of("0123456789* :") == line.npos;
        if (line == "\\" || (line.size() > 78 && !levels && !Is_One_Text(line)))
            throw std::runtime_error("a bad line: " + std::string(line));
    }
}

class Script_Run {
public:
    explicit Script_Run(const std::string& script) : text_(script) {}

    void Run()
    {
        Check_Lines(text_);
        while (Skip_To_Statement())
            Run_Statement(Word());
    }

    [[nodiscard]] std::string Show() const
    {
        std::string shown;
        for (const std::string& name : order_)
            if (const auto found = structures_.find(name); found != structures_.end())
                shown += found->second.head + ": " + Join(found->second.values, '|') + "\n";
        return shown + actions_;
    }

private:
    struct Structure {
        std::string head;  ///< kind, name, options and attributes
        Items values;
    };

    void Expect(bool good, const char* why) const
    {
        if (!good)
            throw std::runtime_error(std::string(why) + ": " + text_.substr(std::min(at_, text_.size()), 60));
    }
    [[nodiscard]] char Now(std::size_t ahead = 0) const
    {
        return at_ + ahead < text_.size() ? text_[at_ + ahead] : '\0';
    }
    [[nodiscard]] static bool Is_One_Of(char c, std::string_view set)
    {
        return c != '\0' && set.find(c) != set.npos;
    }

    /// Past ends of statements and comments. False at the end of the script.
    bool Skip_To_Statement()
    {
        for (; Is_One_Of(Now(), " :\n\""); ++at_)
            if (Now() == '"')
                at_ = text_.find('"', at_ + 1);
        return at_ < text_.size();
    }
    /// Past blanks; inside a statement also past marked ends of lines.
    void Skip_Blanks()
    {
        for (; Now() == ' ' || (Now() == '\\' && Now(1) == '\n'); ++at_)
            at_ += Now() == '\\' ? 1 : 0;
    }
    bool Take(char c)
    {
        Skip_Blanks();
        const bool there = Now() == c;
        at_ += there ? 1 : 0;
        return there;
    }
    std::string Word()
    {
        Skip_Blanks();
        std::string word;
        while (std::isalnum(static_cast<unsigned char>(Now())) != 0 || Is_One_Of(Now(), "_%.+-*"))
            word += text_[at_++];
        Expect(!word.empty(), "no word");
        return word;
    }
    std::string Name()
    {
        std::string name = Word();
        while (Now() == '[' || name.find('[') + 1 > name.find(']') + 1)
            name += text_[at_++];
        Expect(name.size() <= 60 && std::isdigit(static_cast<unsigned char>(name[0])) == 0, "a bad name");
        return name;
    }
    std::string Quoted()
    {
        std::string text;
        for (++at_; Now() != '\'' || Now(1) == '\''; text += text_[at_++]) {
            Expect(static_cast<unsigned char>(Now()) >= ' ', "a control character, or no end, in a text");
            if (Is_One_Of(Now(), "'\"\\`"))
                Expect(Now() == Now(1), "a single special character"), ++at_;
        }
        ++at_;
        return text;
    }
    Items Names()
    {
        Items names = {Name()};
        while (Take(','))
            names.push_back(Name());
        return names;
    }
    /// "!(1,2)", "!t('a')", "!(#_levels_)", a text, or a word.
    std::string Value()
    {
        if (Skip_Blanks(), Now() == '\'')
            return Quoted();
        if (!Take('!'))
            return Word();
        const bool texts = Take('t');
        Items items;
        Expect(Take('('), "no list");
        if (Take('#')) {
            const auto feeder = structures_.find(Name());
            Expect(feeder != structures_.end(), "no such list");
            Expect(feeder->second.head.starts_with("TEXT") == texts, "a list of the other kind");
            items = feeder->second.values;
            const std::size_t extra = feeder->second.head.find(" extra=");
            if (extra != std::string::npos)
                items.push_back(feeder->second.head.substr(extra));
            structures_.erase(feeder);
        } else {
            do
                items.push_back((Skip_Blanks(), Now() == '\'') ? Quoted() : Word());
            while (Take(','));
        }
        Expect(Take(')'), "an open list");
        return Join(items, ',');
    }
    /// "key=value;key=value"
    std::string Pairs()
    {
        std::string shown;
        do {
            std::string key = Word();
            std::ranges::transform(key, key.begin(), [](unsigned char c) { return std::tolower(c); });
            Expect(Take('='), "no value");
            shown += " " + key + "=" + (key == "class" ? Join(Names(), ',') : Value());
        } while (Take(';'));
        return shown;
    }
    std::string Options()
    {
        const std::string shown = Take('[') ? Pairs() : "";
        Expect(shown.empty() || Take(']'), "open options");
        return shown;
    }

    void Declare(const std::string& kind)
    {
        const std::string options = Options();
        const std::string name = Name();
        Expect(options.starts_with(" modify=yes") || deleted_.erase(name) > 0, "declared but not deleted");
        std::string head = kind + " " + name + options;
        bool attributes = Take(';');
        if (kind == "SCALAR") {
            head += " value=" + Word();
            attributes = Take(';');
        }
        head += attributes ? Pairs() : "";
        std::erase(order_, name);
        order_.push_back(name);
        structures_[name] = {head, {}};
    }

    /// Levels come as one run of digits: nothing tells them apart where there are ten and more.
    void Read()
    {
        const std::string options = Options();
        const std::string name = Name();
        if (!structures_.contains(name)) {
            Expect(options.find("setnvalues=y") != std::string::npos, "not declared");
            order_.push_back(name);
            structures_[name].head = "VARIATE " + name;
        }
        Structure& target = structures_[name];
        if (options == " print=*" && name != "_stitle_")
            target.head += " quiet";
        const bool levels = Take(';') && Pairs() == " frepresentation=ordinal";
        while (Is_One_Of(Now(), " \n"))
            ++at_;
        for (; Now() != ':'; at_ = std::min(text_.find_first_not_of(" \n", at_), text_.size())) {
            const bool text = Now() == '\'';
            const std::string item = text ? Quoted() : Word();
            Expect(levels || Is_One_Of(Now(), " \n:"), "no blank behind a value");
            Expect(target.head.starts_with("TEXT") == text, "a value of the other kind");
            if (levels && !target.values.empty())
                target.values[0] += item;
            else
                target.values.push_back(item);
        }
    }

    void Run_Statement(const std::string& keyword)
    {
        static const std::set<std::string> kinds = {"VARIATE",         "TEXT",   "FACTOR", "MATRIX",
                                                    "SYMMETRICMATRIX", "SCALAR", "TABLE",  "DIAGONALMATRIX"};
        if (kinds.contains(keyword)) {
            Declare(keyword);
        } else if (keyword == "READ") {
            Read();
        } else if (keyword == "DELETE") {
            Options();
            for (const std::string& name : Names())
                deleted_.insert(name), structures_.erase(name);
        } else if (keyword == "POINTER") {
            const std::string name = Name();
            Expect(Take(';') && Take('!') && Take('p') && Take('('), "no list of structures");
            const Items members = Names();
            Expect(Take(')')
                       && std::ranges::all_of(
                           members, [&](const std::string& member) { return structures_.contains(member); }),
                   "a pointer to nothing");
            actions_ += "POINTER " + name + " " + Join(members, ',') + "\n";
        } else if (keyword == "RESTRICT") {
            actions_ += "RESTRICT " + Join(Names(), ',');
            actions_ += (Take(';') ? " by " + Name() : "") + "\n";
        } else {
            actions_ += keyword + Options();
            Skip_Blanks();
            actions_ += (Now() == '\n' ? "" : " " + Name()) + "\n";
            if (keyword == "PRINT")
                Expect(Take(';') && Pairs() == " just=Left", "printed otherwise");
        }
        Skip_Blanks();
        Expect(Is_One_Of(Now(), ":\n"), "a statement goes on");
    }

    const std::string& text_;
    std::size_t at_ = 0;
    std::map<std::string, Structure> structures_;
    std::set<std::string> deleted_;
    Items order_;
    std::string actions_;
};

}  // namespace

std::string Run_Script(const std::string& script)
{
    Script_Run run(script);
    try {
        run.Run();
    } catch (const std::exception& fault) {
        return run.Show() + "FAULT " + fault.what();
    }
    return run.Show();
}

}  // namespace ingester
