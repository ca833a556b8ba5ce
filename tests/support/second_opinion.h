// SPDX-License-Identifier: Apache-2.0
//
// What second_opinion.table says of metrics, display dictionaries and pages: a second time, apart from the tables that
// the product is made from, so that a slip in those is seen. The model in Python reads the same.
#pragma once

#include <cstdint>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

namespace probeview {

struct SecondOpinion {
  struct Metric {
    std::string constant;
    std::int64_t id = 0;
    std::string message;
    std::string dictionary;
    std::string prefix;  // of its line in the log
  };
  struct Tag {
    std::uint16_t number = 0;
    std::string name;
  };
  struct Page {
    std::string technology;
    std::string category;
    std::string rule;  // all or first entries of the dictionary; empty for a page of something else
    std::string dictionary;
  };

  std::vector<Metric> metrics;    // that the store takes
  std::vector<Metric> leftAlone;  // constant and identifier alone
  std::vector<std::string> dictionaries;
  std::vector<Tag> tags;
  std::vector<Page> pages;
};

// Tests run from the top of the repository.
inline SecondOpinion readSecondOpinion() {
  const std::string path = "tests/witness/model/second_opinion.table";
  std::ifstream file(path);
  if (!file) throw std::runtime_error("cannot open " + path + "; tests run from the top of the repository");
  const auto upTo = [](std::istream& in, char end) {
    std::string text;
    std::getline(in >> std::ws, text, end);
    if (end == '|' && text.ends_with(' ')) text.pop_back();
    return text;
  };
  SecondOpinion said;
  for (std::string line; std::getline(file, line);) {
    std::istringstream words(line);
    std::string kind, number;
    words >> kind;
    if (kind == "metric") {
      SecondOpinion::Metric metric;
      words >> metric.constant >> number >> metric.message >> metric.dictionary;
      metric.id = std::stoll(number, nullptr, 16);
      upTo(words, '"');
      std::getline(words, metric.prefix, '"');
      said.metrics.push_back(metric);
    } else if (kind == "left-alone") {
      SecondOpinion::Metric metric;
      words >> metric.constant >> number;
      metric.id = std::stoll(number, nullptr, 16);
      said.leftAlone.push_back(metric);
    } else if (kind == "dictionary") {
      words >> said.dictionaries.emplace_back();
    } else if (kind == "tag") {
      SecondOpinion::Tag tag;
      words >> number >> tag.name;
      tag.number = static_cast<std::uint16_t>(std::stoul(number, nullptr, 16));
      said.tags.push_back(tag);
    } else if (kind == "page") {
      SecondOpinion::Page page;
      page.technology = upTo(words, '|');
      page.category = upTo(words, '|');
      words >> page.rule >> page.dictionary;
      said.pages.push_back(page);
    }
  }
  return said;
}

inline const SecondOpinion& secondOpinion() {
  static const SecondOpinion said = readSecondOpinion();
  return said;
}

}  // namespace probeview
