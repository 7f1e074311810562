// SPDX-License-Identifier: MIT
/// \file
/// Messages of the libraries: Log for information, Warning for a fault about to be fatal, Panic for
/// the fatal fault itself.
///
/// All three take a printf format and its arguments; a text brings its own line end. By default a
/// message goes to standard error. A host replaces that in one of two ways: it installs a sink per
/// kind with the setters below, or it defines a function of the same name (Log, Warning, Panic) in
/// the program, which the dynamic linker then prefers to the one here.
///
/// That happens to a program that has functions of these names for purposes of its own, too: they
/// receive the libraries' messages, and where their parameters are other ones the program crashes
/// at the first. Make such functions static, or compile them with hidden visibility.
///
/// Threads: any function may be called from any thread. A setter takes effect for messages that
/// begin after it returns.

#ifndef TARNLIBS_MESSAGE_H
#define TARNLIBS_MESSAGE_H

#include "baseTypes.h"

#ifdef __cplusplus
extern "C" {
#endif

/// \defgroup tarnlibs_messages Messages
/// @{

/// Receives one formatted message, line end included. The text is valid during the call only.
typedef void (*MessageSink)(const char* message);

/// Reports something that is not an error of the program. Messages over 1023 bytes are cut.
TARNLIBS_EXPORT void Log(const char* format, ...) __attribute__((format(printf, 1, 2)));

/// Reports a fault; most of the time a Panic follows. Messages over 1023 bytes are cut.
TARNLIBS_EXPORT void Warning(const char* format, ...) __attribute__((format(printf, 1, 2)));

/// Reports a fatal fault and ends the process with abort(). It never returns to its caller: when
/// an installed sink returns, the process still ends.
TARNLIBS_EXPORT void Panic(const char* format, ...) __attribute__((format(printf, 1, 2), noreturn));

/// Installs the receiver of Log messages and returns the one before; null stands for the default,
/// standard error.
TARNLIBS_EXPORT MessageSink Log_SetSink(MessageSink sink);

/// Installs the receiver of Warning messages and returns the one before; null is the default.
TARNLIBS_EXPORT MessageSink Warning_SetSink(MessageSink sink);

/// Installs the receiver of Panic messages and returns the one before; null is the default. The
/// sink may leave by longjmp (no lock is held and nothing in the libraries is left half done that
/// a later call would meet, but memory of the interrupted call is not released).
TARNLIBS_EXPORT MessageSink Panic_SetSink(MessageSink sink);

/// @}

#ifdef __cplusplus
}
#endif

#endif
