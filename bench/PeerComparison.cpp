// Measures our walks, where PROGRAM is norvex_walk:
//
//   norvex_compare peers PROGRAM ROUNDS TREE          against those of other programs
//   norvex_compare memory PROGRAM SMALL-TREE LARGE-TREE   whether memory grows with the tree
//
// Exits with 0 when every limit is kept, with 1 when one is not.
//
// Every command runs as a child process of its own and is measured by wait4, ours and theirs alike. The
// commands take turns, so that what else goes on on the machine meets all of them; the figures are medians
// over the rounds.
#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

namespace {

struct Run {
  double wall;       // seconds
  double processor;  // seconds, user and system, of all threads
  double memory;     // MiB, the peak; never below this program's own, which is less than any of theirs
};

struct Command {
  std::string name;
  std::vector<std::string> words;
  std::vector<Run> runs = {};
};

double seconds(const timeval& time) {
  return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
}

[[noreturn]] void execute(const Command& command) {
  std::vector<char*> words;
  for (const std::string& word : command.words) words.push_back(const_cast<char*>(word.c_str()));
  words.push_back(nullptr);
  // What is printed is not looked at; opening the null device ourselves keeps a shell out of the figures.
  ::dup2(::open("/dev/null", O_WRONLY), STDOUT_FILENO);
  ::execvp(words[0], words.data());
  std::perror(words[0]);
  ::_exit(127);
}

Run measure(const Command& command) {
  const auto start = std::chrono::steady_clock::now();
  const pid_t child = ::fork();
  if (child == 0) execute(command);
  int status = 0;
  rusage usage;
  ::wait4(child, &status, 0, &usage);
  const std::chrono::duration<double> wall = std::chrono::steady_clock::now() - start;
  if (!WIFEXITED(status) || WEXITSTATUS(status) != 0) {
    std::fprintf(stderr, "norvex_compare: %s failed (status %d)\n", command.name.c_str(), status);
    std::exit(2);
  }
  return {wall.count(), seconds(usage.ru_utime) + seconds(usage.ru_stime),
          static_cast<double>(usage.ru_maxrss) / 1024};
}

double median(std::vector<double> values) {
  std::sort(values.begin(), values.end());
  const std::size_t middle = values.size() / 2;
  return values.size() % 2 == 1 ? values[middle] : (values[middle - 1] + values[middle]) / 2;
}

using Figure = double Run::*;

std::vector<double> figures(const Command& command, Figure figure) {
  std::vector<double> values;
  for (const Run& run : command.runs) values.push_back(run.*figure);
  return values;
}

// Each round's own ratio: both ran in the same minute.
std::vector<double> ratios(const Command& ours, const Command& theirs, Figure figure) {
  std::vector<double> values;
  for (std::size_t round = 0; round < ours.runs.size(); ++round) {
    values.push_back(ours.runs[round].*figure / (theirs.runs[round].*figure));
  }
  return values;
}

void printCommands(const std::vector<Command>& commands) {
  std::printf("%-12s %9s %17s %9s %17s %9s\n", "", "wall s", "lowest-highest", "cpu s", "lowest-highest",
              "peak MiB");
  for (const Command& command : commands) {
    const std::vector<double> wall = figures(command, &Run::wall);
    const std::vector<double> processor = figures(command, &Run::processor);
    const auto [leastWall, mostWall] = std::minmax_element(wall.begin(), wall.end());
    const auto [leastProcessor, mostProcessor] = std::minmax_element(processor.begin(), processor.end());
    std::printf("%-12s %9.3f %8.3f-%8.3f %9.3f %8.3f-%8.3f %9.1f\n", command.name.c_str(), median(wall),
                *leastWall, *mostWall, median(processor), *leastProcessor, *mostProcessor,
                median(figures(command, &Run::memory)));
  }
}

struct Limit {
  std::size_t ours;
  std::size_t theirs;
  Figure figure;
  const char* what;
  double most;  // 0: none, for information
};

bool printRatio(const std::vector<Command>& commands, const Limit& limit) {
  const std::vector<double> values = ratios(commands[limit.ours], commands[limit.theirs], limit.figure);
  const auto [least, most] = std::minmax_element(values.begin(), values.end());
  const double ratio = median(values);
  std::printf("%-7s / %-5s %-4s %6.3f  (%.3f-%.3f)", commands[limit.ours].name.c_str(),
              commands[limit.theirs].name.c_str(), limit.what, ratio, *least, *most);
  if (limit.most == 0) return std::printf("\n"), true;
  std::printf("  limit %.2f: %s\n", limit.most, ratio <= limit.most ? "kept" : "NOT KEPT");
  return ratio <= limit.most;
}

bool comparePeers(const std::string& program, int rounds, const std::string& tree) {
  enum { kSize, kDetail, kDu, kFind, kBfs };
  std::vector<Command> commands = {
      {"size", {program, "size", tree}},
      {"detail", {program, "detail", tree}},
      {"du", {"du", "-s", "--apparent-size", "-l", tree}},
      {"find", {"find", tree, "-printf", "%s\\n"}},
      {"bfs", {"bfs", "-S", "dfs", "-s", tree, "-printf", "%p %s\\n"}},
  };
  const std::vector<Limit> limits = {
      {kSize, kDu, &Run::wall, "wall", 0.80},    {kSize, kDu, &Run::processor, "cpu", 0.95},
      {kDetail, kBfs, &Run::wall, "wall", 0.85}, {kDetail, kBfs, &Run::processor, "cpu", 0},
      {kSize, kFind, &Run::wall, "wall", 0},     {kSize, kFind, &Run::processor, "cpu", 0},
  };

  for (const Command& command : commands) {
    std::printf("%-8s", command.name.c_str());
    for (const std::string& word : command.words) std::printf(" %s", word.c_str());
    std::printf(" >/dev/null\n");
  }
  for (const Command& command : commands) measure(command);  // the caches are warm from here on
  for (int round = 0; round < rounds; ++round) {
    for (Command& command : commands) command.runs.push_back(measure(command));
  }
  std::printf("\n%d rounds, medians:\n", rounds);
  printCommands(commands);
  std::printf("\nRatios, medians of the rounds' own:\n");
  bool allKept = true;
  for (const Limit& limit : limits) allKept = printRatio(commands, limit) && allKept;
  return allKept;
}

bool compareMemory(const std::string& program, const std::string& small, const std::string& large) {
  constexpr double kMostGrowth = 2;  // MiB
  constexpr int kRounds = 5;
  Command onSmall{"small", {program, "size", small}};
  Command onLarge{"large", {program, "size", large}};
  for (int round = 0; round < kRounds; ++round) {
    onSmall.runs.push_back(measure(onSmall));
    onLarge.runs.push_back(measure(onLarge));
  }
  const double before = median(figures(onSmall, &Run::memory));
  const double after = median(figures(onLarge, &Run::memory));
  const bool kept = after - before <= kMostGrowth;
  std::printf("%.2f MiB over %s, %.2f MiB over %s: %+.2f MiB, limit %.0f: %s\n", before, small.c_str(), after,
              large.c_str(), after - before, kMostGrowth, kept ? "kept" : "NOT KEPT");
  return kept;
}

}  // namespace

int main(int argc, char** argv) {
  const std::string mode = argc == 5 ? argv[1] : "";
  if (mode == "peers") return comparePeers(argv[2], std::atoi(argv[3]), argv[4]) ? 0 : 1;
  if (mode == "memory") return compareMemory(argv[2], argv[3], argv[4]) ? 0 : 1;
  std::fprintf(stderr, "usage: norvex_compare peers PROGRAM ROUNDS TREE | memory PROGRAM SMALL LARGE\n");
  return 2;
}
