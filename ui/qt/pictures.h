// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <iosfwd>
#include <memory>
#include <string>
#include <vector>

#include "ui/front.h"

namespace probeview::qt {

struct PicturesOptions {
  std::string outputPath;  // a PNG file, replaced
  // Category pages in the order in which they stand on the sheet, such as "LTE RRC State".
  std::vector<std::string> pageKeys;
  bool light = true;
  bool dark = true;
};

// A front that draws the window's pages without a display into one picture, from the same QML that the window shows:
// the launch list, the category list of the first page's technology and the pages named, once per look. Its main queue
// is Qt's event loop. It is made once, on the main thread, before anything else uses Qt.
class PicturesFront : public Front {
 public:
  // Whether there is nothing more to wait for; asked often. Without it nothing is waited for.
  virtual void waitUntil(std::function<bool()> isFilled) = 0;
};

// What goes wrong is said on the stream; the exit status is then 1.
std::unique_ptr<PicturesFront> makePicturesFront(int& argc, char** argv, PicturesOptions options, std::ostream& errors);

}  // namespace probeview::qt
