#pragma once

/// The function of the library libnimbo-lockstate.so, which is opened by path and never linked.
extern "C" {

/// Whether the user's session is locked, as the login manager says: 1 locked, 0 unlocked or not to be told. The session
/// is the calling process's, or the one that the user sees where the process belongs to none. Takes half a second at
/// most. Source: org.freedesktop.login1(5), property LockedHint.
int nimbo_getDeviceLockState(void);
}
