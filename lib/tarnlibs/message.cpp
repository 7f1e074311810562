// SPDX-License-Identifier: MIT
//
// Formatting of messages and their way to a sink.

#include "message.h"

#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>

namespace {

constexpr size_t kMessageBytes = 1024;

void toStandardError(const char* message) { fputs(message, stderr); }

/// One kind of message: where it goes at present.
class Channel {
 public:
  MessageSink exchange(MessageSink sink) {
    const MessageSink before = sink_.exchange(sink != nullptr ? sink : toStandardError);
    return before == toStandardError ? nullptr : before;
  }

  void send(const char* format, va_list arguments) const {
    char message[kMessageBytes];
    message[0] = 0;  // for a format that fails
    // NOLINTNEXTLINE(clang-analyzer-valist.Uninitialized): a false alarm, every caller starts it
    vsnprintf(message, sizeof message, format, arguments);
    sink_.load()(message);
  }

 private:
  std::atomic<MessageSink> sink_{toStandardError};
};

constinit Channel logChannel;
constinit Channel warningChannel;
constinit Channel panicChannel;

}  // namespace

extern "C" {

void Log(const char* format, ...) {
  va_list arguments;
  va_start(arguments, format);
  logChannel.send(format, arguments);
  va_end(arguments);
}

void Warning(const char* format, ...) {
  va_list arguments;
  va_start(arguments, format);
  warningChannel.send(format, arguments);
  va_end(arguments);
}

void Panic(const char* format, ...) {
  va_list arguments;
  va_start(arguments, format);
  panicChannel.send(format, arguments);
  va_end(arguments);
  abort();
}

MessageSink Log_SetSink(MessageSink sink) { return logChannel.exchange(sink); }
MessageSink Warning_SetSink(MessageSink sink) { return warningChannel.exchange(sink); }
MessageSink Panic_SetSink(MessageSink sink) { return panicChannel.exchange(sink); }

}  // extern "C"
