#include "platform/refusals.h"
#include "platform/text_codes.h"
#include "support/letters.h"
#include "support/windows_1252.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cerrno>
#include <cstddef>
#include <cstring>
#include <utility>

#include <iconv.h>

namespace ingester {

namespace {

/// A text under way. It grows by what is needed, and keeps its room for the next one.
class Text_Room {
public:
    void Clear() { used_ = 0; }
    [[nodiscard]] std::string_view View() const { return {bytes_.data(), used_}; }
    [[nodiscard]] char* Reserve(std::size_t count)
    {
        if (bytes_.size() - used_ < count)
            bytes_.resize(std::max(bytes_.size() * 2, used_ + count));
        return bytes_.data() + used_;
    }
    void Advance_To(const char* end) { used_ = static_cast<std::size_t>(end - bytes_.data()); }
    void Put(std::string_view text) { Advance_To(std::ranges::copy(text, Reserve(text.size())).out); }

private:
    std::string bytes_;
    std::size_t used_ = 0;
};

/// A converter of the system, between a code and UTF-8 or, for one letter, UTF-32.
class System_Converter {
public:
    System_Converter() = default;
    System_Converter(const System_Converter&) = delete;
    System_Converter& operator=(const System_Converter&) = delete;
    ~System_Converter()
    {
        if (Is_Open())
            ::iconv_close(handle_);
    }

    [[nodiscard]] bool Open(const char* from, const char* to)
    {
        handle_ = Allowed(Asked::memory) ? ::iconv_open(to, from) : Closed();
        return Is_Open();
    }

    enum class Stop : std::uint8_t { done, cut, malformed };

    /// Converts what can be, and takes it off the front of `text`.
    Stop Take(std::string_view& text, Text_Room& target)
    {
        for (;;) {
            char* const room = target.Reserve(text.size() + least_room);
            char* out = room;
            std::size_t left = text.size() + least_room;
            char* in = const_cast<char*>(text.data());
            std::size_t unread = text.size();
            const std::size_t result = ::iconv(handle_, &in, &unread, &out, &left);
            const int fault = errno;
            target.Advance_To(out);
            text.remove_prefix(text.size() - unread);
            if (result != static_cast<std::size_t>(-1))
                return Stop::done;
            if (fault != E2BIG)
                return fault == EINVAL ? Stop::cut : Stop::malformed;
        }
    }

    /// Ends a text: what was held back, and the way back to the first state of the code.
    void Finish(Text_Room& target)
    {
        char* out = target.Reserve(least_room);
        std::size_t left = least_room;
        ::iconv(handle_, nullptr, nullptr, &out, &left);
        target.Advance_To(out);
    }

private:
    static constexpr std::size_t least_room = 64;

    [[nodiscard]] static ::iconv_t Closed() { return reinterpret_cast<::iconv_t>(std::intptr_t{-1}); }
    [[nodiscard]] bool Is_Open() const { return handle_ != Closed(); }

    ::iconv_t handle_ = Closed();
};

/// Stands for a byte without a letter.
constexpr char32_t No_Letter = 0xFFFFFFFF;
constexpr char Replacement = '?';

/// The letters of a code that has one a byte.
using Letter_Table = std::array<char32_t, 256>;

[[nodiscard]] bool Load_Letter_Table(const Text_Code_Facts& code, Letter_Table& table)
{
    if (&code == Windows_1252_Code()) {
        for (unsigned byte = 0; byte < table.size(); ++byte)
            table[byte] = Windows_1252_Character(static_cast<unsigned char>(byte));
        return true;
    }
    System_Converter converter;
    if (!converter.Open(code.system_name, "UTF-8"))
        return false;
    Text_Room letter;
    for (unsigned byte = 0; byte < table.size(); ++byte) {
        const char bytes[] = {static_cast<char>(byte)};
        std::string_view text(bytes, 1);
        letter.Clear();
        const bool good = converter.Take(text, letter) == System_Converter::Stop::done;
        converter.Finish(letter);
        table[byte] = good && !letter.View().empty() ? First_Utf8(letter.View()).character : No_Letter;
    }
    return true;
}

/// One end of a conversion.
class Code_End {
public:
    virtual ~Code_End() = default;
    /// Puts `text` in the other code behind `target`. Returns the losses.
    virtual std::int64_t Convert(std::string_view text, Text_Room& target) = 0;
};

/// A byte that is no letter becomes "?", one by one.
class Utf8_Repair : public Code_End {
public:
    std::int64_t Convert(std::string_view text, Text_Room& target) override
    {
        std::int64_t losses = 0;
        char* out = target.Reserve(text.size());
        while (!text.empty()) {
            const std::size_t length = First_Utf8(text).length;
            if (length == 0) {
                *out++ = Replacement;
                ++losses;
            } else {
                out = std::copy_n(text.data(), length, out);
            }
            text.remove_prefix(std::max<std::size_t>(length, 1));
        }
        target.Advance_To(out);
        return losses;
    }
};

class One_Byte_To_Utf8 : public Code_End {
public:
    explicit One_Byte_To_Utf8(const Letter_Table& table)
    {
        for (std::size_t byte = 0; byte < table.size(); ++byte) {
            Letter& letter = letters_[byte];
            letter.lost = table[byte] == No_Letter;
            const char* const end = Put_Utf8(letter.bytes, letter.lost ? U'?' : table[byte]);
            letter.size = static_cast<std::uint8_t>(end - letter.bytes);
        }
    }

