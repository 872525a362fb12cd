#include "process/Sandbox.h"

#include <linux/audit.h>
#include <linux/filter.h>
#include <linux/seccomp.h>
#include <sched.h>
#include <sys/ioctl.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>
#include <cstddef>
#include <string>
#include <system_error>
#include <vector>

namespace nimbo {

namespace {

// A filter of classic BPF (seccomp(2)), made here: a library would take longer to load than the filter to install.

#if defined(__x86_64__)
constexpr std::uint32_t kMachine = AUDIT_ARCH_X86_64;
#elif defined(__aarch64__)
constexpr std::uint32_t kMachine = AUDIT_ARCH_AARCH64;
#elif defined(__riscv) && __riscv_xlen == 64
constexpr std::uint32_t kMachine = AUDIT_ARCH_RISCV64;
#else
constexpr std::uint32_t kMachine = 0;  // its numbers of system calls have not been looked at
#endif

#if defined(__SANITIZE_ADDRESS__)
constexpr bool kIsTraced = true;  // looking for leaks, the sanitizer traces the process from a copy of it
#else
constexpr bool kIsTraced = false;
#endif

constexpr std::uint32_t kAllow = SECCOMP_RET_ALLOW;
constexpr std::uint32_t kRefuse = SECCOMP_RET_ERRNO | EPERM;

/// A program of classic BPF over a system call: seccomp(2).
class Filter {
 public:
  void load(std::size_t offset) { add(BPF_LD | BPF_W | BPF_ABS, static_cast<std::uint32_t>(offset)); }
  /// The lower half of an argument, which comes first on these machines.
  void loadArgument(std::size_t index) { load(offsetof(seccomp_data, args) + 8 * index); }
  void answer(std::uint32_t action) { add(BPF_RET | BPF_K, action); }
  /// `then` is for values of which the comparison (BPF_JEQ, BPF_JGE, BPF_JSET) with `operand` holds.
  template <class Then>
  void when(std::uint16_t comparison, std::uint32_t operand, Then then) {
    const std::size_t jump = _code.size();
    add(BPF_JMP | BPF_K | comparison, operand);
    then();
    _code[jump].jf = static_cast<std::uint8_t>(_code.size() - jump - 1);
  }
  void answerWhen(std::uint16_t comparison, std::uint32_t operand, std::uint32_t action) {
    when(comparison, operand, [&] { answer(action); });
  }
  void answerUnlessEqual(std::uint32_t value, std::uint32_t action) {
    add(BPF_JMP | BPF_K | BPF_JEQ, value, 1);
    answer(action);
  }

  bool install() {
    const sock_fprog program{static_cast<unsigned short>(_code.size()), _code.data()};
    return ::prctl(PR_SET_SECCOMP, SECCOMP_MODE_FILTER, &program) == 0;
  }

