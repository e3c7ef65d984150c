#include "platform/faults.h"

#include <array>
#include <cfenv>
#include <csignal>
#include <iterator>

#include <fcntl.h>
#include <ucontext.h>
#include <unistd.h>

namespace ingester {

namespace {

constexpr int Fault_Signals[] = {SIGFPE, SIGSEGV, SIGBUS, SIGILL};

/// What the host had, to be put back.
struct Guarded_State {
    Fault_Report report = nullptr;
    std::fenv_t arithmetic{};
    std::array<struct sigaction, std::size(Fault_Signals)> actions{};
    stack_t stack{};
};

Guarded_State guarded;

/// A handler must be able to run when the stack itself is what gave out.
alignas(16) std::array<std::byte, std::size_t{1} << 16> handler_stack;

Processor_Fault Fault_Of_Arithmetic(int code)
{
    switch (code) {
    case FPE_INTDIV:
        return Processor_Fault::integer_division;
    case FPE_INTOVF:
        return Processor_Fault::integer_overflow;
    case FPE_FLTDIV:
        return Processor_Fault::float_division;
    case FPE_FLTINV:
        return Processor_Fault::float_invalid;
    case FPE_FLTOVF:
    case FPE_FLTUND:
    case FPE_FLTRES:
        return Processor_Fault::float_survivable;
    default:
        return Processor_Fault::other;
    }
}

Processor_Fault Fault_Of(int signal_number, const siginfo_t& facts)
{
    switch (signal_number) {
    case SIGFPE:
        return Fault_Of_Arithmetic(facts.si_code);
    case SIGSEGV:
    case SIGBUS:
        return Processor_Fault::memory;
    default:
        return Processor_Fault::other;
    }
}

/// The interrupted code goes on with its traps off, so that the instruction has its untrapped result.
bool Mask_Traps([[maybe_unused]] void* context)
{
#if defined(__x86_64__)
    constexpr std::uint32_t vector_masks = 0x1F80;
    constexpr std::uint16_t stack_masks = 0x3F;
    auto* const state = static_cast<ucontext_t*>(context)->uc_mcontext.fpregs;
    if (state == nullptr)
        return false;
    state->mxcsr |= vector_masks;
    state->cwd |= stack_masks;
    state->swd &= static_cast<std::uint16_t>(~0xFFU);  // what was raised would trap again
    return true;
#else
    return false;
#endif
}

void Report_Fault(int signal_number, siginfo_t* facts, void* context)
{
    if (guarded.report(Fault_Of(signal_number, *facts)) && Mask_Traps(context))
        return;
    for (std::size_t i = 0; i < std::size(Fault_Signals); ++i)
        if (Fault_Signals[i] == signal_number)
            ::sigaction(signal_number, &guarded.actions[i], nullptr);
    if (facts->si_code
        <= 0)  // sent by somebody; a true fault comes again by itself, and tells its place then
        ::raise(signal_number);
}

}  // namespace

Fault_Guard::Fault_Guard(Fault_Report report)
{
    guarded.report = report;
    std::feholdexcept(&guarded.arithmetic);
    std::fesetenv(FE_DFL_ENV);
    stack_t stack{};
    stack.ss_sp = handler_stack.data();
    stack.ss_size = handler_stack.size();
    ::sigaltstack(&stack, &guarded.stack);
    struct sigaction action {};
    action.sa_sigaction = Report_Fault;
    action.sa_flags = SA_SIGINFO | SA_ONSTACK;
    ::sigemptyset(&action.sa_mask);
    for (std::size_t i = 0; i < std::size(Fault_Signals); ++i)
        ::sigaction(Fault_Signals[i], &action, &guarded.actions[i]);
}

Fault_Guard::~Fault_Guard()
{
    for (std::size_t i = 0; i < std::size(Fault_Signals); ++i)
        ::sigaction(Fault_Signals[i], &guarded.actions[i], nullptr);
    ::sigaltstack(&guarded.stack, nullptr);
    std::fesetenv(&guarded.arithmetic);
}

void Write_Scratch_In_Fault(const char* path, std::string_view text)
{
    const int file = ::open(path, O_WRONLY | O_CREAT | O_TRUNC | O_NOFOLLOW | O_CLOEXEC, 0600);
    if (file < 0)
        return;
    static_cast<void>(!::write(file, text.data(), text.size()));  // silent by design: the process is ending
    ::close(file);
}

}  // namespace ingester
