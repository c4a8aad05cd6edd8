// bench_config: times loading a large installation file and a user layer
// that overloads every one of its entries, the way a run loads them.
//
//   bench_config [entries]        (default 100000)
// Prints the time of each layer and of a lookup of every key, best of 5.
#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>

#include "env/configuration_loader.h"
#include "env/message_table.h"
#include "platform/platform.h"

namespace {

namespace fs = std::filesystem;
using Clock = std::chrono::steady_clock;

double since(Clock::time_point start) { return std::chrono::duration<double>(Clock::now() - start).count(); }

void writeLayer(const fs::path& file, int entries, bool overloading) {
  std::ofstream out(file, std::ios::binary);
  out << "[var]\n";
  for (int i = 0; i < entries; ++i) {
    if (overloading)
      out << "KEY" << i << " = user" << i << ";+\n";
    else
      out << "KEY" << i << " = /opt/site/value/" << i << "\n";
  }
}

}  // namespace

int main(int argc, char** argv) {
  const int entries = argc > 1 ? std::max(1, std::atoi(argv[1])) : 100000;
  const fs::path root = fs::temp_directory_path() / ("pc-bench-config-" + std::to_string(pc::platform::processId()));
  fs::create_directories(root);
  const std::string installation = (root / "environ.cfg").string();
  const std::string user = (root / "user.cfg").string();
  writeLayer(installation, entries, false);
  writeLayer(user, entries, true);

  double bestFirst = 1e9, bestSecond = 1e9, bestLookups = 1e9;
  int mismatches = 0;
  for (int round = 0; round < 5; ++round) {
    auto start = Clock::now();
    pc::MessageTable* table = pc::load_messages(nullptr, installation.c_str());
    bestFirst = std::min(bestFirst, since(start));
    start = Clock::now();
    table = pc::load_messages(table, user.c_str());
    bestSecond = std::min(bestSecond, since(start));
    if (table == nullptr) {
      std::fprintf(stderr, "bench_config: the layers did not load\n");
      return 1;
    }
    const int section = pc::findSection(table, "var");
    start = Clock::now();
    mismatches = 0;
    for (int i = 0; i < entries; ++i) {
      const std::string key = "key" + std::to_string(i);  // lookups ignore letter case
      const char* value = pc::lookup(table, section, key);
      const std::string expected = "user" + std::to_string(i) + ";/opt/site/value/" + std::to_string(i);
      if (value == nullptr || expected != value) ++mismatches;
    }
    bestLookups = std::min(bestLookups, since(start));
    pc::destroyTable(table);
  }
  fs::remove_all(root);
  std::printf("entries %d: installation file %.1f ms, user layer %.1f ms, together %.1f ms; "
              "%d lookups %.1f ms, %d wrong values\n",
              entries, bestFirst * 1e3, bestSecond * 1e3, (bestFirst + bestSecond) * 1e3, entries,
              bestLookups * 1e3, mismatches);
  return mismatches == 0 ? 0 : 1;
}
