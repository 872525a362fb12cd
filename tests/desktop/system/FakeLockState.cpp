// Stands in for the lock-state library: answers the number that it is built with.
extern "C" int nimbo_getDeviceLockState(void) { return FAKE_LOCK_STATE; }
