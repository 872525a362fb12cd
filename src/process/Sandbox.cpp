#include "process/Sandbox.h"

#include <sched.h>
#include <seccomp.h>
#include <sys/ioctl.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <memory>
#include <string>
#include <system_error>

namespace nimbo {

namespace {

#if defined(__SANITIZE_ADDRESS__)
constexpr bool kIsTraced = true;  // looking for leaks, the sanitizer traces the process from a copy of it
#else
constexpr bool kIsTraced = false;
#endif

#if defined(__s390__)
constexpr unsigned kCloneFlags = 1;  // the argument of clone that holds them
#else
constexpr unsigned kCloneFlags = 0;
#endif

/// A filter of system calls that allows what is not refused. The kernel reads most arguments as 32 bits, and the upper
/// half of a register may hold anything: they are compared without it.
class Filter {
 public:
  Filter() : _context(::seccomp_init(SCMP_ACT_ALLOW)) {
    if (!_context) _failure = ENOMEM;
    // Calls by the numbers of another machine, such as those of 32 bits.
    keepFailure(::seccomp_attr_set(_context.get(), SCMP_FLTATR_ACT_BADARCH, SCMP_ACT_ERRNO(EPERM)));
  }

  void refuse(std::initializer_list<int> calls, int error = EPERM) {
    const auto action = SCMP_ACT_ERRNO(static_cast<unsigned>(error));
    for (const int call : calls) keepFailure(::seccomp_rule_add_array(_context.get(), action, call, 0, nullptr));
  }
  void refuseWhereEqual(int call, unsigned argument, std::uint32_t value) {
    refuseWhereBitsAre(call, argument, ~0u, value);
  }
  void refuseUnlessEqual(int call, unsigned argument, std::uint32_t value) {
    for (std::uint32_t bit = 1; bit != 0; bit <<= 1) refuseWhereBitsAre(call, argument, bit, ~value & bit);
  }
  /// Of the values below 32 only these pass.
  void refuseUnlessAmong(int call, unsigned argument, std::initializer_list<std::uint32_t> values) {
    constexpr std::uint32_t kEnd = 32;
    for (std::uint32_t value = 0; value < kEnd; ++value)
      if (std::find(values.begin(), values.end(), value) == values.end()) refuseWhereEqual(call, argument, value);
    for (std::uint32_t bit = kEnd; bit != 0; bit <<= 1) refuseWhereBitsAre(call, argument, bit, bit);
  }
  void refuseWhereBitsAre(int call, unsigned argument, std::uint32_t mask, std::uint32_t bits) {
    const scmp_arg_cmp comparison{argument, SCMP_CMP_MASKED_EQ, mask, bits};
    keepFailure(::seccomp_rule_add_array(_context.get(), SCMP_ACT_ERRNO(EPERM), call, 1, &comparison));
  }

  /// The errno value of what went wrong first; 0 when the filter is in force.
  int install() {
    keepFailure(_failure == 0 ? ::seccomp_load(_context.get()) : 0);
    return _failure;
  }

 private:
  struct Releaser {
    void operator()(void* context) const { ::seccomp_release(context); }
  };
  void keepFailure(int code) {
    if (_failure == 0 && code < 0) _failure = -code;
  }

