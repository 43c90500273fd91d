#pragma once
// The after-run power actions. logind decides who may power off, suspend or hibernate; a user at
// the seat usually may. With AUDIOCONV_POWER_DRYRUN=FILE set, the action's name ("poweroff",
// "suspend", "hibernate") is appended to FILE as one line instead, and nothing is run: every test
// sets it.
//
// Thread contract: any thread; each call waits for systemctl to answer.

namespace ac::platform {

// force: running programs and inhibitor locks do not hold the action up.
// true when the request was accepted (or the dry-run line was written).
bool ShutDownSystem(bool force);
bool SuspendSystem(bool force);
bool HibernateSystem(bool force);

}  // namespace ac::platform
