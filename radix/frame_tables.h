// SPDX-License-Identifier: Apache-2.0
//
// How frames look on the wire: protocol-buffer messages, written as tables of their fields. A frame is one Frame with
// one of its fields set, and the age behind an event. Numbers are never given a second meaning; signed 64-bit numbers
// travel as their two's complement. No number above 18: the runtime drops fields whose number is also a metric
// identifier, the first being 19.
#pragma once

#include "messages/runtime/field_table.h"

namespace radix::wire {

using probeview::PBCodable;

// clang-format off

class HelloFrame final : public PBCodable {
  PB_MESSAGE(HelloFrame)
  PB_FIELD (1, "version",        version,       Version,       uint32);
  PB_FIELD (2, "oldest_version", oldestVersion, OldestVersion, uint32);
  PB_OBJECT(3, "name",           name,          Name,          string);
  PB_FIELD (4, "refusal_status", refusalStatus, RefusalStatus, int32);
  PB_OBJECT(5, "refusal",        refusal,       Refusal,       string);
  PB_FIELD (6, "observes",       observes,      Observes,      boolean);  // the client's
};

class CommandFrame final : public PBCodable {
  PB_MESSAGE(CommandFrame)
  PB_FIELD (1, "sequence",  sequence,  Sequence,  uint32);
  PB_OBJECT(2, "name",      name,      Name,      string);
  PB_OBJECT(3, "arguments", arguments, Arguments, bytes);  // one Items
};

class ReplyFrame final : public PBCodable {
  PB_MESSAGE(ReplyFrame)
  PB_FIELD (1, "sequence", sequence, Sequence, uint32);
  PB_FIELD (2, "status",   status,   Status,   int32);
  PB_OBJECT(3, "message",  message,  Message,  string);
  PB_OBJECT(4, "content",  content,  Content,  bytes);  // one Items
};

class DeliveryFrame final : public PBCodable {
  PB_MESSAGE(DeliveryFrame)
  PB_FIELD(1, "on", on, On, boolean);
};

class EventFrame final : public PBCodable {
  PB_MESSAGE(EventFrame)
  PB_FIELD (1,  "kind",         kind,        Kind,        int32);  // 0 metric, 1 trigger
  PB_FIELD (2,  "metric_id",    metricId,    MetricId,    uint64);
  PB_OBJECT(3,  "payload",      payload,     Payload,     bytes);
  PB_FIELD (4,  "profile_id",   profileId,   ProfileId,   uint64);
  PB_FIELD (5,  "time",         time,        Time,        uint64);  // milliseconds since 1970-01-01 UTC
  PB_OBJECT(6,  "origin",       origin,      Origin,      string);
  PB_FIELD (7,  "group",        group,       Group,       uint64);
  PB_FIELD (8,  "trigger_id",   triggerId,   TriggerId,   uint64);
  PB_FIELD (9,  "trigger_ref",  triggerRef,  TriggerRef,  uint64);
  PB_FIELD (10, "trigger_type", triggerType, TriggerType, uint64);
  PB_FIELD (11, "period",       period,      Period,      uint64);  // milliseconds; 0 on change
};

class DroppedFrame final : public PBCodable {
  PB_MESSAGE(DroppedFrame)
  PB_FIELD(1, "count", count, Count, uint64);
};

class PingFrame final : public PBCodable {
  PB_MESSAGE(PingFrame)
  PB_FIELD(1, "number",    number,   Number,   uint64);
  PB_FIELD(2, "is_answer", isAnswer, IsAnswer, boolean);
};

class MetricFrame final : public PBCodable {
  PB_MESSAGE(MetricFrame)
  PB_FIELD(1, "id", identifier, Identifier, uint64);
};

class SourceFrame final : public PBCodable {
  PB_MESSAGE(SourceFrame)
  PB_OBJECT(1, "origin",  origin,  Origin,  string);
  PB_FIELD (2, "phase",   phase,   Phase,   uint32);  // 0 running, 1 ended, 2 failed
  PB_OBJECT(3, "reason",  reason,  Reason,  string);
  PB_LIST  (4, "metrics", metrics, Metrics, metric, Metric, repeated<message<MetricFrame>>);
};

class SourcesFrame final : public PBCodable {
  PB_MESSAGE(SourcesFrame)
  PB_LIST (1, "sources", sources, Sources, source, Source, repeated<message<SourceFrame>>);
  PB_FIELD(2, "cut",     isCut,   IsCut,   boolean);  // more is there than is told
};

class Frame final : public PBCodable {
  PB_MESSAGE(Frame)
  PB_OBJECT(1, "hello",    hello,    Hello,    message<HelloFrame>);
  PB_OBJECT(2, "command",  command,  Command,  message<CommandFrame>);
  PB_OBJECT(3, "reply",    reply,    Reply,    message<ReplyFrame>);
  PB_OBJECT(4, "delivery", delivery, Delivery, message<DeliveryFrame>);
  PB_OBJECT(5, "event",    event,    Event,    message<EventFrame>);
  PB_OBJECT(6, "dropped",  dropped,  Dropped,  message<DroppedFrame>);
  PB_OBJECT(7, "ping",     ping,     Ping,     message<PingFrame>);
  PB_OBJECT(8, "sources",  sources,  Sources,  message<SourcesFrame>);
  // Beside an event: how old its record is, in milliseconds. It stands in the frame and not in the event, so that it can
  // follow the bytes of an event that many share.
  PB_FIELD (9, "age",      age,      Age,      uint64);
};

// One entry of a dictionary, or one value of a list (without a key). Lists and dictionaries inside are again one Items,
// encoded as bytes, so that a reader decides how deep it follows.
class Item final : public PBCodable {
  PB_MESSAGE(Item)
  PB_OBJECT(1, "key",     key,     Key,     string);
  PB_FIELD (2, "kind",    kind,    Kind,    uint32);  // as ItemKind
  PB_FIELD (3, "number",  number,  Number,  uint64);  // integers, truth values, the bits of reals
  PB_OBJECT(4, "content", content, Content, bytes);   // texts, bytes, lists, dictionaries
};

class Items final : public PBCodable {
  PB_MESSAGE(Items)
  PB_LIST(1, "items", items, Items, item, Item, repeated<message<Item>>);
};

// clang-format on

// The numbers of the value kinds on the wire.
enum class ItemKind : std::uint32_t {
  Int32 = 1,
  UInt32 = 2,
  Int64 = 3,
  UInt64 = 4,
  Bool = 5,
  Float = 6,
  Double = 7,
  Text = 8,
  Bytes = 9,
  List = 10,
  Dictionary = 11,
};

}  // namespace radix::wire
