#include "hostfiles/script/script_parser.h"

#include <string_view>

namespace ingester {

namespace {

class Listener {
public:
    explicit Listener(std::string_view script) : text_(script) {}

    std::string Listen()
    {
        for (; at_ < text_.size() && !stumbled_; ++at_) {
            const char c = text_[at_];
            if (c == '\'')
                Hear_Text();
            else if (c == '"')
                Pass_Comment();
            else if (c == '\\')
                Expect(text_.substr(at_, 2) == "\\\n", "a backslash");
            else if (c == '\n')
                End_Line();
            else
                heard_ += c;
            data_ = data_ && c != ':';
        }
        Expect(text_.ends_with('\n'), "an open last line");
        return heard_;
    }

private:
    void Expect(bool good, const char* why)
    {
        if (!good)
            heard_.append("FAULT ").append(why);
        stumbled_ = stumbled_ || !good;
    }
    [[nodiscard]] bool Stands(std::size_t at, char c) const { return at < text_.size() && text_[at] == c; }

    /// Special characters stand for themselves when there are two.
    void Hear_Text()
    {
        ++texts_;
        first_text_ = texts_ == 1 ? at_ - line_ : first_text_;
        heard_ += '\'';
        for (++at_; !Stands(at_, '\'') || Stands(at_ + 1, '\''); ++at_) {
            Expect(at_ < text_.size() && static_cast<unsigned char>(text_[at_]) >= ' ', "no end of a text");
            if (at_ >= text_.size())
                return;
            if (std::string_view("'\"\\`").find(text_[at_]) != std::string_view::npos)
                Expect(Stands(at_ + 1, text_[at_]), "a single special character"), ++at_;
            heard_ += text_[at_];
        }
        heard_ += '\'';
    }
    void Pass_Comment()
    {
        for (++at_; at_ < text_.size() && (!Stands(at_, '"') || Stands(at_ + 1, '"')); ++at_)
            at_ += Stands(at_, '"') ? 1 : 0;
    }
    /// Only what can't be divided is longer than 78: a text, or levels without blanks. A break between data
    /// says nothing; neither does one behind a mark.
    void End_Line()
    {
        const std::string_view line = text_.substr(line_, at_ - line_);
        const bool levels = line.find_first_not_of("0123456789* :") == std::string_view::npos;
        Expect(line != "\\" && (line.size() <= 78 || levels || (texts_ <= 1 && first_text_ <= 9)),
               "a long line");
        if (!data_ && !line.ends_with('\\')) {
            const std::size_t last = heard_.rfind('\n') + 1;
            data_ = heard_.find("READ ", last) != std::string::npos;
            heard_ += '\n';
        }
        texts_ = 0;
        first_text_ = 0;
        line_ = at_ + 1;
    }

    std::string_view text_;
    std::size_t at_ = 0;
    std::size_t line_ = 0;  ///< where it begins
    int texts_ = 0;         ///< in the line
    std::size_t first_text_ = 0;
    bool data_ = false;
    bool stumbled_ = false;
    std::string heard_;
};

}  // namespace

std::string Heard_Of(const std::string& script)
{
    return Listener(script).Listen();
}

}  // namespace ingester
