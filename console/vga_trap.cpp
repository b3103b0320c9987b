#include <console/vga_trap.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <bit>
#include <cstring>

#include <dlfcn.h>
#include <sys/mman.h>
#include <ucontext.h>
#include <unistd.h>

namespace console {

namespace {

constexpr greg_t kTrapFlag = 0x100;
constexpr greg_t kProtectionFault = 13;
constexpr greg_t kFaultOfStore = 2;  // in the error code of a page fault
constexpr std::size_t kReach = 64;   // no instruction stores more bytes

constexpr std::array kSignals = {SIGSEGV, SIGTRAP};

// What is trapped; changed while no access is under way.
unsigned char* window = nullptr;
VgaModel* model = nullptr;
std::array<struct sigaction, kSignals.size()> programActions;

/// The access that is being stepped.
struct Step {
    enum class Pass : unsigned char { Load, FirstStore, SecondStore };
    Pass pass = Pass::Load;
    std::size_t begin = 0, end = 0;                     ///< what it may reach of the window
    std::array<unsigned char, 2 * kReach> firstLeft{};  ///< there after the first pass of a store
    gregset_t registers{};                              ///< before it
    sigset_t signals{};                                 ///< the thread's mask, which is put back
};
Step step;
std::atomic<pid_t> stepper{0};  ///< whose access it is; 0 for none

int SetAction(int signal, struct sigaction const* action, struct sigaction* before)
{
    using Function = int (*)(int, struct sigaction const*, struct sigaction*);
    static auto const next = reinterpret_cast<Function>(dlsym(RTLD_NEXT, "sigaction"));
    return next(signal, action, before);
}

struct sigaction& ActionOf(int signal) { return programActions[signal == SIGSEGV ? 0 : 1]; }

/// The program's own fault: its handler's turn, or the end that the kernel has for it.
void HandToProgram(int signal, siginfo_t* info, ucontext_t* context)
{
    struct sigaction const action = ActionOf(signal);
    if (action.sa_handler == SIG_DFL || action.sa_handler == SIG_IGN) {
        SetAction(signal, &action, nullptr);
        return;  // and the instruction faults again
    }
    sigset_t mask{};
    pthread_sigmask(SIG_SETMASK, &context->uc_sigmask, &mask);
    if ((action.sa_flags & SA_SIGINFO) != 0)
        action.sa_sigaction(signal, info, context);
    else
        action.sa_handler(signal);
    pthread_sigmask(SIG_SETMASK, &mask, nullptr);
}

/// The forms of the instruction that writes to the port in a register: a byte, or a register's index and its
/// value together.
bool WritePort(greg_t (&registers)[NGREG])
{
    auto const* const code = std::bit_cast<unsigned char const*>(registers[REG_RIP]);
    auto const port = static_cast<std::uint16_t>(registers[REG_RDX]);
    auto const value = static_cast<std::uint16_t>(registers[REG_RAX]);
    bool const isWord = code[0] == 0x66 && code[1] == 0xEF;
    if (!model->ArePortsAllowed() || (!isWord && code[0] != 0xEE)) return false;
    if (port != VgaModel::kIndexPort && port != VgaModel::kDataPort) return false;
    model->WritePort(port, static_cast<std::uint8_t>(value));
    if (isWord) model->WritePort(port + 1, static_cast<std::uint8_t>(value >> 8));
    registers[REG_RIP] += isWord ? 2 : 1;
    return true;
}

/// The registers as instructions number them.
constexpr int kRegisters[] = {REG_RAX, REG_RCX, REG_RDX, REG_RBX, REG_RSP, REG_RBP, REG_RSI, REG_RDI, REG_R8,
    REG_R9, REG_R10, REG_R11, REG_R12, REG_R13, REG_R14, REG_R15};

/// Most stores are of this one instruction, that of a byte register; it needs no stepping.
bool StoreByteRegister(std::size_t offset, greg_t (&registers)[NGREG])
{
    auto const* code = std::bit_cast<unsigned char const*>(registers[REG_RIP]);
    unsigned const prefix = (*code & 0xF0) == 0x40 ? *code++ : 0;
    if (*code++ != 0x88) return false;
    unsigned const operands = *code++;
    unsigned const number = (operands >> 3 & 7) + (prefix << 1 & 8);
    unsigned base = operands & 7;
    if (base == 4) base = *code++ & 7;  // a base and an index
    if (operands >> 6 == 1) code += 1;
    if (operands >> 6 == 2 || (operands >> 6 == 0 && base == 5)) code += 4;
    // Without the prefix, 4 to 7 are the second bytes of the first four.
    bool const isSecond = prefix == 0 && number >= 4;
    auto const value = registers[kRegisters[isSecond ? number - 4 : number]] >> (isSecond ? 8 : 0);
    model->Store(offset, static_cast<std::uint8_t>(value));
    registers[REG_RIP] = std::bit_cast<greg_t>(code);
    return true;
}

void BeginStep(std::size_t offset, ucontext_t* context)
{
    auto& registers = context->uc_mcontext.gregs;
    for (pid_t none = 0; !stepper.compare_exchange_weak(none, gettid(), std::memory_order_acquire);)
        none = 0;
    step.begin = offset - std::min(offset, kReach);
    step.end = std::min(offset + kReach, VgaModel::kWindow);
    std::memcpy(step.registers, registers, sizeof step.registers);
    mprotect(window, VgaModel::kWindow, PROT_READ | PROT_WRITE);
    if ((registers[REG_ERR] & kFaultOfStore) != 0) {
        step.pass = Step::Pass::FirstStore;
        std::memset(window + step.begin, 0, step.end - step.begin);
    } else {
        step.pass = Step::Pass::Load;
        for (std::size_t i = step.begin; i < step.end; ++i)
            window[i] = model->Peek(i);
        model->Load(offset);
    }
    // Nothing comes between the instruction and its trap.
    step.signals = context->uc_sigmask;
    sigfillset(&context->uc_sigmask);
    context->uc_sigmask = WithoutOwnSignals(context->uc_sigmask);
    registers[REG_EFL] |= kTrapFlag;
}

void OnFault(int signal, siginfo_t* info, void* context)
{
    auto* const where = static_cast<ucontext_t*>(context);
    auto& registers = where->uc_mcontext.gregs;
    if (registers[REG_TRAPNO] == kProtectionFault) {
        if (WritePort(registers)) return;
    } else if (auto* const address = static_cast<unsigned char*>(info->si_addr); window != nullptr &&
               address >= window && address < window + VgaModel::kWindow && stepper != gettid()) {
        auto const offset = static_cast<std::size_t>(address - window);
        if (StoreByteRegister(offset, registers)) return;
        return BeginStep(offset, where);
    }
    HandToProgram(signal, info, where);
}

void StoreBytes()
{
    for (std::size_t i = step.begin; i < step.end; ++i)
        if (window[i] == step.firstLeft[i - step.begin]) model->Store(i, window[i]);
}

void OnStepped(int signal, siginfo_t* info, void* context)
{
    auto* const where = static_cast<ucontext_t*>(context);
    auto& registers = where->uc_mcontext.gregs;
    if (stepper != gettid()) return HandToProgram(signal, info, where);
    if (step.pass == Step::Pass::FirstStore) {
        step.pass = Step::Pass::SecondStore;
        std::memcpy(step.firstLeft.data(), window + step.begin, step.end - step.begin);
        std::memset(window + step.begin, 0xFF, step.end - step.begin);
        std::memcpy(registers, step.registers, sizeof step.registers);
        registers[REG_EFL] |= kTrapFlag;
        return;
    }
    if (step.pass == Step::Pass::SecondStore) StoreBytes();
    mprotect(window, VgaModel::kWindow, PROT_NONE);
    registers[REG_EFL] &= ~kTrapFlag;
    where->uc_sigmask = step.signals;
    stepper.store(0, std::memory_order_release);
}

}

void TrapVga(unsigned char* trappedWindow, VgaModel* trappingModel)
{
    if (model != nullptr)
        for (int const signal : kSignals)
            SetAction(signal, &ActionOf(signal), nullptr);
    window = trappedWindow;
    model = trappingModel;
    if (model == nullptr) return;
    struct sigaction action {};
    action.sa_flags = SA_SIGINFO | SA_NODEFER;  // the program's handler may draw
    sigfillset(&action.sa_mask);
    action.sa_mask = WithoutOwnSignals(action.sa_mask);
    for (int const signal : kSignals) {
        action.sa_sigaction = signal == SIGSEGV ? OnFault : OnStepped;
        SetAction(signal, &action, &ActionOf(signal));
    }
}

bool IsVgaTrapped() { return model != nullptr; }

std::optional<int> HandleSignal(int signal, struct sigaction const* action, struct sigaction* before)
{
    if (model == nullptr || std::find(kSignals.begin(), kSignals.end(), signal) == kSignals.end())
        return std::nullopt;
    struct sigaction const earlier = ActionOf(signal);
    if (action != nullptr) ActionOf(signal) = *action;
    if (before != nullptr) *before = earlier;
    return 0;
}

sigset_t WithoutOwnSignals(sigset_t set)
{
    if (model == nullptr) return set;
    for (int const signal : kSignals)
        sigdelset(&set, signal);
    return set;
}

}
