#include "HostileProbe.hpp"

#include <sstream>

#include "CatalogFormat.hpp"
#include "ChildProcess.hpp"
#include "dbexception.hpp"

namespace reliability {

namespace {

const std::string kOpenLine = "open ";
const std::string kEngineLine = "engine ";

}  // namespace

ProbeOutcome HostileProbe::run(const std::wstring& path, std::chrono::milliseconds timeout) {
  ChildProcess child([&path](int reportFd) { return probe(path, reportFd); });
  return parse(child.wait(timeout));
}

int HostileProbe::probe(const std::wstring& path, int reportFd) {
  dbcore::DBReactor reactor(kAppInfo);
  const int answer = reactor.Open(path, L"");
  ChildProcess::report(reportFd, kOpenLine + std::to_string(answer));
  if (answer == dbcore::kDBOpenCurrent || answer == dbcore::kDBOpenNeedsUpdate) {
    if (answer == dbcore::kDBOpenNeedsUpdate) attempt(reportFd, [&] { reactor.Initialize(); });
    attempt(reportFd, [&] { readBack(reactor); });
  }
  reactor.Close();
  return 0;
}

void HostileProbe::attempt(int reportFd, const std::function<void()>& step) {
  try {
    step();
  } catch (const dbcore::DBException& error) {
    ChildProcess::report(reportFd, kEngineLine + error.what());
  }
}

void HostileProbe::readBack(dbcore::DBReactor& reactor) {
  reactor.Count<dbcore::DBImage>();
  reactor.Get<dbcore::DBImage>(1);
  reactor.Children(reactor.GetRoot<dbcore::DBFilter>());
}

ProbeOutcome HostileProbe::parse(const ChildStatus& status) {
  ProbeOutcome outcome;
  outcome.status = status;
  std::istringstream lines(status.report);
  std::string line;
  while (std::getline(lines, line)) {
    if (line.starts_with(kOpenLine)) {
      outcome.openAnswer = std::stoi(line.substr(kOpenLine.size()));
    } else if (line.starts_with(kEngineLine)) {
      outcome.engineExceptions.push_back(line.substr(kEngineLine.size()));
    } else {
      outcome.foreignExceptions.push_back(line);
    }
  }
  return outcome;
}

}  // namespace reliability
