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

std::atomic<long> living_blocks;

unsigned Bit(Asked what)
{
    return 1U << static_cast<unsigned>(what);
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
    refusal_ = refusal;
    kinds_ = refusal.kinds.size() == 0 ? ~0U : 0U;
    for (const Asked kind : refusal.kinds)
        kinds_ |= Bit(kind);
    count_ = 0;
    refused_.reset();
    refusal_hook = Is_Allowed;
}

bool Refusing::Is_Allowed(Asked what)
{
    if ((kinds_ & Bit(what)) == 0)
        return true;
    ++count_;
    const int number = refusal_.number;
    if (number == 0 || (refusal_.onwards ? count_ < number : count_ != number))
        return true;
    if (refusal_.kills)
        std::raise(SIGKILL);
    refused_ = refused_.value_or(what);
    return false;
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
