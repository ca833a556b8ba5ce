// SPDX-License-Identifier: Apache-2.0
#include "service/service.h"

#include <algorithm>
#include <string_view>
#include <utility>

#include "messages/metric_identifiers.h"
#include "radix/client.h"
#include "radix/dictionary_bytes.h"
#include "radix/service_commands.h"
#include "radix/source_states.h"
#include "radix/status.h"
#include "service/payload_check.h"
#include "service/plans.h"
#include "service/status_report.h"
#include "values/plain_text.h"
#include "values/printer.h"

namespace probeview {

namespace {

using radix::Reply;
using radix::Status;

// More notes on one configuration than anybody reads.
constexpr std::size_t mostNotesTold = 10;

// The session fills in the sequence number.
Reply answer(Status status, std::string_view message = {}) {
  return Reply(0, static_cast<std::int32_t>(status), message);
}

// An argument that need not be there; then it is 0.
std::int64_t integerArgument(const Dictionary& arguments, std::string_view key) {
  const Value* value = arguments.find(key);
  return value != nullptr ? value->int64().value_or(0) : 0;
}

struct PushedConfiguration {
  std::optional<Configuration> configuration;
  // What its sender is told: why there is none, or what in it was ignored.
  Reply reply;
};

// The notes that anybody gets to read.
std::vector<std::string> notesToTell(const std::vector<std::string>& notes) {
  std::vector<std::string> told(notes.begin(),
                                notes.begin() + static_cast<std::ptrdiff_t>(std::min(notes.size(), mostNotesTold)));
  if (notes.size() > mostNotesTold)
    told.push_back("and " + std::to_string(notes.size() - mostNotesTold) + " more like these");
  return told;
}

PushedConfiguration readConfiguration(const Dictionary& arguments, ServiceLog& log, const std::string& who) {
  const Value* payload = arguments.find(radix::kKeyPayload);
  if (payload == nullptr || !payload->bytes()) {
    return {{}, answer(Status::BadArguments, "the configuration is missing: kKeyPayload must hold its bytes")};
  }
  if (const std::int64_t type = integerArgument(arguments, radix::kKeyPayloadType);
      type != radix::configurationPayloadType) {
    return {{}, answer(Status::BadArguments, "the payload type " + std::to_string(type) + " is not known, only 0 is")};
  }
  const auto bytes = *payload->bytes();
  ConfigurationResult result = parseConfiguration({reinterpret_cast<const char*>(bytes.data()), bytes.size()});
  if (!result.configuration) {
    log.write(LogLevel::Warning, "the configuration of " + who + " was refused: " + result.error);
    return {{}, answer(Status::BadConfiguration, result.error)};
  }
  const std::string subject = "the configuration of " + who + ": ";
  std::string message;
  for (const std::string& note : notesToTell(result.configuration->notes)) {
    log.write(LogLevel::Info, subject + note);
    if (!message.empty()) message += "; ";
    message += note;
  }
  return {std::move(result.configuration), answer(Status::Ok, message)};
}

std::string nameOf(const Session& session) {
  return "client " + std::to_string(session.number()) + " '" + session.clientName() + "'";
}

}  // namespace

Service::Service(Worker& worker, ServiceLog log, Settings settings)
    : worker_(worker),
      log_(log),
      settings_(std::move(settings)),
      sessionSettings_{.serviceName = settings_.name,
                       .versions = settings_.versions,
                       .greetingTime = settings_.greetingTime,
                       .leavingTime = settings_.leavingTime,
                       .outbox = settings_.outbox},
      started_(worker.clock().monotonicTime()),
      alive_(std::make_shared<bool>(true)) {}

Service::~Service() {
  *alive_ = false;
  // First, as a source may still report while it is stopped.
  sources_.clear();
}

void Service::addSource(std::unique_ptr<MetricSource> source) {
  sources_.push_back(std::make_unique<SourceSlot>(
      std::move(source), worker_, log_,
      SourceSlot::Ears{
          .record = [this, place = sources_.size()](
                        MetricRecord record, std::chrono::nanoseconds now) { route(place, std::move(record), now); },
          .conditionChanged = [this] { sourcesChanged(); }}));
  SourceSlot& slot = *sources_.back();
  log_.write(LogLevel::Info,
             "source " + slot.origin() + " can fill " + std::to_string(slot.metrics().size()) + " metrics");
  slot.start(plan_, listening_);
  sourcesChanged();
}

void Service::accept(std::unique_ptr<radix::Link> link, Peer peer) {
  // Those who were refused stay for a moment; a crowd of them is not waited for.
  if (sessions_.size() >= 2 * settings_.mostClients + reserve(peer)) {
    if (isWorthTelling(++closedAtOnce_)) {
      log_.write(LogLevel::Warning, "a connection of process " + std::to_string(peer.process) +
                                        " was closed: there are too many already (" + std::to_string(closedAtOnce_) +
                                        " closed so far)");
    }
    return;
  }
  sessions_.push_back(std::make_unique<Session>(++sessionsAccepted_, worker_, log_, static_cast<Session::Host&>(*this),
                                                sessionSettings_, std::move(link), std::move(peer)));
  sessions_.back()->start();
}

std::size_t Service::clientCount() const {
  return static_cast<std::size_t>(
      std::count_if(sessions_.begin(), sessions_.end(), [](const auto& session) { return session->isActive(); }));
}

std::optional<std::string> Service::refusal(const Session& session) {
  const std::size_t clients = clientCount();
  if (clients < settings_.mostClients + reserve(session.peer())) return std::nullopt;
  return "there are already " + std::to_string(clients) + " clients, more are not served";
}

Reply Service::perform(Session& session, const radix::Command& command) {
  const auto arguments = command.arguments().empty() ? std::optional<Dictionary>(std::in_place)
                                                     : radix::decodeDictionary(command.arguments());
  const std::string_view name = command.name();
  // As a peer may have named it, it may be of any length.
  const std::string shownName(beginningOf(name, 64));
  if (!arguments) return answer(Status::BadArguments, "the arguments of " + shownName + " cannot be read");
  if (name == radix::kCommandAddConfiguration) return addConfiguration(session, *arguments);
  if (name == radix::kCommandClearConfiguration) return clearConfiguration(session);
  if (name == radix::kCommandQueryMetric) return queryMetric(session, *arguments);
  if (name == radix::kCommandShowStatus) return showStatus();
  if (name == radix::kCommandSetBaseConfiguration) return setBaseConfiguration(*arguments);
  if (name == radix::kCommandClearBaseConfiguration) return clearBaseConfiguration();
  return answer(Status::UnknownCommand, "the command '" + shownName + "' is not known");
}

Reply Service::addConfiguration(Session& session, const Dictionary& arguments) {
  PushedConfiguration pushed = readConfiguration(arguments, log_, nameOf(session));
  if (!pushed.configuration) return pushed.reply;
  session.setConfiguration(std::move(pushed.configuration));
  wishesChanged(session);
  return pushed.reply;
}

Reply Service::clearConfiguration(Session& session) {
  session.setConfiguration(std::nullopt);
  wishesChanged(session);
  return answer(Status::Ok);
}

Reply Service::setBaseConfiguration(const Dictionary& arguments) {
  PushedConfiguration pushed = readConfiguration(arguments, log_, "the service");
  if (!pushed.configuration) return pushed.reply;
  baseConfiguration_ = std::move(pushed.configuration);
  log_.write(LogLevel::Info, "the service has a base configuration of " +
                                 std::to_string(baseConfiguration_->plan.metrics.size()) + " metrics");
  updatePlan();
  return pushed.reply;
}

Reply Service::clearBaseConfiguration() {
  baseConfiguration_.reset();
  log_.write(LogLevel::Info, "the service has no base configuration any more");
  updatePlan();
  return answer(Status::Ok);
}

Reply Service::queryMetric(Session& session, const Dictionary& arguments) {
  const std::int64_t trigger = integerArgument(arguments, radix::kKeyTriggerID);
  std::vector<std::int64_t> metrics;
  if (const std::int64_t metric = integerArgument(arguments, radix::kKeyMetricID); metric != 0) {
    // An identifier that is no metric's may be that of a trigger: the two look alike to whoever asks.
    if (isMetric(metric)) {
      metrics.push_back(metric);
    } else {
      metrics = metricsOfTrigger(session, metric);
    }
    if (metrics.empty()) {
      return answer(Status::CannotFill, hexText(metric) + " is no metric, and no configuration says which metrics a " +
                                            "trigger of that number stands for: push one with it under [triggers]");
    }
  } else if (trigger != 0) {
    metrics = metricsOfTrigger(session, trigger);
    if (metrics.empty()) {
      return answer(Status::CannotFill, "no configuration says which metrics the trigger " + hexText(trigger) +
                                            " stands for: push one with it under [triggers]");
    }
  } else {
    return answer(Status::BadArguments, "a query names a metric in kKeyMetricID or a trigger in kKeyTriggerID");
  }

  std::string missing;
  std::string withoutValue;
  bool any = false;
  List asked;
  for (const std::int64_t metric : metrics) {
    bool taken = false;
    bool canFill = false;
    for (std::size_t place = 0; place < sources_.size(); ++place) {
      SourceSlot& source = *sources_[place];
      if (!source.canFill(metric)) continue;
      // Before the source is asked, as it may answer at once.
      session.expectAnswer(place, metric);
      if (source.query(metric)) {
        taken = true;
      } else {
        session.forgetAnswer(place, metric);
      }
      // Not one that has failed over the question.
      canFill = canFill || source.canFill(metric);
    }
    any = any || taken;
    if (taken) {
      asked.append(metric);
    } else {
      std::string& list = canFill ? withoutValue : missing;
      list += (list.empty() ? "" : ", ") + metricText(metric);
    }
  }
  std::string message = missing.empty() ? "" : "no source can fill " + missing;
  if (!withoutValue.empty()) {
    message += (message.empty() ? "" : "; ") + ("no source has a value of " + withoutValue + " yet");
  }
  Reply reply = answer(any ? Status::Ok : Status::CannotFill, message);
  if (any) reply.setContent(radix::encodeDictionary({{"metrics", std::move(asked)}}));
  return reply;
}

bool Service::isMetric(std::int64_t identifier) const {
  return metricWithId(identifier) != nullptr ||
         std::any_of(sources_.begin(), sources_.end(), [&](const auto& source) { return source->canFill(identifier); });
}

std::vector<std::int64_t> Service::metricsOfTrigger(const Session& session, std::int64_t trigger) const {
  // A client's own configuration says what its triggers mean; without one the service's does.
  const std::optional<Configuration>& configuration =
      session.configuration() ? session.configuration() : baseConfiguration_;
  if (!configuration) return {};
  const auto found = configuration->triggers.find(trigger);
  return found != configuration->triggers.end() ? found->second : std::vector<std::int64_t>();
}

Reply Service::showStatus() const {
  Reply reply = answer(Status::Ok);
  reply.setContent(radix::encodeDictionary(StatusReport::of(*this)));
  return reply;
}

void Service::deliveryChanged(Session& session, bool) { wishesChanged(session); }

void Service::wishesChanged(Session& session) {
  // What is known goes first, then what a source has to say at the news.
  session.offerKept(lastRecords_);
  updatePlan();
  updateListening();
}

radix::FrameBytes Service::sources() {
  radix::SourceStates told;
  for (const auto& source : sources_) {
    SourceCondition condition = source->condition();
    told.states.push_back({.origin = source->origin(),
                           .phase = condition.phase,
                           .reason = std::move(condition.reason),
                           .metrics = source->metrics()});
  }
  return radix::encode(told);
}

void Service::sourcesChanged() {
  // A source that fails while it is stopped is no news any more.
  if (!*alive_) return;
  radix::FrameBytes frame;
  for (const auto& session : sessions_) {
    if (!session->isActive()) continue;
    if (frame == nullptr) frame = sources();
    session->tellSources(frame);
  }
}

void Service::ended(Session&) {
  if (removalPosted_) return;
  removalPosted_ = true;
  // The session that has ended is still at work.
  worker_.post([this, alive = alive_] {
    if (*alive) removeEnded();
  });
}

void Service::removeEnded() {
  removalPosted_ = false;
  std::erase_if(sessions_, [](const auto& session) { return session->hasEnded(); });
  updatePlan();
  updateListening();
}

void Service::route(std::size_t source, MetricRecord record, std::chrono::nanoseconds now) {
  LastRecords::Record kept{.metricId = record.metricId, .frame = {}, .born = worker_.clock().ageTime() - record.age};
  radix::Event event(radix::EventKind::Metric);
  event.setPayload(record.payload);
  event.setTime(radix::unsignedOf(record.time.count()));
  event.setOrigin(record.origin);
  if (record.metricId != 0) event.setMetricId(radix::unsignedOf(record.metricId));
  // 0 is said, too: that a metric comes on change is more than that nothing is known.
  event.setPeriod(radix::unsignedOf(record.period.count()));
  kept.frame = radix::encode(event);
  const std::uint64_t number = lastRecords_.keep(kept);
  for (const auto& session : sessions_) session->offer(source, kept, number, now);
}

void Service::updatePlan() {
  std::vector<const MetricPlan*> plans;
  bool observed = false;
  if (baseConfiguration_) plans.push_back(&baseConfiguration_->plan);
  for (const auto& session : sessions_) {
    if (session->isActive() && session->configuration()) plans.push_back(&session->configuration()->plan);
    observed = observed || (session->observes() && session->isListening());
  }
  std::optional<MetricPlan> plan = unite(plans, observed);
  if (plan == plan_) return;
  plan_ = std::move(plan);
  for (const auto& source : sources_) source->setPlan(plan_);
}

void Service::updateListening() {
  const bool listening =
      std::any_of(sessions_.begin(), sessions_.end(), [](const auto& session) { return session->isListening(); });
  if (listening == listening_) return;
  listening_ = listening;
  for (const auto& source : sources_) source->setListening(listening_);
}

}  // namespace probeview
