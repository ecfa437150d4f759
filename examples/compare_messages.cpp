// Shows what a way through files makes of messages: compare_messages [--summary] SENT GENERATED
//
// Reads two RTCM 3 streams and sets their messages beside each other, field by field. A field that
// differs is shown with the rule that makes it differ, with --summary only if there is none. Exit
// status 1 when there is such a field, or a message that did not come back.

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "conversion/datum_conversion.h"
#include "orxutils/orx_string.h"
#include "rtcm3/fields.h"
#include "rtcm3/message_reader.h"

namespace {

namespace velta = orx::cs::velta;
namespace rtcm3 = orx::cs::velta::rtcm3;

using Integers = std::vector<std::int64_t>;

struct Field {
  std::string_view name;
  std::string text;   ///< of a name
  Integers integers;  ///< of everything else
};

/// Takes a message apart into its fields.
class Collector {
 public:
  template <class Member>
  void Number(const char* name, unsigned /*width*/, Member value) {
    fields.push_back({name, {}, {static_cast<std::int64_t>(value)}});
  }
  void BitSet(const char* name, unsigned width, std::uint32_t value) { Number(name, width, value); }
  void Text(const char* name, const std::string& text, std::uint32_t /*counter*/) {
    fields.push_back({name, text, {}});
  }
  template <class... Columns>
  void Points(unsigned /*width*/, Columns... columns) {
    (fields.push_back({columns.name, {}, {std::begin(columns.values), std::end(columns.values)}}),
     ...);
  }

  std::vector<Field> fields;
};

std::vector<Field> FieldsOf(const rtcm3::Message& message) {
  Collector collector;
  std::visit([&](const auto& record) { rtcm3::VisitFields(collector, record); }, message);
  return collector.fields;
}

/// Each the same, or one unit nearer to zero.
bool IsTruncated(const Integers& sent, const Integers& generated) {
  return std::equal(
      sent.begin(), sent.end(), generated.begin(), generated.end(),
      [](std::int64_t a, std::int64_t b) { return a == b || a - b == (a > 0 ? 1 : -1); });
}

/// The rule that makes a field differ; empty when there is none.
std::string Explain(const Field& sent, const Field& generated) {
  constexpr std::string_view kNotKept[] = {"plateNumber",
                                           "horQualityIndicator",
                                           "vertQualityIndicator",
                                           "horGridQualityIndicator",
                                           "vertGridQualityIndicator",
                                           "mjd"};
  constexpr std::string_view kKept[] = {"systemId",
                                        "utilizedMsgIndicator",
                                        "computationIndicator",
                                        "heightIndicator",
                                        "horShiftIndicator",
                                        "vertShiftIndicator",
                                        "horInterpolationMethod",
                                        "vertInterpolationMethod",
                                        "projectionType",
                                        "rectificationFlag"};
  const auto isIn = [&](const auto& names) {
    return std::find(std::begin(names), std::end(names), sent.name) != std::end(names);
  };
  if (sent.name == "targetName") {
    const bool isCleaned = orx::Widen(generated.text) == velta::CleanDatumName(sent.text);
    return isCleaned ? "cleaned to be a file name" : "";
  }
  if (sent.name == "sourceName") {
    const bool isReduced = orx::Widen(generated.text) == velta::NormaliseSourceName(sent.text);
    return isReduced ? "reduced to its family" : "";
  }
  if (isIn(kNotKept)) return generated.integers == Integers{0} ? "not kept in the files" : "";
  if (isIn(kKept)) return "";
  return IsTruncated(sent.integers, generated.integers) ? "cut toward zero" : "";
}

void ShowRow(const std::string& name, const std::string& sent, const std::string& generated,
             const std::string& rule) {
  std::printf("    %-24s  %-18s  %-18s  %s\n", name.c_str(), sent.c_str(), generated.c_str(),
              rule.empty() ? "NOT EXPECTED" : rule.c_str());
}

/// Of an array the first number that differs is shown.
void Show(const Field& sent, const Field& generated, std::string rule) {
  std::string name(sent.name);
  if (sent.integers.empty()) {
    ShowRow(name, '"' + sent.text + '"', '"' + generated.text + '"', rule);
    return;
  }
  const std::size_t count = sent.integers.size();
  std::size_t first = count;
  std::size_t differing = 0;
  for (std::size_t i = 0; i < count; ++i) {
    if (sent.integers[i] == generated.integers[i]) continue;
    first = std::min(first, i);
    ++differing;
  }
  if (count > 1) name += "[" + std::to_string(first) + "]";
  if (differing > 1 && !rule.empty()) {
    rule += ", so are " + std::to_string(differing - 1) + " others";
  }
  ShowRow(name, std::to_string(sent.integers[first]), std::to_string(generated.integers[first]),
          rule);
}

class Comparison {
 public:
  explicit Comparison(bool isSummary) : isSummary_(isSummary) {}

