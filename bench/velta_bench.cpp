// What the library's work costs, each piece beside its limit in the same run.
//
//     velta_bench [--quick] [--json FILE] [--dir DIRECTORY]

#include <benchmark/benchmark.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstring>
#include <functional>
#include <sstream>

#include "limits.h"
#include "report.h"
#include "rtcm3/codec.h"
#include "rtcm3/frame.h"
#include "rtcm3/message_reader.h"
#include "sqlite_peer.h"
#include "velta/rtcm_generator.h"
#include "workload.h"

namespace velta_bench {
namespace {

namespace fs = std::filesystem;
namespace velta = orx::cs::velta;
namespace rtcm3 = orx::cs::velta::rtcm3;

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
  Position Last() const { return MiddleOf(MessageSet(entries - 1)); }
};

using Benchmark = std::function<void(benchmark::State&)>;

class Suite {
 public:
  Suite(Report& report, bool quick) : report_(report), repetitions_(quick ? 3 : 5) {}

  void Add(const Row& row, int iterations, const Benchmark& work, const Benchmark& limit,
           const Benchmark& peer = nullptr) {
    report_.Add(row);
    Register(row, Side::kVelta, iterations, work);
    Register(row, Side::kLimit, iterations, limit);
    Register(row, Side::kPeer, iterations, peer);
  }

 private:
  void Register(const Row& row, Side side, int iterations, const Benchmark& work) const {
    if (!work) return;
    const std::string name = Report::NameOf(row.work, row.entries, side);
    benchmark::RegisterBenchmark(name.c_str(), work)
        ->Iterations(iterations)
        ->Repetitions(repetitions_)
        ->UseRealTime();
  }

