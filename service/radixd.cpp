// SPDX-License-Identifier: Apache-2.0
#include "service/radixd.h"

#include <signal.h>

#include <cerrno>
#include <cstring>
#include <exception>
#include <iostream>
#include <memory>
#include <utility>
#include <vector>

#include "platform/clock.h"
#include "platform/command_line.h"
#include "platform/event_loop.h"
#include "radix/socket_path.h"
#include "service/log.h"
#include "service/service.h"
#include "service/socket_listener.h"
#include "service/sources/make_source.h"

namespace probeview {

namespace {

constexpr int failure = 1;

constexpr std::string_view defaultSource = "scenario";

struct Options {
  std::string socket;
  std::vector<std::string> sources;
  std::string logLevel{nameOf(LogLevel::Info)};
};

std::optional<LogLevel> logLevel(std::string_view name) {
  for (const LogLevel level : {LogLevel::Error, LogLevel::Warning, LogLevel::Info, LogLevel::Debug}) {
    if (name == nameOf(level)) return level;
  }
  return std::nullopt;
}

void describe(CommandLine& program, Options& options) {
  program.describeHelpAndVersion("Show this help and exit", "Show the version and exit");
  program
      .option("--socket", options.socket,
              "Where to listen; otherwise $XDG_RUNTIME_DIR/radixd.sock (the system's service listens at\n"
              "/run/radixd/radix.sock)")
      .typeName("PATH")
      .check(radix::socketPathTrouble);
  program
      .option("--source", options.sources,
              "What feeds the service, may be given several times: scenario[:NAME][,seed=N][,speed=N] (the\n"
              "default), trace:FILE[,speed=N][,loop]")
      .typeName("SOURCE")
      .shownAsOne();
  program.option("--log-level", options.logLevel, "How much to log: error, warning, info (the default), debug")
      .typeName("LEVEL")
      .check([](const std::string& name) { return logLevel(name) ? "" : "'" + name + "' is no level of the log"; });
  program.footer(
      "The service runs in the foreground, logs to standard error and ends cleanly on SIGTERM.\n"
      "\n"
      "The rows of a trace do not tell the connected states of UMTS apart: data and voice are shown as\n"
      "CELL_DCH, which is a guess.\n"
      "\n"
      "Examples:\n"
      "  radixd\n"
      "  radixd --socket /tmp/test/radixd.sock --source scenario:city,seed=7\n"
      "  radixd --source trace:drive.csv,speed=20,loop\n"
      "\n"
      "Exit status: 0 after a clean end; 1 it cannot begin (the socket is taken, a source cannot be had);\n"
      "2 the command line is not understood.");
}

std::vector<ListeningSocket::Result> openSockets(const Options& options) {
  std::vector<ListeningSocket::Result> results;
  for (const int descriptor : handedOverSockets()) results.push_back(ListeningSocket::adopt(descriptor));
  if (!results.empty()) return results;
  std::string path = options.socket;
  if (path.empty()) {
    radix::SocketPath own = radix::userSocketPath(radix::SocketSurroundings::ofThisProcess(), true);
    if (own.path.empty()) {
      results.push_back({nullptr, std::move(own.error)});
      return results;
    }
    path = std::move(own.path);
  }
  results.push_back(ListeningSocket::make(
      path, path == radix::systemSocketPath ? ListeningSocket::Sharing::Group : ListeningSocket::Sharing::User));
  return results;
}

int serve(const Options& options, ServiceLog& log) {
  EventLoop loop;
  loop.onSignals({SIGTERM, SIGINT}, [&loop](int) { loop.stop(); });
  // Who reads the log may go away; that ends nothing.
  ::signal(SIGPIPE, SIG_IGN);

  // The sources first: a service that cannot have them does not take the socket.
  std::vector<std::unique_ptr<MetricSource>> sources;
  const std::vector<std::string> wanted =
      options.sources.empty() ? std::vector<std::string>{std::string(defaultSource)} : options.sources;
  for (const std::string& description : wanted) {
    SourceResult result = makeSource(description);
    if (!result.source) {
      log.write(LogLevel::Error, "the source '" + description + "' cannot be had: " + result.error);
      return failure;
    }
    sources.push_back(std::move(result.source));
  }

  std::vector<ListeningSocket::Result> sockets = openSockets(options);
  Service service(loop, log, {});
  std::vector<std::unique_ptr<SocketListener>> listeners;
  for (ListeningSocket::Result& result : sockets) {
    if (!result.socket) {
      log.write(LogLevel::Error, result.error);
      return failure;
    }
    const std::string where = result.socket->path().empty() ? "a socket of the system manager" : result.socket->path();
    listeners.push_back(std::make_unique<SocketListener>(loop, log, std::move(result.socket), peerCredentials,
                                                         [&service](std::unique_ptr<radix::Link> link, Peer peer) {
                                                           service.accept(std::move(link), std::move(peer));
                                                         }));
    if (!listeners.back()->start()) {
      log.write(LogLevel::Error, "cannot watch the socket: " + std::string(std::strerror(errno)));
      return failure;
    }
    log.write(LogLevel::Info, "listening at " + where);
  }
  for (auto& source : sources) service.addSource(std::move(source));
  loop.run();
  return 0;
}

// With no more lines a minute than anybody needs.
int serveWithin(const Options& options, LineSink& sink, LogLevel level) {
  // Who wants to see everything is given everything.
  BoundedLines bounded(sink, systemClock());
  ServiceLog log(level == LogLevel::Debug ? sink : bounded, level);
  try {
    return serve(options, log);
  } catch (const std::exception& error) {
    log.write(LogLevel::Error, std::string("cannot begin: ") + error.what());
    return failure;
  }
}

}  // namespace

int runRadixd(std::span<const std::string> arguments, LineSink& sink) {
  CommandLine program("radixd", "Serves metrics of the phone's radio to its clients over a local socket.");
  Options options;
  describe(program, options);
  if (const std::optional<int> status = program.parse(arguments, std::cout, std::cerr)) return *status;
  const LogLevel level = logLevel(options.logLevel).value_or(LogLevel::Info);
  const int status = serveWithin(options, sink, level);
  // The last line comes also when there were too many before it.
  if (status == 0) ServiceLog(sink, level).write(LogLevel::Info, "ending");
  return status;
}

}  // namespace probeview
