// The disc libraries (libcdio for drives and images, libburn and libisofs for recorders and
// data discs, uchardet for text without a code page) come with the first call that needs them,
// not with the window: loading and binding them made up a tenth of the start, and most starts
// never open the Rip or Burn tab.
//
// Each function the program calls is defined here as a jump through a slot. A slot first
// points at a binder that loads the library, looks the function up, writes the slot and goes
// on to the function with the caller's arguments untouched; every later call jumps straight
// through. Linked with --as-needed, the program then names none of these libraries. Compiled
// into the window program only: the tools and tests link the libraries directly. Elsewhere
// than x86-64 nothing is defined here and the program links them directly too.
//
// A function added to the program's calls without a line here still works: the linker then
// keeps its library, and MainWindowTest sees it mapped at the start.

#include <dlfcn.h>

#include <cstdio>
#include <cstdlib>
#include <mutex>

#if defined(__x86_64__) && defined(__linux__)

#define AC_LAZY_CDIO(X) \
    X(Cdio, cdio_close_tray) \
    X(Cdio, cdtext_get_const) \
    X(Cdio, cdio_destroy) \
    X(Cdio, cdio_eject_media) \
    X(Cdio, cdio_free_device_list) \
    X(Cdio, cdio_get_cdtext) \
    X(Cdio, cdio_get_devices) \
    X(Cdio, cdio_get_drive_cap) \
    X(Cdio, cdio_get_driver_id) \
    X(Cdio, cdio_get_first_track_num) \
    X(Cdio, cdio_get_last_track_num) \
    X(Cdio, cdio_get_track_format) \
    X(Cdio, cdio_get_track_lba) \
    X(Cdio, cdio_get_track_lsn) \
    X(Cdio, cdio_get_track_pregap_lsn) \
    X(Cdio, cdio_init) \
    X(Cdio, cdio_log_set_handler) \
    X(Cdio, cdio_open) \
    X(Cdio, cdio_open_am) \
    X(Cdio, mmc_close_tray) \
    X(Cdio, mmc_eject_media) \
    X(Cdio, mmc_prevent_allow_medium_removal)

#define AC_LAZY_BURN(X) \
    X(Burn, burn_disc_add_session) \
    X(Burn, burn_disc_available_space) \
    X(Burn, burn_disc_create) \
    X(Burn, burn_disc_erasable) \
    X(Burn, burn_disc_erase) \
    X(Burn, burn_disc_free) \
    X(Burn, burn_disc_get_profile) \
    X(Burn, burn_disc_get_sectors) \
    X(Burn, burn_disc_get_status) \
    X(Burn, burn_disc_write) \
    X(Burn, burn_drive_cancel) \
    X(Burn, burn_drive_free_speedlist) \
    X(Burn, burn_drive_get_adr) \
    X(Burn, burn_drive_get_speedlist) \
    X(Burn, burn_drive_get_status) \
    X(Burn, burn_drive_info_free) \
    X(Burn, burn_drive_release) \
    X(Burn, burn_drive_scan) \
    X(Burn, burn_drive_scan_and_grab) \
    X(Burn, burn_drive_set_speed) \
    X(Burn, burn_drive_wrote_well) \
    X(Burn, burn_fd_source_new) \
    X(Burn, burn_get_read_capacity) \
    X(Burn, burn_initialize) \
    X(Burn, burn_msgs_set_severities) \
    X(Burn, burn_precheck_write) \
    X(Burn, burn_session_add_track) \
    X(Burn, burn_session_create) \
    X(Burn, burn_session_free) \
    X(Burn, burn_source_free) \
    X(Burn, burn_track_create) \
    X(Burn, burn_track_define_data) \
    X(Burn, burn_track_free) \
    X(Burn, burn_track_set_pregap_size) \
    X(Burn, burn_track_set_source) \
    X(Burn, burn_write_opts_auto_write_type) \
    X(Burn, burn_write_opts_free) \
    X(Burn, burn_write_opts_new) \
    X(Burn, burn_write_opts_set_perform_opc) \
    X(Burn, burn_write_opts_set_underrun_proof) \
    X(Burn, burn_write_opts_set_write_type)

#define AC_LAZY_ISOFS(X) \
    X(Isofs, iso_dir_get_node) \
    X(Isofs, iso_error_to_msg) \
    X(Isofs, iso_image_create_burn_source) \
    X(Isofs, iso_image_get_root) \
    X(Isofs, iso_image_new) \
    X(Isofs, iso_image_set_volume_id) \
    X(Isofs, iso_image_unref) \
    X(Isofs, iso_init) \
    X(Isofs, iso_node_get_type) \
    X(Isofs, iso_set_msgs_severities) \
    X(Isofs, iso_tree_add_new_dir) \
    X(Isofs, iso_tree_add_new_node) \
    X(Isofs, iso_write_opts_free) \
    X(Isofs, iso_write_opts_new) \
    X(Isofs, iso_write_opts_set_iso_level) \
    X(Isofs, iso_write_opts_set_joliet) \
    X(Isofs, iso_write_opts_set_joliet_long_names) \
    X(Isofs, iso_write_opts_set_joliet_longer_paths) \
    X(Isofs, iso_write_opts_set_rockridge) \
    X(Isofs, iso_write_opts_set_will_cancel)

