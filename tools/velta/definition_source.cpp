#include "definition_source.h"

#include <map>
#include <stdexcept>

#include "busy.h"
#include "command.h"
#include "conversion/message_fields.h"
#include "files.h"
#include "geodesy/received_definition.h"
#include "geodesy/stored_definition.h"
#include "orxutils/orx_string.h"
#include "rtcm3/message_reader.h"
#include "rtcm3/message_sets.h"
#include "stream_notes.h"
#include "terminal.h"

namespace velta_tool {
namespace {

constexpr std::uint32_t kMaxSystemId = 255;

/// What each system of a stream defines.
using Systems = std::map<std::uint32_t, ReceivedDefinition>;

std::string ListOf(const Systems& systems) {
  std::string list;
  for (const auto& [id, received] : systems) {
    list += (list.empty() ? "" : ", ") + std::to_string(id);
  }
  return list;
}

Systems ReadSystems(const std::string& stream) {
  Systems systems;
  rtcm3::MessageSets sets([&systems](const rtcm3::MessageSet& set) {
    systems[rtcm3::SystemIdOf(*set.FindDatum())].Add(set);
    return true;
  });
  Input in(stream);
  Progress progress(SizeTogether({stream}));
  rtcm3::StreamCounts counts;
  StreamNotes notes(stream, counts);
  rtcm3::MessageReader messages(in.buffer(), counts, [&] {
    notes.Tell();
    progress.Show(counts.frames.bytes);
  });
  while (const rtcm3::Message* message = messages.Next()) sets.Put(*message);
  ClearLine();
  notes.Tell();
  for (const rtcm3::IncompleteSet& set : sets.Incomplete()) {
    if (set.hadCompleteSet) continue;
    std::string missing;
    for (const unsigned number : set.missing) (missing += ' ') += std::to_string(number);
    ReportNote(stream + ": system " + std::to_string(set.systemId) +
               ": incomplete, not received:" + missing);
  }
  if (systems.empty()) throw std::runtime_error(stream + ": no complete message set in it");
  return systems;
}

Definition Receive(const DefinitionSource& source) {
  const Systems systems = ReadSystems(source.messages);
  if (!source.systemId && systems.size() > 1) {
    throw WrongCall(source.messages + ": it has the systems " + ListOf(systems) +
                    ": choose one by --system-id");
  }
  const auto chosen = source.systemId ? systems.find(*source.systemId) : systems.begin();
  if (chosen == systems.end()) {
    throw std::runtime_error(source.messages + ": no complete message set of that system in it; " +
                             "it has " + ListOf(systems));
  }
  const ReceivedDefinition& received = chosen->second;
  const std::string system = source.messages + ": system " + std::to_string(chosen->first) + ": ";
  if (received.targets().size() > 1) {
    std::string targets;
    for (const std::string& target : received.targets()) {
      targets +=
          (targets.empty() ? "\"" : ", \"") + Printable(orx::ToUtf8(orx::Widen(target))) + '"';
    }
    throw std::runtime_error(system + "it has several target systems: " + targets +
                             "; \"velta ingest\" puts each into a file of its own");
  }
  if (received.changes() > 0) {
    ReportNote(system + "values that changed in the stream: " + std::to_string(received.changes()) +
               "; the last are used");
  }
  return received.definition();
}

}  // namespace

CLI::Option* AddMessages(CLI::App& command, DefinitionSource& source) {
  auto* messages =
      command.add_option("--messages", source.messages, "an RTCM 3 stream, in place of files")
          ->check(kFileName);
  command
      .add_option("--system-id", source.systemId,
                  "System Identification Number of the stream's messages")
      ->type_name("0.." + std::to_string(kMaxSystemId))
      ->check(CLI::Range(std::uint32_t{0}, kMaxSystemId))
      ->needs(messages);
  return messages;
}

Definition Read(const DefinitionSource& source) {
  Definition definition;
  if (!source.messages.empty()) {
    definition = Receive(source);
  } else {
    const Busy busy("reading", {source.datum, source.projection});
    definition = ReadDatumFile(source.datum);
    if (!source.projection.empty()) AddProjectionFile(source.projection, definition);
  }
  const std::optional<Projection>& projection = definition.projection;
  if (!projection || !projection->problem.empty()) return definition;
  // Of other types the stream's reader has remarked on it.
  const bool isRemarked = !source.messages.empty() && projection->type != ProjectionType::MC;
  if (!isRemarked && projection->scale == orx::cs::velta::kScaleFactor.toNumber(0)) {
    ReportNote("the projection's scale is 0.993, that of an empty field, which is hardly meant");
  }
  return definition;
}

}  // namespace velta_tool
