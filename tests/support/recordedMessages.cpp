// SPDX-License-Identifier: MIT

#include "support/recordedMessages.h"

#include <csetjmp>

#include "message.h"

namespace tests {
namespace {

Messages recorded;
jmp_buf afterPanic;

void recordLog(const char* text) { recorded.log += text; }
void recordWarning(const char* text) { recorded.warning += text; }
void recordPanic(const char* text) {
  recorded.panic += text;
  longjmp(afterPanic, 1);
}

}  // namespace

Messages messagesOf(const std::function<void()>& call) {
  recorded = Messages{};
  const MessageSink log = Log_SetSink(recordLog);
  const MessageSink warning = Warning_SetSink(recordWarning);
  const MessageSink panic = Panic_SetSink(recordPanic);
  if (setjmp(afterPanic) == 0) call();
  Log_SetSink(log);
  Warning_SetSink(warning);
  Panic_SetSink(panic);
  return recorded;
}

bool isPanic(const std::string& panic, const std::string& kind, const std::string& source,
             const std::string& rest) {
  const std::string head = kind + " " + source + ":";
  const std::string tail = rest + "\n";
  if (panic.size() <= head.size() + tail.size()) return false;
  const std::string line = panic.substr(head.size(), panic.size() - head.size() - tail.size());
  return panic.starts_with(head) && panic.ends_with(tail) &&
         line.find_first_not_of("0123456789") == std::string::npos;
}

}  // namespace tests