#define AC_LAZY_UCHARDET(X) \
    X(Uchardet, uchardet_data_end) \
    X(Uchardet, uchardet_delete) \
    X(Uchardet, uchardet_get_charset) \
    X(Uchardet, uchardet_handle_data) \
    X(Uchardet, uchardet_new)
#define AC_LAZY_ALL(X) AC_LAZY_CDIO(X) AC_LAZY_BURN(X) AC_LAZY_ISOFS(X) AC_LAZY_UCHARDET(X)

// The binder's frame keeps every register a call may pass arguments in (the six integer
// registers, %rax with a variadic call's count of vector registers, %xmm0-7); %r11 carries the
// slot. The stack is 16-byte aligned at the inner call.
asm(R"(
    .pushsection .text
    .p2align 4
    .type ac_lazy_common, @function
ac_lazy_common:
    pushq %rbp
    movq %rsp, %rbp
    pushq %rdi
    pushq %rsi
    pushq %rdx
    pushq %rcx
    pushq %r8
    pushq %r9
    pushq %rax
    subq $136, %rsp
    movdqu %xmm0, 0(%rsp)
    movdqu %xmm1, 16(%rsp)
    movdqu %xmm2, 32(%rsp)
    movdqu %xmm3, 48(%rsp)
    movdqu %xmm4, 64(%rsp)
    movdqu %xmm5, 80(%rsp)
    movdqu %xmm6, 96(%rsp)
    movdqu %xmm7, 112(%rsp)
    movq %r11, %rdi
    call ac_lazy_bind
    movq %rax, %r11
    movdqu 0(%rsp), %xmm0
    movdqu 16(%rsp), %xmm1
    movdqu 32(%rsp), %xmm2
    movdqu 48(%rsp), %xmm3
    movdqu 64(%rsp), %xmm4
    movdqu 80(%rsp), %xmm5
    movdqu 96(%rsp), %xmm6
    movdqu 112(%rsp), %xmm7
    addq $136, %rsp
    popq %rax
    popq %r9
    popq %r8
    popq %rcx
    popq %rdx
    popq %rsi
    popq %rdi
    popq %rbp
    jmp *%r11
    .size ac_lazy_common, .-ac_lazy_common
    .popsection
)");

#define AC_LAZY_TRAMPOLINE(library, name)                 \
    asm(".pushsection .text\n"                            \
        ".globl " #name "\n"                              \
        ".type " #name ", @function\n"                    \
        ".p2align 4\n" #name ":\n"                        \
        "    jmp *ac_lazy_slot_" #name "(%rip)\n"         \
        ".size " #name ", .-" #name "\n"                  \
        "ac_lazy_first_" #name ":\n"                      \
        "    leaq ac_lazy_slot_" #name "(%rip), %r11\n"   \
        "    jmp ac_lazy_common\n"                        \
        ".popsection\n"                                   \
        ".pushsection .data\n"                            \
        ".p2align 3\n"                                    \
        "ac_lazy_slot_" #name ":\n"                       \
        "    .quad ac_lazy_first_" #name "\n"             \
        ".popsection\n");
AC_LAZY_ALL(AC_LAZY_TRAMPOLINE)

#define AC_LAZY_SLOT_DECLARATION(library, name) extern void* ac_lazy_slot_##name;
extern "C" {
AC_LAZY_ALL(AC_LAZY_SLOT_DECLARATION)
}

namespace {

enum Library { Cdio, Burn, Isofs, Uchardet, LibraryCount };

// Sonames as the build found them (src/shell/CMakeLists.txt).
constexpr const char* kSonames[LibraryCount] = {AC_SONAME_CDIO, AC_SONAME_BURN, AC_SONAME_ISOFS,
                                                AC_SONAME_UCHARDET};

struct LazyFunction {
    void** slot;
    const char* name;
    Library library;
};

#define AC_LAZY_ENTRY(library, name) {&ac_lazy_slot_##name, #name, library},
constexpr LazyFunction kFunctions[] = {AC_LAZY_ALL(AC_LAZY_ENTRY)};

std::mutex s_bindMutex;
void* s_handles[LibraryCount] = {};

[[noreturn]] void Fail(const char* what, const char* detail) {
    // Nothing can be returned in place of a function of the wrong kind: a library of the
    // package that cannot be loaded ends the program with its name.
    std::fprintf(stderr, "audio-converter: %s: %s\n", what, detail != nullptr ? detail : "");
    std::abort();
}

}  // namespace

extern "C" __attribute__((used)) void* ac_lazy_bind(void** slot) noexcept {
    const LazyFunction* function = nullptr;
    for (const LazyFunction& candidate : kFunctions) {
        if (candidate.slot == slot) {
            function = &candidate;
            break;
        }
    }
    if (function == nullptr) {
        Fail("an unknown library function was called", nullptr);
    }
    std::lock_guard lock(s_bindMutex);
    void*& handle = s_handles[function->library];
    if (handle == nullptr) {
        // Never closed: the libraries keep threads and state of their own.
        handle = ::dlopen(kSonames[function->library], RTLD_NOW | RTLD_LOCAL);
        if (handle == nullptr) {
            Fail(kSonames[function->library], ::dlerror());
        }
    }
    void* target = ::dlsym(handle, function->name);
    if (target == nullptr) {
        Fail(function->name, ::dlerror());
    }
    __atomic_store_n(slot, target, __ATOMIC_RELEASE);
    return target;
}

#endif