 private:
  void add(std::uint16_t code, std::uint32_t operand, std::uint8_t skippedWhenTrue = 0) {
    _code.push_back({code, skippedWhenTrue, 0, operand});
  }
  std::vector<sock_filter> _code;
};

Filter makeFilter() {
  constexpr std::uint32_t kOtherNumbering = 0x40000000;  // of x32 programs
  Filter filter;
  const auto refuse = [&](std::initializer_list<std::uint32_t> calls) {
    for (const std::uint32_t call : calls) filter.answerWhen(BPF_JEQ, call, kRefuse);
  };
  // Of this system call only those pass of which an argument compares so.
  const auto passWhen = [&](std::uint32_t call, std::size_t argument, std::uint16_t comparison,
                            std::initializer_list<std::uint32_t> operands) {
    filter.when(BPF_JEQ, call, [&] {
      filter.loadArgument(argument);
      for (const std::uint32_t operand : operands) filter.answerWhen(comparison, operand, kAllow);
      filter.answer(kRefuse);
    });
  };
  filter.load(offsetof(seccomp_data, arch));
  filter.answerUnlessEqual(kMachine, kRefuse);
  filter.load(offsetof(seccomp_data, nr));
  filter.answerWhen(BPF_JGE, kOtherNumbering, kRefuse);
  // programs
  refuse({SYS_execve, SYS_execveat});
  // other processes
  refuse({SYS_kill, SYS_tkill, SYS_rt_sigqueueinfo, SYS_rt_tgsigqueueinfo, SYS_pidfd_getfd, SYS_pidfd_send_signal,
          SYS_process_vm_readv, SYS_process_vm_writev, SYS_process_madvise, SYS_kcmp});
  // namespaces and mounts
  refuse({SYS_unshare, SYS_setns, SYS_mount, SYS_umount2, SYS_pivot_root, SYS_chroot, SYS_move_mount, SYS_open_tree,
          SYS_fsopen, SYS_fsconfig, SYS_fsmount, SYS_fspick, SYS_open_by_handle_at, SYS_swapon, SYS_swapoff});
  // the kernel
  refuse({SYS_init_module, SYS_finit_module, SYS_delete_module, SYS_kexec_load, SYS_reboot, SYS_bpf,
          SYS_perf_event_open, SYS_userfaultfd, SYS_io_uring_setup, SYS_io_uring_enter, SYS_io_uring_register,
          SYS_fanotify_init, SYS_syslog, SYS_acct, SYS_quotactl, SYS_personality});
  // keys, users, the clock, the machine's name
  refuse({SYS_add_key, SYS_request_key, SYS_keyctl, SYS_setuid, SYS_setgid, SYS_setreuid, SYS_setregid, SYS_setresuid,
          SYS_setresgid, SYS_setgroups, SYS_setfsuid, SYS_setfsgid, SYS_capset, SYS_settimeofday, SYS_clock_settime,
          SYS_adjtimex, SYS_clock_adjtime, SYS_sethostname, SYS_setdomainname});
  // connections from outside
  refuse({SYS_listen, SYS_accept, SYS_accept4});
#if defined(__x86_64__)
  refuse({SYS_fork, SYS_vfork, SYS_iopl, SYS_ioperm, SYS_modify_ldt, SYS_kexec_file_load});
#endif
  passWhen(SYS_tgkill, 0, BPF_JEQ, {static_cast<std::uint32_t>(::getpid())});
  passWhen(SYS_socket, 0, BPF_JEQ, {AF_UNIX, AF_INET, AF_INET6, AF_NETLINK});
  filter.when(BPF_JEQ, SYS_ioctl, [&] {
    filter.loadArgument(1);
    filter.answerUnlessEqual(TIOCSTI, kAllow);
    filter.answer(kRefuse);
  });
  if (!kIsTraced) {
    filter.answerWhen(BPF_JEQ, SYS_ptrace, kRefuse);
    // Threads may come, processes may not. Where clone3 is missing, the C library makes its threads with clone.
    filter.answerWhen(BPF_JEQ, SYS_clone3, SECCOMP_RET_ERRNO | ENOSYS);
    passWhen(SYS_clone, 0, BPF_JSET, {CLONE_THREAD});
  }
  filter.answer(kAllow);
  return filter;
}

ErrorRef refusal(const char* what) {
  const int code = errno;
  return Error::errorWithDomain_code_reason(std::string(kSandboxErrorDomain), code,
                                            std::string("This system does not let a program give up ") + what + ": " +
                                                std::generic_category().message(code) + ".");
}

}  // namespace

ErrorRef giveUpPrivileges() {
  ::close_range(STDERR_FILENO + 1, ~0u, 0);  // an older kernel closes nothing
  if (::prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0) != 0) return refusal("gaining privileges");
  errno = ENOSYS;
  if (kMachine == 0 || !makeFilter().install()) return refusal("system calls");
  return nullptr;
}

}  // namespace nimbo
