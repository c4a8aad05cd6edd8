#include "e2e/e2e_support.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <map>

extern char** environ;

namespace pc::test {

void writeInstallation(const std::string& home, const std::string& environ) {
  std::filesystem::create_directories(home + "/config");
  writeFile(home + "/config/environ.cfg", environ);
}

WorkZone::WorkZone() {
  std::filesystem::create_directories(tmp());
  writeInstallation(home());
}

void WorkZone::writeParameters(const std::vector<std::pair<int, std::string>>& lines) const {
  std::map<int, std::string> bySlot(lines.begin(), lines.end());
  std::string text;
  for (int slot = 1; slot <= 580; ++slot) {
    auto it = bySlot.find(slot);
    text += (it != bySlot.end() ? it->second : std::string("0.00000   :  ")) + "\n";
  }
  writeFile(tmpFile("outil.par"), text);
}

void WorkZone::writeContours(const std::vector<std::vector<float>>& records) const {
  writeFile(tmpFile("trxcon.inf"), contourInfoBytes(records));
}

RunResult WorkZone::run(const std::vector<std::string>& args, const std::vector<std::string>& extraEnv) const {
  std::vector<std::string> env{"TRXHOME=" + home(), "TRXZONE=" + zone(), "TRXTMPDIR=" + tmp()};
  env.insert(env.end(), extraEnv.begin(), extraEnv.end());
  return runProgram(args, env, zone());
}

RunResult runProgram(const std::vector<std::string>& args, const std::vector<std::string>& extraEnv,
                     const std::string& cwd) {
  // The child starts from this process's environment minus the variables that
  // would point it elsewhere.
  std::vector<std::string> env;
  for (char** e = environ; *e != nullptr; ++e) {
    const std::string entry = *e;
    if (entry.rfind("TRX", 0) == 0) continue;
    env.push_back(entry);
  }
  for (const auto& e : extraEnv) env.push_back(e);

  // Standard error goes to a file, so that neither stream can fill up while
  // the other is read.
  char errName[] = "/tmp/pc-e2e-err-XXXXXX";
  const int errFd = mkstemp(errName);
  if (errFd < 0) return {};
  unlink(errName);
  int pipeFds[2];
  if (pipe(pipeFds) != 0) {
    close(errFd);
    return {};
  }
  const pid_t pid = fork();
  if (pid == 0) {
    close(pipeFds[0]);
    dup2(pipeFds[1], STDOUT_FILENO);
    dup2(errFd, STDERR_FILENO);
    close(pipeFds[1]);
    close(errFd);
    if (chdir(cwd.c_str()) != 0) _exit(127);
    std::vector<char*> argv{const_cast<char*>(PC_EXECUTABLE)};
    for (const auto& a : args) argv.push_back(const_cast<char*>(a.c_str()));
    argv.push_back(nullptr);
    std::vector<char*> envp;
    for (auto& e : env) envp.push_back(e.data());
    envp.push_back(nullptr);
    execve(PC_EXECUTABLE, argv.data(), envp.data());
    _exit(127);
  }
  close(pipeFds[1]);
  RunResult result;
  char buffer[4096];
  ssize_t n;
  while ((n = read(pipeFds[0], buffer, sizeof buffer)) > 0) result.out.append(buffer, static_cast<size_t>(n));
  close(pipeFds[0]);
  int status = 0;
  waitpid(pid, &status, 0);
  if (WIFEXITED(status)) result.exitStatus = WEXITSTATUS(status);
  lseek(errFd, 0, SEEK_SET);
  while ((n = read(errFd, buffer, sizeof buffer)) > 0) result.err.append(buffer, static_cast<size_t>(n));
  close(errFd);
  return result;
}

std::string expectedBanner() {
  return "*****************************************************\n"
         "***          POCKET CLASSIFICATION\n"
         "***\n"
         "***      (Version : " + std::to_string(PC_BANNER_VERSION) + ")\n"
         "*****************************************************\n";
}

void appendSquare(std::vector<std::vector<float>>& records, float x0, float y0, float size, float z) {
  records.push_back({x0, y0, z});
  records.push_back({x0 + size, y0, z});
  records.push_back({x0 + size, y0 + size, z});
  records.push_back({x0, y0 + size, z});
  records.push_back({x0, y0, z});
  records.push_back({99999.0f, 99999.0f, 99999.0f});
}

}  // namespace pc::test