  Report& report_;
  int repetitions_;
};

Files MakeFiles(const fs::path& directory, std::uint32_t entries) {
  const Files files{directory / std::to_string(entries), entries};
  fs::create_directories(files.directory);
  MakeDatumFile(files.Datum(), 0, entries);
  MakeDatumFile(files.Other(), entries, entries);
  for (const auto& [path, first] :
       {std::pair(files.Sqlite(), 0U), std::pair(files.OtherSqlite(), entries)}) {
    SqlitePeer peer(path);
    peer.Begin();
    for (std::uint32_t i = 0; i < entries; ++i) peer.Ingest(MessageSet(first + i));
    peer.Commit();
  }
  nextNumber = std::max(nextNumber, 2 * entries);
  return files;
}

void AddIngestion(Suite& suite, const Files& files, int iterations) {
  const auto ingest = [files](benchmark::State& state, bool isNew) {
    velta::RTCMDataSupport support((files.directory / "").wstring().c_str(), nullptr);
    const MessageSet present(files.entries / 2);
    Require(support.ParseDatumMessages(present.datum, &present.grid) == 0, "the first set");
    for (auto _ : state) {
      const MessageSet set(isNew ? nextNumber++ : files.entries / 2);
      Require(support.ParseDatumMessages(set.datum, &set.grid) == 0, "ingesting a set");
    }
  };
  const std::size_t entryBytes = fs::file_size(files.Datum()) / files.entries;
  const auto append = [files, entryBytes](benchmark::State& state) {
    DurableAppender appender(files.directory / "appended");
    const std::string bytes(entryBytes, 'x');
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
      {"ingest, new entry", files.entries, "append the same bytes durably", 1.5}, iterations,
      [=](benchmark::State& s) { ingest(s, true); }, append,
      [=](benchmark::State& s) { peer(s, true); });
  // A tenth of a new entry; what a new one costs is the limit here.
  suite.Add(
      {"ingest, entry present", files.entries, "ingest a new entry", 0.1}, iterations,
      [=](benchmark::State& s) { ingest(s, false); }, [=](benchmark::State& s) { ingest(s, true); },
      [=](benchmark::State& s) { peer(s, false); });
}

void AddQueries(Suite& suite, const Files& files, int iterations) {
  const auto read = [path = files.Datum()](benchmark::State& state) {
    for (auto _ : state) benchmark::DoNotOptimize(ReadFile(path));
  };
  const auto find = [files](benchmark::State& state) {
    for (auto _ : state) {
      SqlitePeer database(files.Sqlite());
      Require(database.FindArea(files.Last()), "finding an area");
    }
  };
  const Position at = files.Last();
  const velta::RTCMGenerator generator = files.Generator();
  suite.Add(
      {"getRtcmDatumMessage, last", files.entries, "read the file", 2.0}, iterations,
      [=](benchmark::State& state) {
        for (auto _ : state) {
          Require(generator.getRtcmDatumMessage(at.latitude, at.longitude, 0) != nullptr,
                  "getRtcmDatumMessage");
        }
      },
      read, find);
  suite.Add(
      {"get1023, last", files.entries, "read the file", 2.0}, iterations,
      [=](benchmark::State& state) {
        for (auto _ : state) {
          Require(generator.get1023(at.latitude, at.longitude, 0) != nullptr, "get1023");
        }
      },
      read, find);
  suite.Add(
      {"getAllDatums", files.entries, "read the file", 5.0}, iterations,
      [=](benchmark::State& state) {
        for (auto _ : state) {
          Require(generator.getAllDatums().size() >= files.entries, "getAllDatums");
        }
      },
      read,
      [=](benchmark::State& state) {
        for (auto _ : state) {
          SqlitePeer database(files.Sqlite());
          Require(database.ReadAll() >= files.entries, "reading all rows");
        }
      });
}

void AddMerging(Suite& suite, const Files& files, int iterations) {
  const fs::path target = files.directory / "target.dff";
  const auto fresh = [target](const fs::path& from) { JoinDurably({from}, target); };
  suite.Add(
      {"merge as many new entries", files.entries, "read both, write the result", 2.0}, iterations,
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

void AddDecoding(Suite& suite, std::size_t bytes) {
  std::string stream;
  for (std::uint32_t number = 0; stream.size() < bytes; ++number) {
    const MessageSet set(number);
    rtcm3::Encode(set.datum, stream);
    rtcm3::Encode(set.grid, stream);
  }
  const auto megabytes = static_cast<std::int64_t>(bytes / 1'000'000);
  suite.Add(
      {"decode a stream, MB:", megabytes, "read it and check its CRCs", 3.0}, 1,
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

/// Runs a query in a process of its own.
/// \return the most memory that it had, bytes
std::size_t PeakOf(const std::function<void()>& query) {
  int ends[2];
  Require(pipe(ends) == 0, "making a pipe");
  const pid_t child = fork();
  if (child == 0) {
    query();
    const std::size_t peak = PeakMemory();
    _exit(write(ends[1], &peak, sizeof peak) == sizeof peak ? 0 : 1);
  }
  std::size_t peak = 0;
  Require(read(ends[0], &peak, sizeof peak) == sizeof peak, "asking a child for its memory");
  close(ends[0]);
  close(ends[1]);
  waitpid(child, nullptr, 0);
  return peak;
}

/// Peak memory of the queries, less that of a process which does nothing, as a part of the file.
void AddMemory(Report& report, const Files& files) {
  const std::size_t nothing = PeakOf([] {});
  const Position at = files.Last();
  const std::pair<const char*, std::function<void()>> queries[] = {
      {"memory, datum message",
       [=] { files.Generator().getRtcmDatumMessage(at.latitude, at.longitude, 0); }},
      {"memory, get1023", [=] { files.Generator().get1023(at.latitude, at.longitude, 0); }},
      {"memory, getAllDatums", [=] { files.Generator().getAllDatums(); }},
  };
  for (const auto& [name, query] : queries) {
    Row row{name, files.entries, kFileSize, 2.5};
    row.velta = static_cast<double>(PeakOf(query) - nothing);
    row.beside = static_cast<double>(fs::file_size(files.Datum()));
    // A constant of the process is most of what a small file costs.
    if (files.entries < 1000) row.goal.reset();
    report.Add(row);
  }
}

int Run(bool quick, const std::string& json, const fs::path& directory) {
  Report report;
  Suite suite(report, quick);
  fs::remove_all(directory);
  std::vector<std::uint32_t> sizes = {10, 1000};
  if (!quick) sizes.push_back(100'000);
  for (const std::uint32_t entries : sizes) {
    const Files files = MakeFiles(directory, entries);
    const bool large = entries >= 100'000;
    AddMemory(report, files);
    AddQueries(suite, files, large ? 1 : 50);
    AddMerging(suite, files, large ? 1 : 5);
    AddIngestion(suite, files, quick ? 20 : 100);
  }
  AddDecoding(suite, quick ? 10'000'000 : 100'000'000);
  benchmark::RunSpecifiedBenchmarks(&report);
  report.Print();
  if (!json.empty()) report.WriteJson(json);
  fs::remove_all(directory);
  return 0;
}

}  // namespace
}  // namespace velta_bench

int main(int argc, char** argv) {
  bool quick = false;
  std::string json;
  std::filesystem::path directory = "velta-bench-files";
  benchmark::Initialize(&argc, argv);
  for (int i = 1; i < argc; ++i) {
    const std::string option = argv[i];
    if (option == "--quick") {
      quick = true;
    } else if (option == "--json" && i + 1 < argc) {
      json = argv[++i];
    } else if (option == "--dir" && i + 1 < argc) {
      directory = argv[++i];
    } else {
      std::fprintf(stderr, "usage: velta_bench [--quick] [--json FILE] [--dir DIRECTORY]\n");
      return 2;
    }
  }
  return velta_bench::Run(quick, json, directory);
}
