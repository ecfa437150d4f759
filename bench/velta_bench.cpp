// What the library's work costs, each piece beside its limit in the same run.
//
//     velta_bench [--quick] [--million] [--json FILE] [--dir DIRECTORY]

#include <benchmark/benchmark.h>
#include <unistd.h>

#include <cstdio>
#include <functional>
#include <sstream>

#include "fresh_process.h"
#include "limits.h"
#include "report.h"
#include "rtcm3/codec.h"
#include "rtcm3/frame.h"
#include "rtcm3/message_reader.h"
#include "sqlite_peer.h"
#include "transform_work.h"
#include "velta/rtcm_generator.h"
#include "workload.h"

namespace velta_bench {
namespace {

namespace fs = std::filesystem;
namespace velta = orx::cs::velta;
namespace rtcm3 = orx::cs::velta::rtcm3;

constexpr std::uint32_t kLarge = 100'000;
/// What lies behind the last full node of the index is read by every query. Here it is 8 entries,
/// as it is at 1000, so that the two can be compared; at 1'000'000 it would be none.
constexpr std::uint32_t kMillion = 1'000'040;
/// The size that growth is counted from.
constexpr std::uint32_t kSmall = 1000;

/// The limit of a query for a position.
constexpr const char* kSixPieces = "open, fstat, read 6 x 4 KiB";

/// The limit of an ingestion.
constexpr const char* kDurableAppend = "append the same bytes durably";

/// A number that no file of the run holds yet.
std::uint32_t nextNumber = 0;

/// The files of one size.
struct Files {
  fs::path directory;
  std::uint32_t entries;

  fs::path Datum() const { return directory / kDatumFile; }
  fs::path Other() const { return directory / "other.dff"; }
  fs::path Sqlite() const { return directory / "peer.sqlite"; }
  fs::path OtherSqlite() const { return directory / "other.sqlite"; }
  velta::RTCMGenerator Generator() const { return {1, Datum().wstring(), L""}; }
};

using Benchmark = std::function<void(benchmark::State&)>;

/// How often work is timed, and how often it is done each time.
struct Rounds {
  int count;
  int iterations;
};

class Suite {
 public:
  explicit Suite(Report& report) : report_(report) {}

  void Add(const Row& row, const Rounds& rounds, const Benchmark& work, const Benchmark& limit,
           const Benchmark& peer = nullptr) {
    report_.Add(row);
    Register(row, Side::kVelta, rounds, work);
    Register(row, Side::kLimit, rounds, limit);
    Register(row, Side::kPeer, rounds, peer);
  }

 private:
  void Register(const Row& row, Side side, const Rounds& rounds, const Benchmark& work) const {
    if (!work) return;
    const std::string name = Report::NameOf(row.work, row.entries, side);
    benchmark::RegisterBenchmark(name.c_str(), work)
        ->Iterations(rounds.iterations)
        ->Repetitions(rounds.count)
        ->UseRealTime();
  }

