#include "process/Sandbox.h"

#include <fcntl.h>
#include <linux/landlock.h>
#include <linux/sockios.h>
#include <sched.h>
#include <seccomp.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/shm.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <memory>
#include <string>
#include <system_error>

#include "desktop/raii/FileDescriptor.h"

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
  /// Looks at all 64 bits: one rule for 32. What calls these passes a register that holds nothing else.
  void refuseUnlessEqual(int call, unsigned argument, std::uint64_t value) {
    refuseWhere(call, {argument, SCMP_CMP_NE, value, 0});
  }
  /// Of the values below 32 only these pass.
  void refuseUnlessAmong(int call, unsigned argument, std::initializer_list<std::uint32_t> values) {
    constexpr std::uint32_t kEnd = 32;
    for (std::uint32_t value = 0; value < kEnd; ++value)
      if (std::find(values.begin(), values.end(), value) == values.end()) refuseWhereEqual(call, argument, value);
    for (std::uint32_t bit = kEnd; bit != 0; bit <<= 1) refuseWhereBitsAre(call, argument, bit, bit);
  }
  void refuseWhereBitsAre(int call, unsigned argument, std::uint32_t mask, std::uint32_t bits) {
    refuseWhere(call, {argument, SCMP_CMP_MASKED_EQ, mask, bits});
  }
  void refuseWhere(int call, const scmp_arg_cmp& comparison) {
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
  // connections and messages from outside
  filter.refuse({SCMP_SYS(bind), SCMP_SYS(listen), SCMP_SYS(accept), SCMP_SYS(accept4)});
  // files cut short by their path, or opened for reading, which Landlock learned late to see
  filter.refuse({SCMP_SYS(truncate), SCMP_SYS(truncate64), SCMP_SYS(creat)});
  filter.refuse({SCMP_SYS(openat2)}, ENOSYS);
  filter.refuseWhereBitsAre(SCMP_SYS(open), 1, O_TRUNC | O_ACCMODE, O_TRUNC);
  filter.refuseWhereBitsAre(SCMP_SYS(openat), 2, O_TRUNC | O_ACCMODE, O_TRUNC);
  // signals to others that a descriptor sends, and what limits or slows others
  for (const int call : {SCMP_SYS(fcntl), SCMP_SYS(fcntl64)})
    for (const int command : {F_SETOWN, F_SETOWN_EX, F_SETSIG, F_SETLEASE, F_NOTIFY})
      filter.refuseWhereEqual(call, 1, static_cast<std::uint32_t>(command));
  for (const int call : {SCMP_SYS(prlimit64), SCMP_SYS(sched_setaffinity), SCMP_SYS(sched_setattr),
                         SCMP_SYS(sched_setparam), SCMP_SYS(sched_setscheduler)})
    filter.refuseUnlessEqual(call, 0, 0);
  filter.refuse({SCMP_SYS(setpriority), SCMP_SYS(ioprio_set), SCMP_SYS(migrate_pages), SCMP_SYS(move_pages)});
  // code that is written and run
  for (const int call : {SCMP_SYS(mmap), SCMP_SYS(mmap2)})
    filter.refuseWhereBitsAre(call, 2, PROT_WRITE | PROT_EXEC, PROT_WRITE | PROT_EXEC);
  for (const int call : {SCMP_SYS(mprotect), SCMP_SYS(pkey_mprotect)})
    filter.refuseWhereBitsAre(call, 2, PROT_EXEC, PROT_EXEC);
  filter.refuseWhereBitsAre(SCMP_SYS(shmat), 2, SHM_EXEC, SHM_EXEC);
  filter.refuseUnlessEqual(SCMP_SYS(tgkill), 0, static_cast<std::uint64_t>(::getpid()));
  filter.refuseUnlessAmong(SCMP_SYS(socket), 0, {AF_UNIX, AF_INET, AF_INET6, AF_NETLINK});
  for (const unsigned request : {TIOCSTI, TIOCLINUX, FIOSETOWN, SIOCSPGRP})
    filter.refuseWhereEqual(SCMP_SYS(ioctl), 1, request);
  if (!kIsTraced) {
    filter.refuse({SCMP_SYS(ptrace)});
    // Threads may come, processes may not. Where clone3 is missing, the C library makes its threads with clone.
    filter.refuse({SCMP_SYS(clone3)}, ENOSYS);
    filter.refuseWhereBitsAre(SCMP_SYS(clone), kCloneFlags, CLONE_THREAD, 0);
  }
  return filter.install();
}

