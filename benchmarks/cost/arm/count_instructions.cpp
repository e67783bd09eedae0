// A plugin for qemu-arm 7.2 that counts what the emulated program executes between its marks. A mark is the system call
//
//     syscall(SYS_prctl, 0x63636d6b, step)        // char const* step
//
// for which the plugin writes the line "step instructions" to standard error: how many instructions ran since the mark
// before it, or since the program started. The kernel knows no such option and refuses it, so the same program runs
// without the plugin. One counter serves the whole process: only what runs on a single thread is counted exactly.
#include <cstdint>
#include <cstdio>

// What is needed of version 1 of QEMU's plugin interface, whose header Debian does not package.
extern "C"
{
    using qemu_plugin_id_t = std::uint64_t;
    struct qemu_info_t;
    struct qemu_plugin_tb;
    struct qemu_plugin_insn;
    enum qemu_plugin_op
    {
        QEMU_PLUGIN_INLINE_ADD_U64,
    };
    using TranslationCallback = void (*)(qemu_plugin_id_t, qemu_plugin_tb*);
    using SystemCallCallback = void (*)(qemu_plugin_id_t, unsigned int vcpu, std::int64_t number, std::uint64_t,
                                        std::uint64_t, std::uint64_t, std::uint64_t, std::uint64_t, std::uint64_t,
                                        std::uint64_t, std::uint64_t);

    void qemu_plugin_register_vcpu_tb_trans_cb(qemu_plugin_id_t, TranslationCallback);
    void qemu_plugin_register_vcpu_syscall_cb(qemu_plugin_id_t, SystemCallCallback);
    std::size_t qemu_plugin_tb_n_insns(qemu_plugin_tb const*);
    qemu_plugin_insn* qemu_plugin_tb_get_insn(qemu_plugin_tb const*, std::size_t index);
    std::uint64_t qemu_plugin_insn_vaddr(qemu_plugin_insn const*);
    void* qemu_plugin_insn_haddr(qemu_plugin_insn const*);
    void qemu_plugin_register_vcpu_insn_exec_inline(qemu_plugin_insn*, qemu_plugin_op, void* counter, std::uint64_t by);

    [[gnu::visibility("default")]] int qemu_plugin_version = 1;
    [[gnu::visibility("default")]] int qemu_plugin_install(qemu_plugin_id_t, qemu_info_t const*, int, char**);
}

namespace
{

constexpr std::int64_t ARM_PRCTL = 172;
constexpr std::uint64_t MARK = 0x63636d6b;

std::uint64_t s_instructions = 0;
std::uint64_t s_instructionsAtLastMark = 0;
char const* s_guestMemory = nullptr; // where the program's address 0 lies in our memory

void COUNT_EVERY_INSTRUCTION(qemu_plugin_id_t, qemu_plugin_tb* block)
{
    qemu_plugin_insn const* first = qemu_plugin_tb_get_insn(block, 0);
    s_guestMemory = static_cast<char const*>(qemu_plugin_insn_haddr(first)) - qemu_plugin_insn_vaddr(first);

    // per instruction rather than per block: a block may be left in its middle
    for (std::size_t i = 0; i < qemu_plugin_tb_n_insns(block); ++i)
        qemu_plugin_register_vcpu_insn_exec_inline(qemu_plugin_tb_get_insn(block, i), QEMU_PLUGIN_INLINE_ADD_U64,
                                                   &s_instructions, 1);
}

void REPORT_MARK(qemu_plugin_id_t, unsigned int, std::int64_t number, std::uint64_t option, std::uint64_t step,
                 std::uint64_t, std::uint64_t, std::uint64_t, std::uint64_t, std::uint64_t, std::uint64_t)
{
    if (number != ARM_PRCTL || option != MARK)
        return;
    std::uint64_t const executed = s_instructions - s_instructionsAtLastMark;
    std::fprintf(stderr, "%s %llu\n", s_guestMemory + static_cast<std::uint32_t>(step),
                 static_cast<unsigned long long>(executed));
    s_instructionsAtLastMark = s_instructions;
}

} // namespace

int qemu_plugin_install(qemu_plugin_id_t id, qemu_info_t const*, int, char**)
{
    qemu_plugin_register_vcpu_tb_trans_cb(id, COUNT_EVERY_INSTRUCTION);
    qemu_plugin_register_vcpu_syscall_cb(id, REPORT_MARK);
    return 0;
}
