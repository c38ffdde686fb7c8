// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Being asked to stop: noticed between two files, never in the middle of one.
#ifndef MEDIIDX_TOOL_CLI_INTERRUPT_H_
#define MEDIIDX_TOOL_CLI_INTERRUPT_H_

namespace mediidx::tool {

/// From now on SIGINT, SIGTERM and SIGHUP are only noted, and a closed output is an error of the
/// write instead of the end of the process: a server that was started has to be stopped.
void note_signals();

/// The signal that came first; 0 while none has.
int noted_signal();

/// From now on SIGHUP does not stop, but says that the configuration has changed; also where it was
/// ignored.
void reload_on_hangup();

/// True when such a signal came since the last call.
bool take_hangup();

/// From now on SIGUSR1 asks how far things are.
void answer_user_signal();

/// True when such a signal came since the last call.
bool take_user_signal();

}  // namespace mediidx::tool

#endif