  std::unique_ptr<void, Releaser> _context;
  int _failure = 0;
};

int installFilter() {
  Filter filter;
  // programs
  filter.refuse({SCMP_SYS(execve), SCMP_SYS(execveat), SCMP_SYS(fork), SCMP_SYS(vfork)});
  // other processes
  filter.refuse({SCMP_SYS(kill), SCMP_SYS(tkill), SCMP_SYS(rt_sigqueueinfo), SCMP_SYS(rt_tgsigqueueinfo),
                 SCMP_SYS(pidfd_getfd), SCMP_SYS(pidfd_send_signal), SCMP_SYS(process_vm_readv),
                 SCMP_SYS(process_vm_writev), SCMP_SYS(process_madvise), SCMP_SYS(kcmp)});
  // namespaces and mounts
  filter.refuse({SCMP_SYS(unshare), SCMP_SYS(setns), SCMP_SYS(mount), SCMP_SYS(umount2), SCMP_SYS(pivot_root),
                 SCMP_SYS(chroot), SCMP_SYS(move_mount), SCMP_SYS(open_tree), SCMP_SYS(fsopen), SCMP_SYS(fsconfig),
                 SCMP_SYS(fsmount), SCMP_SYS(fspick), SCMP_SYS(open_by_handle_at), SCMP_SYS(swapon),
                 SCMP_SYS(swapoff)});
  // the kernel
  filter.refuse({SCMP_SYS(init_module),
                 SCMP_SYS(finit_module),
                 SCMP_SYS(delete_module),
                 SCMP_SYS(kexec_load),
                 SCMP_SYS(kexec_file_load),
                 SCMP_SYS(iopl),
                 SCMP_SYS(ioperm),
                 SCMP_SYS(modify_ldt),
                 SCMP_SYS(reboot),
                 SCMP_SYS(bpf),
                 SCMP_SYS(perf_event_open),
                 SCMP_SYS(userfaultfd),
                 SCMP_SYS(io_uring_setup),
                 SCMP_SYS(io_uring_enter),
                 SCMP_SYS(io_uring_register),
                 SCMP_SYS(fanotify_init),
                 SCMP_SYS(syslog),
                 SCMP_SYS(acct),
                 SCMP_SYS(quotactl),
                 SCMP_SYS(personality)});
  // keys, users, the clock, the machine's name
  filter.refuse({SCMP_SYS(add_key), SCMP_SYS(request_key), SCMP_SYS(keyctl), SCMP_SYS(setuid), SCMP_SYS(setgid),
                 SCMP_SYS(setreuid), SCMP_SYS(setregid), SCMP_SYS(setresuid), SCMP_SYS(setresgid), SCMP_SYS(setgroups),
                 SCMP_SYS(setfsuid), SCMP_SYS(setfsgid), SCMP_SYS(capset), SCMP_SYS(settimeofday),
                 SCMP_SYS(clock_settime), SCMP_SYS(adjtimex), SCMP_SYS(clock_adjtime), SCMP_SYS(sethostname),
                 SCMP_SYS(setdomainname)});
  // the same, by the names that they have on machines of 32 bits
  filter.refuse({SCMP_SYS(umount), SCMP_SYS(setuid32), SCMP_SYS(setgid32), SCMP_SYS(setreuid32), SCMP_SYS(setregid32),
                 SCMP_SYS(setresuid32), SCMP_SYS(setresgid32), SCMP_SYS(setgroups32), SCMP_SYS(setfsuid32),
                 SCMP_SYS(setfsgid32), SCMP_SYS(stime), SCMP_SYS(clock_settime64), SCMP_SYS(clock_adjtime64)});
  // connections from outside
  filter.refuse({SCMP_SYS(listen), SCMP_SYS(accept), SCMP_SYS(accept4)});
  filter.refuseUnlessEqual(SCMP_SYS(tgkill), 0, static_cast<std::uint32_t>(::getpid()));
  filter.refuseUnlessAmong(SCMP_SYS(socket), 0, {AF_UNIX, AF_INET, AF_INET6, AF_NETLINK});
  filter.refuseWhereEqual(SCMP_SYS(ioctl), 1, TIOCSTI);
  if (!kIsTraced) {
    filter.refuse({SCMP_SYS(ptrace)});
    // Threads may come, processes may not. Where clone3 is missing, the C library makes its threads with clone.
    filter.refuse({SCMP_SYS(clone3)}, ENOSYS);
    filter.refuseWhereBitsAre(SCMP_SYS(clone), kCloneFlags, CLONE_THREAD, 0);
  }
  return filter.install();
}

ErrorRef refusal(const char* what, int code) {
  return Error::errorWithDomain_code_reason(std::string(kSandboxErrorDomain), code,
                                            std::string("This system does not let a program give up ") + what + ": " +
                                                std::generic_category().message(code) + ".");
}

}  // namespace

ErrorRef giveUpPrivileges() {
  ::close_range(STDERR_FILENO + 1, ~0u, 0);  // an older kernel closes nothing
  if (::prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0) != 0) return refusal("gaining privileges", errno);
  if (const int code = installFilter()) return refusal("system calls", code);
  return nullptr;
}

}  // namespace nimbo
