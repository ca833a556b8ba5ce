// SPDX-License-Identifier: Apache-2.0
//
// Decibels and back without the mathematics library, whose last digits differ from one library to the next and would
// change the bytes of a scenario. Good to a ten-thousandth of a decibel, which is far below any unit on the wire.
#pragma once

namespace probeview::scenario {

// The logarithm to base 2 of a positive number.
double logarithmOfTwo(double number);

// Ten times the decimal logarithm of a positive number.
double toDecibels(double ratio);

// Ten to the power of a tenth of the argument.
double fromDecibels(double decibels);

// The angle in degrees, 0 to 180, whose cosine is given.
double arcCosineDegrees(double cosine);

}  // namespace probeview::scenario