  void Compare(const rtcm3::Message& sent, const rtcm3::Message& generated) {
    ++messages_;
    if (sent.index() != generated.index()) {
      Fail(std::to_string(rtcm3::NumberOf(sent)) + " came back as " +
           std::to_string(rtcm3::NumberOf(generated)));
      return;
    }
    const std::vector<Field> before = FieldsOf(sent);
    const std::vector<Field> after = FieldsOf(generated);
    std::vector<std::size_t> differing;
    for (std::size_t i = 0; i < before.size(); ++i) {
      const bool isSame =
          before[i].text == after[i].text && before[i].integers == after[i].integers;
      if (!isSame) differing.push_back(i);
    }
    fields_ += before.size();
    if (!isSummary_) {
      std::printf("  %u: %zu of %zu fields the same\n", rtcm3::NumberOf(sent),
                  before.size() - differing.size(), before.size());
    }
    for (const std::size_t i : differing) {
      const std::string rule = Explain(before[i], after[i]);
      rule.empty() ? failures_++ : explained_++;
      if (rule.empty() || !isSummary_) Show(before[i], after[i], rule);
    }
  }

  void Fail(const std::string& text) {
    std::printf("  %s\n", text.c_str());
    ++failures_;
  }

  /// \return the program's exit status
  int Finish() const {
    if (isSummary_) {
      std::printf("  %zu messages, %zu fields: %zu the same, %zu different by the rules above\n",
                  messages_, fields_, fields_ - explained_ - failures_, explained_);
    }
    return failures_ == 0 ? 0 : 1;
  }

 private:
  bool isSummary_;
  std::size_t messages_ = 0;
  std::size_t fields_ = 0;
  std::size_t explained_ = 0;
  std::size_t failures_ = 0;
};

}  // namespace

// What goes wrong beyond what is reported ends it: NOLINTNEXTLINE(bugprone-exception-escape)
int main(int argc, char** argv) {
  const bool isSummary = argc == 4 && std::string_view(argv[1]) == "--summary";
  if (argc != 3 && !isSummary) {
    std::fputs("usage: compare_messages [--summary] SENT GENERATED\n", stderr);
    return 2;
  }
  std::ifstream sentStream(argv[argc - 2], std::ios::binary);
  std::ifstream generatedStream(argv[argc - 1], std::ios::binary);
  rtcm3::StreamCounts sentCounts;
  rtcm3::StreamCounts generatedCounts;
  rtcm3::MessageReader sent(*sentStream.rdbuf(), sentCounts);
  rtcm3::MessageReader generated(*generatedStream.rdbuf(), generatedCounts);
  Comparison comparison(isSummary);
  while (const rtcm3::Message* const before = sent.Next()) {
    const rtcm3::Message* const after = generated.Next();
    after ? comparison.Compare(*before, *after)
          : comparison.Fail(std::to_string(rtcm3::NumberOf(*before)) + " did not come back");
  }
  while (const rtcm3::Message* const more = generated.Next()) {
    comparison.Fail(std::to_string(rtcm3::NumberOf(*more)) + " was not sent");
  }
  return comparison.Finish();
}
