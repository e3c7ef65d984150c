#include "support/refusing.h"

#include <atomic>
#include <csignal>
#include <cstdlib>
#include <ctime>
#include <new>

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

}  // namespace

Refusing::Refusing(const Refusal& refusal)
{
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