    std::int64_t Convert(std::string_view text, Text_Room& target) override
    {
        std::int64_t losses = 0;
        for (; !text.empty(); text.remove_prefix(std::min(text.size(), at_once))) {
            char* out = target.Reserve(at_once * Longest_Letter);
            for (const char c : text.substr(0, at_once)) {
                const Letter& letter = letters_[static_cast<unsigned char>(c)];
                std::memcpy(out, letter.bytes, sizeof letter.bytes);
                out += letter.size;
                losses += letter.lost ? 1 : 0;
            }
            target.Advance_To(out);
        }
        return losses;
    }

private:
    struct Letter {
        char bytes[Longest_Letter];
        std::uint8_t size;
        bool lost;
    };
    static constexpr std::size_t at_once = 1 << 12;
    std::array<Letter, 256> letters_{};
};

class Utf8_To_One_Byte : public Code_End {
public:
    explicit Utf8_To_One_Byte(const Letter_Table& table)
    {
        for (unsigned byte = 0; byte < table.size(); ++byte)
            if (table[byte] != No_Letter)
                bytes_.emplace_back(table[byte], static_cast<char>(byte));
        std::ranges::stable_sort(bytes_, {}, &Entry::first);
        near_.fill(-1);
        for (const auto& [letter, byte] : bytes_)
            if (letter < near_.size() && near_[letter] < 0)
                near_[letter] = static_cast<unsigned char>(byte);
        mark_ = static_cast<char>(near_[U'?'] < 0 ? Replacement : near_[U'?']);
    }

    std::int64_t Convert(std::string_view text, Text_Room& target) override
    {
        std::int64_t losses = 0;
        char* out = target.Reserve(text.size());
        while (!text.empty()) {
            const auto [character, length] = First_Utf8(text);
            const int byte = length == 0 ? -1 : Byte_Of(character);
            losses += byte < 0 ? 1 : 0;
            *out++ = byte < 0 ? mark_ : static_cast<char>(byte);
            text.remove_prefix(std::max<std::size_t>(length, 1));
        }
        target.Advance_To(out);
        return losses;
    }

private:
    using Entry = std::pair<char32_t, char>;

    [[nodiscard]] int Byte_Of(char32_t character) const
    {
        if (character < near_.size())
            return near_[character];
        const auto found = std::ranges::lower_bound(bytes_, character, {}, &Entry::first);
        return found == bytes_.end() || found->first != character ? -1
                                                                  : static_cast<unsigned char>(found->second);
    }

