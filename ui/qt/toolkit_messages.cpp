// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/toolkit_messages.h"

#include <unistd.h>

#include <QMessageLogContext>
#include <QString>
#include <string>

#include "platform/log_writer.h"
#include "values/plain_text.h"

namespace probeview::qt {

namespace {

LogWriter& toolkitLog() {
  // Never destroyed: the toolkit may speak until the process has ended, which is when what waits is written.
  static auto* log =
      new LogWriter({.label = "toolkit log", .prefix = "probeview: warning: "}, writeToDescriptor(STDERR_FILENO));
  return *log;
}

void take(QtMsgType type, const QMessageLogContext& context, const QString& message) {
  // It may quote a desktop's service.
  std::string line = onOneLine(qFormatLogMessage(type, context, message).toStdString());
  line += '\n';
  toolkitLog().append(line);
  // The toolkit stops the program when this returns.
  if (type == QtFatalMsg) drainLogs(logsEndTime);
}

}  // namespace

void logToolkitMessages() {
  toolkitLog();
  qInstallMessageHandler(take);
}

}  // namespace probeview::qt
