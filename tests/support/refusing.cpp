#include "support/refusing.h"

#include <atomic>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <new>

#include <curl/curl.h>

namespace ingester {
namespace {

struct Refusing_State {
    unsigned kinds = 0;  ///< a bit for each that is counted
    int number = 0;
    bool onwards = false;
    bool kills = false;
    int count = 0;
    std::optional<Asked> refused;
};

Refusing_State state;
std::atomic<long> living_blocks;

unsigned Bit(Asked what)
{
    return 1U << static_cast<unsigned>(what);
}

bool Count_And_Refuse(Asked what)
{
    if ((state.kinds & Bit(what)) == 0)
        return true;
    ++state.count;
    if (state.number == 0 || (state.onwards ? state.count < state.number : state.count != state.number))
        return true;
    if (state.kills)
        std::raise(SIGKILL);
    state.refused = state.refused.value_or(what);
    return false;
}

void* New_Block(std::size_t bytes)
{
    void* const block = Allowed(Asked::memory) ? std::malloc(bytes > 0 ? bytes : 1) : nullptr;
    living_blocks += block != nullptr ? 1 : 0;
    return block;
}

/// Whoever sets libcurl up first decides where it takes its memory.
void Be_Asked_By_Curl()
{
    const auto copy = [](const char* text) {
        const std::size_t bytes = std::strlen(text) + 1;
        void* const block = Take_Memory(nullptr, bytes);
        return static_cast<char*>(block == nullptr ? nullptr : std::memcpy(block, text, bytes));
    };
    const auto zeros = [](std::size_t count, std::size_t size) {
        void* const block = Take_Memory(nullptr, count * size);
        return block == nullptr ? nullptr : std::memset(block, 0, count * size);
    };
    static const CURLcode done = curl_global_init_mem(
        CURL_GLOBAL_DEFAULT, [](std::size_t bytes) { return Take_Memory(nullptr, bytes); }, std::free,
        Take_Memory, copy, zeros);
    static_cast<void>(done);
}

}  // namespace

Refusing::Refusing(const Refusal& refusal)
{
    Be_Asked_By_Curl();
    state = {.number = refusal.number, .onwards = refusal.onwards, .kills = refusal.kills, .refused = {}};
    for (const Asked kind : refusal.kinds)
        state.kinds |= Bit(kind);
    if (refusal.kinds.size() == 0)
        state.kinds = ~0U;
    refusal_hook = Count_And_Refuse;
}

Refusing::~Refusing()
{
    refusal_hook = nullptr;
}

int Refusing::Count() const
{
    return state.count;
}

std::optional<Asked> Refusing::Refused() const
{
    return state.refused;
}

long Living_Blocks()
{
    return living_blocks;
}

}  // namespace ingester

// What takes the place of the standard library's own, in the tests alone.

void* operator new(std::size_t bytes)
{
    void* const block = ingester::New_Block(bytes);
    return block != nullptr ? block : throw std::bad_alloc();
}

void* operator new[](std::size_t bytes)
{
    return operator new(bytes);
}

void* operator new(std::size_t bytes, const std::nothrow_t&) noexcept
{
    return ingester::New_Block(bytes);
}

void operator delete(void* block) noexcept
{
    ingester::living_blocks -= block != nullptr ? 1 : 0;
    std::free(block);
}

void operator delete[](void* block) noexcept
{
    operator delete(block);
}

void operator delete(void* block, std::size_t) noexcept
{
    operator delete(block);
}

void operator delete[](void* block, std::size_t) noexcept
{
    operator delete(block);
}

extern "C" std::time_t time(std::time_t* kept) noexcept
{
    std::timespec now{};
    std::timespec_get(&now, TIME_UTC);
    const std::time_t shown = ingester::refusal_hook == nullptr ? now.tv_sec : 1000000000;
    if (kept != nullptr)
        *kept = shown;
    return shown;
}
