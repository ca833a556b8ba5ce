// SPDX-License-Identifier: Apache-2.0
//
// One golden file for each page key: what the page shows and logs for an empty store, after the scenario "edges", and
// after three small drives. tests/rewrite_golden rewrites them.
#include <gtest/gtest.h>

#include <map>
#include <set>
#include <utility>

#include "platform/manual_loop.h"
#include "service/sources/make_source.h"
#include "store/metric_validator.h"
#include "tests/support/golden.h"
#include "ui/category_page.h"
#include "ui/page_snapshot.h"
#include "ui/varnet_view_items.h"

namespace probeview {
namespace {

// The keys of the lists, those that only the pages' own tables know, and one that nobody knows.
std::vector<std::string> pageKeys() {
  std::vector<std::string> keys = navigablePageKeys();
  for (const char* key : {"LTE Component Carrier Info", "UMTS Serving Cell Measurement", "Connected Serv Cell Meas",
                          "GSM GPRS Config", "LTE No Such Category"}) {
    keys.emplace_back(key);
  }
  return keys;
}

class Lines final : public LineSink {
 public:
  void line(std::string_view text) override { text_ += std::string(text) + "\n"; }
  std::string take() { return std::exchange(text_, {}); }

 private:
  std::string text_;
};

// A store fed by a source, with the service and the client library left out between them.
class Drive final : public MetricSink {
 public:
  void begin(const std::string& description) {
    SourceResult result = makeSource(description);
    ASSERT_EQ(result.error, "");
    source_ = std::move(result.source);
    source_->start(SourceContext{loop_, loop_, sourceLog_}, *this);
    source_->setListening(true);
  }
  void play(std::chrono::nanoseconds time) { loop_.advance(time); }
  void emit(MetricRecord record) override {
    store_.metricsDidUpdate(
        Dictionary{{"kKeyMetricID", record.metricId}, {"kKeyPayload", Value::bytes(record.payload)}});
  }

  PageSnapshot snapshot(const std::string& key) {
    console_.take();
    CategoryPage page(key, store_, console_);
    return takeSnapshot(page);
  }
  // The page, then what asking for it has logged.
  std::string show(const std::string& key) {
    std::string text = plainText(snapshot(key));
    const std::string log = console_.take();
    if (!log.empty()) text += "logged: " + log;
    return text;
  }

 private:
  ManualLoop loop_;
  Lines console_;
  Lines systemLog_;
  Lines sourceLog_;
  MetricValidator store_{
      MetricValidator::Surroundings{.wrapper = nullptr, .console = console_, .systemLog = systemLog_}};
  std::unique_ptr<MetricSource> source_;
};

// The rows of a page but for its timestamps, each as text.
std::vector<std::string> rowsOf(const PageSnapshot& snapshot) {
  std::vector<std::string> rows;
  for (const PageSnapshot::Section& section : snapshot.sections) {
    for (const ListCell& cell : section.rows) {
      if (cell.text != "timestamp") rows.push_back(plainText(PageSnapshot{{{std::nullopt, {cell}}}}));
    }
  }
  return rows;
}

// Every metric of the scenario once, and then each new row that comes to be seen until all of its variants have come.
std::map<std::string, std::string> edges() {
  Drive drive;
  drive.begin("scenario:edges");
  drive.play(std::chrono::seconds(3));
  std::map<std::string, std::string> texts;
  std::map<std::string, std::set<std::string>> seen;
  for (const std::string& key : pageKeys()) {
    texts[key] = drive.show(key) + "then:\n";
    for (std::string& row : rowsOf(drive.snapshot(key))) seen[key].insert(std::move(row));
  }
  // There is something new every 400 ms; the metric with the most variants, a cell's band, has some eighty.
  for (int look = 0; look < 600; ++look) {
    drive.play(std::chrono::milliseconds(100));
    for (const std::string& key : pageKeys()) {
      for (const std::string& row : rowsOf(drive.snapshot(key))) {
        if (seen[key].insert(row).second) texts[key] += row;
      }
    }
  }
  return texts;
}

std::map<std::string, std::string> drive(const std::string& name) {
  Drive drive;
  drive.begin("trace:tests/pages/traces/" + name + ".csv,speed=1000");
  drive.play(std::chrono::minutes(10));
  std::map<std::string, std::string> texts;
  for (const std::string& key : pageKeys()) texts[key] = drive.show(key);
  return texts;
}

std::string fileName(std::string key) {
  for (char& character : key) {
    if (character == ' ') character = '_';
  }
  return key + ".txt";
}

TEST(GoldenPages, EachKeyShowsWhatIsKept) {
  std::map<std::string, std::string> afterEdges = edges();
  std::map<std::string, std::string> drives[] = {drive("drive_a"), drive("drive_b"), drive("drive_c")};
  Drive empty;
  for (const std::string& key : pageKeys()) {
    const std::string text = "== empty store\n" + empty.show(key) +           //
                             "== after scenario:edges\n" + afterEdges[key] +  //
                             "== after drive_a\n" + drives[0][key] +          //
                             "== after drive_b\n" + drives[1][key] +          //
                             "== after drive_c\n" + drives[2][key];
    expectGolden("tests/pages/golden/" + fileName(key), text);
  }
}

TEST(GoldenPages, NoFileIsLeftOfAKeyThatIsGone) {
  std::set<std::string> expected;
  for (const std::string& key : pageKeys()) expected.insert(fileName(key));
  for (const auto& entry : std::filesystem::directory_iterator("tests/pages/golden")) {
    EXPECT_TRUE(expected.contains(entry.path().filename().string())) << entry.path();
  }
}

}  // namespace
}  // namespace probeview
