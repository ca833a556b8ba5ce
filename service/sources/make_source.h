// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

#include "source/metric_source.h"

namespace probeview {

// Makes the source named on a command line: "trace:FILE[,speed=N][,loop]", "scenario[:NAME][,seed=N][,speed=N]".
SourceResult makeSource(std::string_view description);

}  // namespace probeview
