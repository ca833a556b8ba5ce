// SPDX-License-Identifier: Apache-2.0
#include "scenario/sim_card.h"

#include <string>
#include <string_view>

namespace probeview::scenario {
namespace {

using Bytes = std::vector<std::uint8_t>;

constexpr std::string_view imsiDigits = "001010123456789";
// 89 for telecommunications, country 001, issuer 01, an account number; the check digit follows (ITU-T E.118).
constexpr std::string_view cardNumberDigits = "899990100000000001";
constexpr std::uint8_t unusedByte = 0xFF;

// Two digits to a byte, the first in the low half; a missing last one is all ones.
Bytes swappedDigits(std::string_view digits) {
  Bytes bytes;
  for (std::size_t i = 0; i < digits.size(); i += 2) {
    const auto low = static_cast<unsigned>(digits[i] - '0');
    const auto high = i + 1 < digits.size() ? static_cast<unsigned>(digits[i + 1] - '0') : 0xFU;
    bytes.push_back(static_cast<std::uint8_t>(high << 4 | low));
  }
  return bytes;
}

// ISO/IEC 7812-1, annex B.
char luhnDigit(std::string_view digits) {
  unsigned sum = 0;
  bool doubled = true;
  for (auto digit = digits.rbegin(); digit != digits.rend(); ++digit, doubled = !doubled) {
    const auto value = static_cast<unsigned>(*digit - '0') * (doubled ? 2U : 1U);
    sum += value / 10 + value % 10;
  }
  return static_cast<char>('0' + (10 - sum % 10) % 10);
}

void append(Bytes& bytes, std::uint64_t number, unsigned count) {
  while (count-- > 0) bytes.push_back(static_cast<std::uint8_t>(number >> (8 * count)));
}

void appendPlmn(Bytes& bytes, std::uint32_t code = networkCode) {
  for (const std::uint8_t byte : encodedPlmn(code)) bytes.push_back(byte);
}

Bytes cardNumber() {
  std::string number(cardNumberDigits);
  number += luhnDigit(number);
  Bytes bytes = swappedDigits(number);
  bytes.resize(10, unusedByte);
  return bytes;
}

Bytes imsi() {
  Bytes bytes;
  append(bytes, encodedImsi().size(), 1);
  for (const std::uint8_t byte : encodedImsi()) bytes.push_back(byte);
  return bytes;
}

// Normal operation, and how many digits the mobile network code has (31.102, 4.2.18).
Bytes administrativeData() { return {0x00, 0x00, 0x00, networkCodeDigits}; }

// Services that the card offers, bit 1 of byte 1 being service 1 (31.102, 4.2.8).
Bytes serviceTable() {
  Bytes bytes(12, 0);
  // Fixed dialling, short messages and their parameters, the service provider's name, GSM access and its security
  // context, the network's name, EPS mobility management information.
  for (const unsigned service : {2U, 10U, 12U, 19U, 27U, 38U, 45U, 85U}) {
    bytes[(service - 1) / 8] = static_cast<std::uint8_t>(bytes[(service - 1) / 8] | 1U << ((service - 1) % 8));
  }
  return bytes;
}

Bytes serviceProviderName() {
  constexpr std::string_view providerName = "Test PLMN 1-1";
  Bytes bytes;
  append(bytes, 0x01, 1);  // shown together with the network's name
  for (const char letter : providerName) bytes.push_back(static_cast<std::uint8_t>(letter));
  bytes.resize(17, unusedByte);
  return bytes;
}

Bytes forbiddenNetworks() {
  Bytes bytes;
  appendPlmn(bytes, 99);
  bytes.resize(12, unusedByte);
  return bytes;
}

Bytes location(const MobilityContext& context) {
  Bytes bytes;
  append(bytes, context.temporaryIdentity.value_or(0xFFFFFFFF), 4);
  appendPlmn(bytes);
  append(bytes, context.locationArea.value_or(0xFFFE), 2);  // the reserved code of no area (3GPP TS 23.003, 4.1)
  append(bytes, unusedByte, 1);
  append(bytes, context.update == MobilityUpdate::STATUS_UPDATED ? 0 : 1, 1);
  return bytes;
}

Bytes packetLocation(const GprsContext& context) {
  Bytes bytes;
  append(bytes, context.temporaryIdentity.value_or(0xFFFFFFFF), 4);
  append(bytes, 0xFFFFFF, 3);  // the network signs no temporary identities
  appendPlmn(bytes);
  append(bytes, context.locationArea.value_or(0xFFFE), 2);
  append(bytes, context.locationArea ? context.routingArea : unusedByte, 1);
  append(bytes, context.update == GprsUpdate::GPRS_STATUS_UPDATED ? 0 : 1, 1);
  return bytes;
}

Bytes epsLocation(const EpsContext& context) {
  Bytes bytes;
  if (context.temporaryIdentity) {
    append(bytes, 0x0BF6, 2);  // eleven bytes, of which the first says that a GUTI follows (3GPP TS 24.301, 9.9.3.12)
    appendPlmn(bytes);
    append(bytes, context.groupIdentity, 2);
    append(bytes, context.groupCode, 1);
    append(bytes, *context.temporaryIdentity, 4);
  } else {
    bytes.resize(12, unusedByte);
  }
  appendPlmn(bytes);
  append(bytes, context.trackingAreas.empty() ? 0xFFFE : context.trackingAreas.front(), 2);
  append(bytes, context.update == EpsUpdate::EPS_STATUS_UPDATED ? 0 : 1, 1);
  return bytes;
}

}  // namespace

std::array<std::uint8_t, 3> encodedPlmn(std::uint32_t code) {
  const std::uint32_t tens = code / 10 % 10;
  const std::uint32_t ones = code % 10;
  // Country code 001: digits 0, 0, 1; the filler stands for the third digit of the network code.
  return {0x00, 0xF1, static_cast<std::uint8_t>(ones << 4 | tens)};
}

std::array<std::uint8_t, 8> encodedImsi() {
  std::array<std::uint8_t, 8> bytes{};
  constexpr unsigned oddImsi = 0x9;  // an odd number of digits, and that it is an IMSI
  bytes[0] = static_cast<std::uint8_t>(static_cast<unsigned>(imsiDigits[0] - '0') << 4 | oddImsi);
  const Bytes rest = swappedDigits(imsiDigits.substr(1));
  for (std::size_t i = 0; i < rest.size(); ++i) bytes[i + 1] = rest[i];
  return bytes;
}

std::vector<SimFile> simFiles(const Registration& registration) {
  return {
      {0x2FE2, cardNumber()},
      {0x6F07, imsi()},
      {0x6FAD, administrativeData()},
      {0x6F38, serviceTable()},
      {0x6F46, serviceProviderName()},
      {0x6F7B, forbiddenNetworks()},
      {0x6F7E, location(registration.mobility())},
      {0x6F73, packetLocation(registration.gprs())},
      {0x6FE3, epsLocation(registration.eps())},
  };
}

}  // namespace probeview::scenario