  Report& report_;
};

void MakeFile(const fs::path& datum, const fs::path& sqlite, std::uint32_t first,
              std::uint32_t entries) {
  MakeDatumFile(datum, first, entries);
  SqlitePeer peer(sqlite);
  peer.MakeTables();
  peer.Begin();
  for (std::uint32_t i = 0; i < entries; ++i) peer.Ingest(MessageSet(first + i));
  peer.Commit();
}

/// \param hasOther as many other entries are needed, to be merged
Files MakeFiles(const fs::path& directory, std::uint32_t entries, bool hasOther) {
  const Files files{directory / std::to_string(entries), entries};
  fs::create_directories(files.directory);
  MakeFile(files.Datum(), files.Sqlite(), 0, entries);
  if (hasOther) MakeFile(files.Other(), files.OtherSqlite(), entries, entries);
  nextNumber = std::max(nextNumber, 2 * entries);
  // What is flushed later should not wait for these.
  sync();
  return files;
}

/// As many bytes as an entry has.
std::string EntryBytes(const Files& files) {
  return std::string(fs::file_size(files.Datum()) / files.entries, 'x');
}

void AddIngestion(Suite& suite, const Files& files, const Rounds& rounds) {
  const auto ingest = [files](benchmark::State& state, bool isNew) {
    velta::RTCMDataSupport support((files.directory / "").wstring().c_str(), nullptr);
    const MessageSet present(files.entries / 2);
    Require(support.ParseDatumMessages(present.datum, &present.grid) == 0, "the first set");
    for (auto _ : state) {
      const MessageSet set(isNew ? nextNumber++ : files.entries / 2);
      Require(support.ParseDatumMessages(set.datum, &set.grid) == 0, "ingesting a set");
    }
  };
  const auto append = [files, bytes = EntryBytes(files)](benchmark::State& state) {
    DurableAppender appender(files.directory / "appended");
    for (auto _ : state) appender.Append(bytes);
  };
  const auto peer = [files](benchmark::State& state, bool isNew) {
    SqlitePeer database(files.Sqlite());
    for (auto _ : state) {
      database.Begin();
      database.Ingest(MessageSet(isNew ? nextNumber++ : files.entries / 2));
      database.Commit();
    }
  };
  suite.Add(
      {"ingest, new entry", files.entries, kDurableAppend, 1.5}, rounds,
      [=](benchmark::State& s) { ingest(s, true); }, append,
      [=](benchmark::State& s) { peer(s, true); });
  // A tenth of a new entry; what a new one costs is the limit here.
  suite.Add(
      {"ingest, entry present", files.entries, "ingest a new entry", 0.1}, rounds,
      [=](benchmark::State& s) { ingest(s, false); }, [=](benchmark::State& s) { ingest(s, true); },
      [=](benchmark::State& s) { peer(s, false); });
}

void AddQueries(Suite& suite, const Files& files, const Rounds& rounds) {
  constexpr double kGoal = 2.5;
  constexpr double kPeerGoal = 0.125;
  const struct {
    const char* name;
    Position at;
    bool isFound;
  } places[] = {{"last", MiddleOf(MessageSet(files.entries - 1)), true},
                {"middle", MiddleOf(MessageSet(files.entries / 2)), true},
                {"none", GapBehind(files.entries / 2 | 1), false}};
  const velta::RTCMGenerator generator = files.Generator();
  for (const Query& query : kQueries) {
    for (const auto& place : places) {
      suite.Add(
          {std::string(query.name) + ", " + place.name, files.entries, kSixPieces, kGoal,
           kPeerGoal},
          rounds,
          [=](benchmark::State& state) {
            for (auto _ : state) {
              Require(query.ask(generator, place.at) == place.isFound, query.name);
            }
          },
          [=](benchmark::State& state) {
            for (auto _ : state) ReadPieces(files.Datum());
          },
          [=](benchmark::State& state) {
            for (auto _ : state) {
              SqlitePeer database(files.Sqlite());
              Require(database.FindArea(place.at) == place.isFound, "finding an area");
            }
          });
    }
  }
}

/// How much longer the queries take in the largest file.
void AddGrowth(Report& report, std::uint32_t largest) {
  constexpr double kGoal = 1.6;
  const std::vector<Row> rows = report.rows();
  for (const Row& small : rows) {
    if (small.limit != kSixPieces || small.entries != kSmall) continue;
    for (const Row& large : rows) {
      if (large.work != small.work || large.entries != largest) continue;
      Row row{small.work + ", growth", largest, "the same at 1000", kGoal};
      row.velta = large.velta;
      row.beside = small.velta;
      report.Add(row);
    }
  }
}

void AddListing(Suite& suite, const Files& files, const Rounds& rounds) {
  constexpr double kGoal = 5.0;
  constexpr double kPeerGoal = 1.0;
  Row row{kAskForAll, files.entries, "read the file", std::nullopt, kPeerGoal};
  // A small file stays in the processor's cache, where reading it is next to nothing.
  if (files.entries >= kLarge) row.goal = kGoal;
  const velta::RTCMGenerator generator = files.Generator();
  suite.Add(
      row, rounds,
      [=](benchmark::State& state) {
        for (auto _ : state) {
          Require(generator.getAllDatums().size() >= files.entries, kAskForAll);
        }
      },
      [=](benchmark::State& state) {
        for (auto _ : state) benchmark::DoNotOptimize(ReadFile(files.Datum()));
      },
      [=](benchmark::State& state) {
        for (auto _ : state) {
          SqlitePeer database(files.Sqlite());
          Require(database.ReadAll() >= files.entries, "reading all rows");
        }
      });
}

void AddMerging(Suite& suite, const Files& files, const Rounds& rounds) {
  const fs::path target = files.directory / "target.dff";
  const auto fresh = [target](const fs::path& from) { JoinDurably({from}, target); };
  suite.Add(
      {"merge as many new entries", files.entries, "read both, write the result", 2.0, 1.0}, rounds,
      [=](benchmark::State& state) {
        for (auto _ : state) {
          state.PauseTiming();
          const velta::RTCMDataSupport unloadsTheTreesOfTheLastRound;
          fresh(files.Datum());
          state.ResumeTiming();
          Require(velta::RTCMDataSupport::MergeRTCMDatumfiles(target.wstring(),
                                                              files.Other().wstring()) == 0,
                  "merging");
        }
      },
      [=](benchmark::State& state) {
        for (auto _ : state) JoinDurably({files.Datum(), files.Other()}, target);
      },
      [=](benchmark::State& state) {
        for (auto _ : state) {
          state.PauseTiming();
          fresh(files.Sqlite());
          state.ResumeTiming();
          SqlitePeer(target).Merge(files.OtherSqlite());
        }
      });
}

void AddDecoding(Suite& suite, std::size_t bytes, int rounds) {
  std::string stream;
  for (std::uint32_t number = 0; stream.size() < bytes; ++number) {
    const MessageSet set(number);
    rtcm3::Encode(set.datum, stream);
    rtcm3::Encode(set.grid, stream);
  }
  const auto megabytes = static_cast<std::int64_t>(bytes / 1'000'000);
  suite.Add(
      {"decode a stream, MB:", megabytes, "read it and check its CRCs", 3.0}, {rounds, 1},
      [stream](benchmark::State& state) {
        for (auto _ : state) {
          std::stringbuf in(stream);
          rtcm3::StreamCounts counts;
          rtcm3::MessageReader reader(in, counts);
          std::size_t messages = 0;
          while (reader.Next()) ++messages;
          Require(messages > 0 &&
                      counts.otherMessages + counts.shortMessages + counts.frames.badCrcs == 0,
                  "decoding");
        }
      },
      [stream](benchmark::State& state) {
        for (auto _ : state) {
          std::stringbuf in(stream);
          rtcm3::FrameCounts counts;
          rtcm3::FrameReader reader(in, counts);
          std::size_t frames = 0;
          while (reader.Next()) ++frames;
          Require(frames > 0 && counts.badCrcs == 0, "checking");
        }
      });
}

/// Whole runs of the programs, as people start them.
void AddTransforming(Suite& suite, const fs::path& directory, int rounds) {
  const TransformWork work(directory);
  const std::string name = "transform " + std::to_string(kPositions) + " positions";
  suite.Add(
      {name, kWindows, "the exported pipeline in cct", 1.0}, {rounds, 1},
      [work](benchmark::State& state) {
        for (auto _ : state) work.ByVelta();
      },
      [work](benchmark::State& state) {
        for (auto _ : state) work.ByCct();
      });
}

/// Bytes of an entry in a file that got one in each save.
void AddBytes(Report& report, const Files& files) {
  constexpr double kMost = 1000.0;
  Row row{"bytes of an entry", files.entries, "its values alone", std::nullopt,
          std::nullopt,        kMost,         Unit::kBytes};
  row.velta = static_cast<double>(fs::file_size(files.Datum())) / files.entries;
  row.beside = static_cast<double>(ValueBytes(files.Datum()));
  report.Add(row);
}

/// How many fresh processes a figure is the median of.
constexpr int kProcesses = 7;

/// The medians of some processes.
/// \param numberOf called for each process
FreshRun MedianRun(const std::string& work, const fs::path& file,
                   const std::function<std::uint32_t()>& numberOf) {
  std::vector<double> seconds;
  std::vector<double> peaks;
  for (int i = 0; i < kProcesses; ++i) {
    const FreshRun run = RunInFreshProcess(work, file, numberOf());
    seconds.push_back(run.seconds);
    peaks.push_back(run.peak);
  }
  return {MedianOf(seconds), MedianOf(peaks)};
}

/// Peak memory of the queries, less that of a process which asks nothing.
void AddMemory(Report& report, const Files& files) {
  constexpr double kMost = 1e6;
  constexpr double kGoal = 2.5;
  const auto last = [&] { return files.entries - 1; };
  const double nothing = MedianRun(kDoNothing, files.Datum(), last).peak;
  const auto add = [&](const std::string& work, Row row) {
    row.work = "memory, " + work;
    row.entries = files.entries;
    row.unit = Unit::kBytes;
    row.velta = MedianRun(work, files.Datum(), last).peak - nothing;
    report.Add(row);
  };
  Row row;
  row.most = kMost;
  for (const Query& query : kQueries) add(query.name, row);
  if (files.entries > kLarge) return;
  row = Row();
  row.limit = "the file's size";
  row.beside = static_cast<double>(fs::file_size(files.Datum()));
  // A constant of the process is most of what a small file costs.
  if (files.entries == kLarge) row.goal = kGoal;
  add(kAskForAll, row);
}

void AddFirstQuery(Report& report, const Files& files) {
  const auto last = [&] { return files.entries - 1; };
  Row row{"first getRtcmDatumMessage", files.entries};
  row.velta = MedianRun(kQueries[0].name, files.Datum(), last).seconds;
  report.Add(row);
}

void AddFirstIngestion(Report& report, const Files& files) {
  constexpr double kMost = 1e-3;
  // The others measure the file as it was made.
  const fs::path file = files.directory / "first" / kDatumFile;
  fs::create_directory(file.parent_path());
  fs::copy_file(files.Datum(), file);
  sync();
  Row present{"first ingestion, entry present", files.entries};
  if (files.entries == kLarge) present.most = kMost;
  present.velta = MedianRun(kIngest, file, [&] { return files.entries / 2; }).seconds;
  report.Add(present);
  Row added{"first ingestion, new entry", files.entries, kDurableAppend};
  const std::string bytes = EntryBytes(files);
  std::vector<double> appends;
  for (int i = 0; i < kProcesses; ++i) {
    appends.push_back(
        SecondsOf([&] { DurableAppender(files.directory / "appended").Append(bytes); }));
  }
  added.beside = MedianOf(appends);
  added.velta = MedianRun(kIngest, file, [] { return nextNumber++; }).seconds;
  report.Add(added);
}

struct Options {
  bool quick = false;
  bool million = false;
  std::string json;
  fs::path directory = "velta-bench-files";
};

int Run(const Options& options) {
  Report report;
  Suite suite(report);
  const int rounds = options.quick ? 3 : 5;
  fs::remove_all(options.directory);
  std::vector<std::uint32_t> sizes = {10, kSmall};
  if (!options.quick) sizes.push_back(kLarge);
  if (options.million) sizes.push_back(kMillion);
  for (const std::uint32_t entries : sizes) {
    const bool isAskedOnly = entries > kLarge;
    const bool isLarge = entries >= kLarge;
    const Files files = MakeFiles(options.directory, entries, !isAskedOnly);
    AddBytes(report, files);
    AddMemory(report, files);
    AddFirstQuery(report, files);
    // Many short rounds: what else the machine does meets some of them.
    AddQueries(suite, files, {5 * rounds, 20});
    if (isAskedOnly) continue;
    AddListing(suite, files, {rounds, isLarge ? 1 : 50});
    AddMerging(suite, files, {rounds, isLarge ? 1 : 5});
    AddIngestion(suite, files, {rounds, options.quick ? 20 : 100});
    AddFirstIngestion(report, files);
  }
  AddDecoding(suite, options.quick ? 10'000'000 : 100'000'000, rounds);
  AddTransforming(suite, options.directory / "transform", rounds);
  benchmark::RunSpecifiedBenchmarks(&report);
  if (sizes.back() > kSmall) AddGrowth(report, sizes.back());
  report.Print();
  if (!options.json.empty()) report.WriteJson(options.json);
  fs::remove_all(options.directory);
  return 0;
}

}  // namespace
}  // namespace velta_bench

int main(int argc, char** argv) {
  constexpr int kFreshArguments = 5;
  if (argc == kFreshArguments && argv[1] == std::string(velta_bench::kFreshOption)) {
    const auto number = static_cast<std::uint32_t>(std::stoul(argv[4]));
    velta_bench::WorkAsFreshProcess(argv[2], argv[3], number);
    return 0;
  }
  velta_bench::Options options;
  benchmark::Initialize(&argc, argv);
  for (int i = 1; i < argc; ++i) {
    const std::string option = argv[i];
    if (option == "--quick") {
      options.quick = true;
    } else if (option == "--million") {
      options.million = true;
    } else if (option == "--json" && i + 1 < argc) {
      options.json = argv[++i];
    } else if (option == "--dir" && i + 1 < argc) {
      options.directory = argv[++i];
    } else {
      std::fprintf(stderr,
                   "usage: velta_bench [--quick] [--million] [--json FILE] [--dir DIRECTORY]\n");
      return 2;
    }
  }
  return velta_bench::Run(options);
}
