// Plugin for QEMU's user-mode emulator: prints to standard error how many guest instructions a
// program executed.
//
//   g++ -shared -fPIC -o instruction_counter.so instruction_counter.cpp
//   qemu-arm -plugin ./instruction_counter.so program
//
// Every translated block adds its length whenever it runs, within the translated code. A block
// that is left early, by a signal, counts whole.

#include <cinttypes>
#include <cstddef>
#include <cstdint>
#include <cstdio>

// Version 1 of the emulator's plugin interface, as far as it is used here: Debian's packages have
// no header for it.
extern "C" {
using qemu_plugin_id_t = uint64_t;
struct qemu_plugin_tb;
struct qemu_info_t;
enum qemu_plugin_op { QEMU_PLUGIN_INLINE_ADD_U64 };

size_t qemu_plugin_tb_n_insns(const qemu_plugin_tb* block);
void qemu_plugin_register_vcpu_tb_exec_inline(qemu_plugin_tb* block, qemu_plugin_op op, void* to,
                                              uint64_t amount);
void qemu_plugin_register_vcpu_tb_trans_cb(qemu_plugin_id_t id,
                                           void (*call)(qemu_plugin_id_t, qemu_plugin_tb*));
void qemu_plugin_register_atexit_cb(qemu_plugin_id_t id, void (*call)(qemu_plugin_id_t, void*),
                                    void* data);

__attribute__((visibility("default"))) int qemu_plugin_version = 1;
__attribute__((visibility("default"))) int qemu_plugin_install(qemu_plugin_id_t id,
                                                               const qemu_info_t* info, int argc,
                                                               char** argv);
}

namespace {

uint64_t executed = 0;

void CountBlock(qemu_plugin_id_t, qemu_plugin_tb* block) {
    qemu_plugin_register_vcpu_tb_exec_inline(block, QEMU_PLUGIN_INLINE_ADD_U64, &executed,
                                             qemu_plugin_tb_n_insns(block));
}

void Print(qemu_plugin_id_t, void*) {
    std::fprintf(stderr, "%" PRIu64 "\n", executed);
}

}  // namespace

int qemu_plugin_install(qemu_plugin_id_t id, const qemu_info_t*, int, char**) {
    qemu_plugin_register_vcpu_tb_trans_cb(id, CountBlock);
    qemu_plugin_register_atexit_cb(id, Print, nullptr);
    return 0;
}
