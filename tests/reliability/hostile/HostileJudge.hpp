#pragma once

#include <filesystem>
#include <string>

#include "CatalogHealth.hpp"
#include "FileSetSnapshot.hpp"
#include "HostileCase.hpp"
#include "HostileVerdict.hpp"
#include "ProbeOutcome.hpp"

namespace reliability {

// Classifies what opening a case did: the child crashed or hung; it threw something other than a
// DBException or Open gave an answer the format does not document for the file; a refused file (Open
// answered neither 0 nor 1) or its sidecars changed; a sound file failed SQLite's checks afterwards, or a
// foreign sidecar changed a catalog's content.
class HostileJudge {
 public:
  HostileJudge(const HostileCase& hostileCase, const ProbeOutcome& outcome, const FileSetSnapshot& before,
               const FileSetSnapshot& after, const CatalogHealth& healthBefore);

  HostileVerdict verdict(const std::filesystem::path& scratch) const;

 private:
  void judgeChild(HostileVerdict& verdict) const;
  void judgeAnswer(HostileVerdict& verdict) const;
  void judgeRefusedFile(HostileVerdict& verdict) const;
  void judgeIntactFile(HostileVerdict& verdict, const std::filesystem::path& scratch) const;

  const HostileCase& case_;
  const ProbeOutcome& outcome_;
  const FileSetSnapshot& after_;
  const CatalogHealth& healthBefore_;
  // What differs between the files before and after, as FileSetSnapshot::differences lists it.
  std::string changes_;
};

}  // namespace reliability