    std::vector<Entry> bytes_;
    std::array<std::int16_t, 0x250> near_;  ///< of the letters that most texts have
    char mark_;
};

/// UTF-16 and UTF-32: units of one size and one order of bytes.
template <class Unit, std::endian Order> class Units {
public:
    static Unit Get(const char* at)
    {
        Unit unit = 0;
        for (std::size_t i = 0; i < sizeof unit; ++i)
            unit = static_cast<Unit>(unit | static_cast<Unit>(static_cast<unsigned char>(at[i])) << Shift(i));
        return unit;
    }
    static char* Put(char* at, char32_t value)
    {
        for (std::size_t i = 0; i < sizeof(Unit); ++i)
            at[i] = static_cast<char>(value >> Shift(i));
        return at + sizeof(Unit);
    }

private:
    static constexpr unsigned Shift(std::size_t place)
    {
        return static_cast<unsigned>(8 * (Order == std::endian::little ? place : sizeof(Unit) - 1 - place));
    }
};

constexpr char32_t First_Surrogate = 0xD800;
constexpr char32_t First_Low_Surrogate = 0xDC00;
constexpr char32_t Behind_Surrogates = 0xE000;
constexpr char32_t First_Pair = 0x10000;

bool Is_Surrogate(char32_t character)
{
    return character >= First_Surrogate && character < Behind_Surrogates;
}

template <class Unit, std::endian Order> class Units_To_Utf8 : public Code_End {
public:
    std::int64_t Convert(std::string_view text, Text_Room& target) override
    {
        std::int64_t losses = 0;
        while (!text.empty()) {
            const auto [character, length] = First_Of(text);
            const bool lost = character == No_Letter;
            char* const room = target.Reserve(Longest_Letter);
            target.Advance_To(Put_Utf8(room, lost ? U'?' : character));
            losses += lost ? 1 : 0;
            text.remove_prefix(length);
        }
        return losses;
    }

private:
    using Unit_Bytes = Units<Unit, Order>;

    static Utf8_Character First_Of(std::string_view text)
    {
        if (text.size() < sizeof(Unit))
            return {No_Letter, text.size()};
        const char32_t unit = Unit_Bytes::Get(text.data());
        if (!Is_Surrogate(unit))
            return {unit > 0x10FFFF ? No_Letter : unit, sizeof(Unit)};
        if (sizeof(Unit) != 2 || unit >= First_Low_Surrogate || text.size() < 2 * sizeof(Unit))
            return {No_Letter, sizeof(Unit)};
        const char32_t low = Unit_Bytes::Get(text.data() + sizeof(Unit));
        if (low < First_Low_Surrogate || low >= Behind_Surrogates)
            return {No_Letter, sizeof(Unit)};
        return {First_Pair + ((unit - First_Surrogate) << 10U) + (low - First_Low_Surrogate),
                2 * sizeof(Unit)};
    }
};

template <class Unit, std::endian Order> class Utf8_To_Units : public Code_End {
public:
    std::int64_t Convert(std::string_view text, Text_Room& target) override
    {
        std::int64_t losses = 0;
        char* out = target.Reserve(text.size() * sizeof(Unit));  // a unit a byte at most
        while (!text.empty()) {
            const auto [character, length] = First_Utf8(text);
            losses += length == 0 ? 1 : 0;
            out = Put(out, length == 0 ? U'?' : character);
            text.remove_prefix(std::max<std::size_t>(length, 1));
        }
        target.Advance_To(out);
        return losses;
    }

private:
    static char* Put(char* out, char32_t character)
    {
        if (sizeof(Unit) != 2 || character < First_Pair)
            return Units<Unit, Order>::Put(out, character);
        const char32_t rest = character - First_Pair;
        out = Units<Unit, Order>::Put(out, First_Surrogate + (rest >> 10U));
        return Units<Unit, Order>::Put(out, First_Low_Surrogate + (rest & 0x3FFU));
    }
};

class System_To_Utf8 : public Code_End {
public:
    [[nodiscard]] bool Open(const char* name) { return converter_.Open(name, "UTF-8"); }

    std::int64_t Convert(std::string_view text, Text_Room& target) override
    {
        std::int64_t losses = 0;
        while (converter_.Take(text, target) != System_Converter::Stop::done && !text.empty()) {
            converter_.Finish(target);
            target.Put({&Replacement, 1});
            text.remove_prefix(1);
            ++losses;
        }
        converter_.Finish(target);
        return losses;
    }

private:
    System_Converter converter_;
};

class Utf8_To_System : public Code_End {
public:
    [[nodiscard]] bool Open(const char* name) { return converter_.Open("UTF-8", name); }