/// All that changes files and folders, and running them.
constexpr std::uint64_t kChangesOfFiles = LANDLOCK_ACCESS_FS_WRITE_FILE;
constexpr std::uint64_t kChanges =
    kChangesOfFiles | LANDLOCK_ACCESS_FS_EXECUTE | LANDLOCK_ACCESS_FS_REMOVE_DIR | LANDLOCK_ACCESS_FS_REMOVE_FILE |
    LANDLOCK_ACCESS_FS_MAKE_CHAR | LANDLOCK_ACCESS_FS_MAKE_DIR | LANDLOCK_ACCESS_FS_MAKE_REG |
    LANDLOCK_ACCESS_FS_MAKE_SOCK | LANDLOCK_ACCESS_FS_MAKE_FIFO | LANDLOCK_ACCESS_FS_MAKE_BLOCK |
    LANDLOCK_ACCESS_FS_MAKE_SYM | LANDLOCK_ACCESS_FS_REFER;
/// What the widget does in its folders.
constexpr std::uint64_t kOwnChanges = kChangesOfFiles | LANDLOCK_ACCESS_FS_REMOVE_DIR | LANDLOCK_ACCESS_FS_REMOVE_FILE |
                                      LANDLOCK_ACCESS_FS_MAKE_DIR | LANDLOCK_ACCESS_FS_MAKE_REG |
                                      LANDLOCK_ACCESS_FS_REFER;

/// The errno value of what went wrong; 0 when the kernel refuses what changes anything but `writable`.
int restrictWriting(std::span<const std::filesystem::path> writable) {
  constexpr long kLeastVersion = 2;
  const long version = ::syscall(SYS_landlock_create_ruleset, nullptr, 0, LANDLOCK_CREATE_RULESET_VERSION);
  if (version < 0) return errno;
  if (version < kLeastVersion) return EOPNOTSUPP;
  const landlock_ruleset_attr changes{.handled_access_fs = kChanges};
  const FileDescriptor rules(static_cast<int>(::syscall(SYS_landlock_create_ruleset, &changes, sizeof changes, 0)));
  if (!rules) return errno;
  for (const std::filesystem::path& path : writable) {
    const FileDescriptor place(::open(path.c_str(), O_PATH | O_CLOEXEC));
    struct stat status {};
    if (!place || ::fstat(place.get(), &status) != 0) continue;
    const landlock_path_beneath_attr allowed{.allowed_access = S_ISDIR(status.st_mode) ? kOwnChanges : kChangesOfFiles,
                                             .parent_fd = place.get()};
    if (::syscall(SYS_landlock_add_rule, rules.get(), LANDLOCK_RULE_PATH_BENEATH, &allowed, 0) != 0) return errno;
  }
  return ::syscall(SYS_landlock_restrict_self, rules.get(), 0) == 0 ? 0 : errno;
}

ErrorRef refusal(const char* what, int code) {
  return Error::errorWithDomain_code_reason(std::string(kSandboxErrorDomain), code,
                                            std::string("This system does not let a program give up ") + what + ": " +
                                                std::generic_category().message(code) + ".");
}

}  // namespace

void closeInheritedDescriptors(int kept) {
  // An older kernel closes nothing.
  constexpr unsigned kFirst = STDERR_FILENO + 1;
  const unsigned spared = kept < 0 ? 0 : static_cast<unsigned>(kept);
  if (spared > kFirst) ::close_range(kFirst, spared - 1, 0);
  ::close_range(std::max(spared + 1, kFirst), ~0u, 0);
}

ErrorRef giveUpPrivileges(std::span<const std::filesystem::path> writable) {
  if (::prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0) != 0) return refusal("gaining privileges", errno);
  // Without the one the other still holds.
  const int unrestricted = restrictWriting(writable);
  if (const int code = installFilter()) return refusal("system calls", code);
  if (unrestricted != 0) return refusal("changing the user's files", unrestricted);
  return nullptr;
}

}  // namespace nimbo