    std::int64_t Convert(std::string_view text, Text_Room& target) override
    {
        std::int64_t losses = 0;
        while (converter_.Take(text, target) != System_Converter::Stop::done && !text.empty()) {
            std::string_view mark(&Replacement, 1);
            converter_.Take(mark, target);
            text.remove_prefix(std::max<std::size_t>(First_Utf8(text).length, 1));
            ++losses;
        }
        converter_.Finish(target);
        return losses;
    }

private:
    System_Converter converter_;
};

template <class End> std::unique_ptr<Code_End> Open_End(const char* name)
{
    auto end = std::make_unique<End>();
    return end->Open(name) ? std::move(end) : nullptr;
}

/// What brings a code into UTF-8 (`into`) or UTF-8 into it, and whether ASCII stays as it is. Null for what
/// can't be had.
std::unique_ptr<Code_End> Make_End(const Text_Code_Facts& code, bool into, bool& keeps_ascii)
{
    using enum std::endian;
    const auto units = [into]<class Unit, std::endian Order>() -> std::unique_ptr<Code_End> {
        if (into)
            return std::make_unique<Units_To_Utf8<Unit, Order>>();
        return std::make_unique<Utf8_To_Units<Unit, Order>>();
    };
    keeps_ascii = code.kind == Code_Kind::utf_8 || code.kind == Code_Kind::system_over_ascii;
    switch (code.kind) {
    case Code_Kind::utf_8:
        return std::make_unique<Utf8_Repair>();
    case Code_Kind::utf_16_little:
        return units.operator()<std::uint16_t, little>();
    case Code_Kind::utf_16_big:
        return units.operator()<std::uint16_t, big>();
    case Code_Kind::utf_32_little:
        return units.operator()<std::uint32_t, little>();
    case Code_Kind::utf_32_big:
        return units.operator()<std::uint32_t, big>();
    case Code_Kind::system:
    case Code_Kind::system_over_ascii:
        return into ? Open_End<System_To_Utf8>(code.system_name) : Open_End<Utf8_To_System>(code.system_name);
    case Code_Kind::one_byte:
        break;
    }
    Letter_Table table;
    if (!Load_Letter_Table(code, table))
        return nullptr;
    keeps_ascii = true;
    for (std::size_t byte = 0; byte < 128; ++byte)
        keeps_ascii = keeps_ascii && table[byte] == byte;
    if (into)
        return std::make_unique<One_Byte_To_Utf8>(table);
    return std::make_unique<Utf8_To_One_Byte>(table);
}

}  // namespace

/// All ways go by UTF-8; a code's way into itself is none, but for UTF-8, which may be malformed.
class Text_Converter::Steps {
public:
    [[nodiscard]] bool Open(const Text_Code_Facts& from, const Text_Code_Facts& to)
    {
        bool first_keeps = true;
        bool second_keeps = true;
        from_utf8_ = from.kind == Code_Kind::utf_8;
        same_ = &from == &to;
        if (!same_ || from_utf8_)
            first_ = Make_End(from, true, first_keeps);
        if (!same_ && to.kind != Code_Kind::utf_8)
            second_ = Make_End(to, false, second_keeps);
        keeps_ascii_ = first_keeps && second_keeps;
        return (first_ != nullptr || (same_ && !from_utf8_))
               && (second_ != nullptr || same_ || to.kind == Code_Kind::utf_8);
    }

    [[nodiscard]] std::string_view Convert(std::string_view text)
    {
        if (first_ == nullptr || (keeps_ascii_ && Is_Ascii(text)))
            return text;
        if (!from_utf8_ || !Is_Utf8(text))
            text = By(*first_, text, first_text_);
        return second_ == nullptr ? text : By(*second_, text, second_text_);
    }

    [[nodiscard]] std::int64_t Take_Losses() { return std::exchange(losses_, 0); }

private:
    [[nodiscard]] std::string_view By(Code_End& end, std::string_view text, Text_Room& room)
    {
        room.Clear();
        losses_ += end.Convert(text, room);
        return room.View();
    }

    std::unique_ptr<Code_End> first_;   ///< into UTF-8
    std::unique_ptr<Code_End> second_;  ///< out of it
    Text_Room first_text_;
    Text_Room second_text_;
    bool from_utf8_ = false;
    bool same_ = false;
    bool keeps_ascii_ = true;
    std::int64_t losses_ = 0;
};

Text_Converter::Text_Converter() = default;
Text_Converter::~Text_Converter() = default;
Text_Converter::Text_Converter(Text_Converter&&) noexcept = default;
Text_Converter& Text_Converter::operator=(Text_Converter&&) noexcept = default;

Text_Converter Sure_Converter(Text_Code from, Text_Code to)
{
    Text_Converter converter;
    static_cast<void>(converter.Open(from, to));
    return converter;
}

std::string In_Utf8(std::string_view text)
{
    if (Letters_Are_Utf8() || Is_Ascii(text))
        return std::string(text);
    return std::string(Sure_Converter(Code_Of_Letters(), Utf_8_Code()).Convert(text));
}

bool Text_Converter::Open(Text_Code from, Text_Code to)
{
    auto steps = std::make_unique<Steps>();
    if (from == nullptr || to == nullptr || !steps->Open(*from, *to))
        return false;
    steps_ = std::move(steps);
    return true;
}

std::string_view Text_Converter::Convert(std::string_view text)
{
    return steps_ == nullptr ? text : steps_->Convert(text);
}

std::int64_t Text_Converter::Take_Losses()
{
    return steps_ == nullptr ? 0 : steps_->Take_Losses();
}

}  // namespace ingester
