#include <gtest/gtest.h>

#include <cstdio>
#include <string>
#include <vector>

#include "driver/information_request.h"

namespace pc {
namespace {

struct Answer {
  InformationRequest request;
  std::string text;
};

Answer ask(std::vector<const char*> args) {
  std::vector<char*> argv{const_cast<char*>("pocket-classifier")};
  for (const char* a : args) argv.push_back(const_cast<char*>(a));
  std::FILE* out = std::tmpfile();
  EXPECT_NE(out, nullptr);
  Answer answer{answerInformationRequest(static_cast<int>(argv.size()), argv.data(), "4.3.2.1", out), ""};
  std::rewind(out);
  char buffer[4096];
  size_t n;
  while ((n = std::fread(buffer, 1, sizeof buffer, out)) > 0) answer.text.append(buffer, n);
  std::fclose(out);
  return answer;
}

TEST(InformationRequest, VersionPrintsOneLine) {
  const Answer a = ask({"--version"});
  EXPECT_EQ(a.request, InformationRequest::Answered);
  EXPECT_EQ(a.text, "pocket-classifier 4.3.2.1\n");
  EXPECT_EQ(informationExitStatus(a.request), 0);
}

TEST(InformationRequest, HelpNamesEveryModeAndTheTwoWords) {
  const Answer a = ask({"--help", "ignored"});
  EXPECT_EQ(a.request, InformationRequest::Answered);
  EXPECT_EQ(a.text.rfind("Usage: pocket-classifier [mode]\n", 0), 0u);
  for (const char* word : {"C...", "F...", "w...", "poches.res", "--version", "TRXZONE", "255"}) {
    EXPECT_NE(a.text.find(word), std::string::npos) << word;
  }
  EXPECT_EQ(a.text.back(), '\n');
}

// Anything but the exact words keeps its first-character meaning.
TEST(InformationRequest, OtherArgumentsAreLeftToTheRun) {
  for (std::vector<const char*> args : std::vector<std::vector<const char*>>{
           {}, {""}, {"-h"}, {"--HELP"}, {"--helpx"}, {"--versio"}, {"-version"}, {"help"}, {"F", "--help"}}) {
    const Answer a = ask(args);
    EXPECT_EQ(a.request, InformationRequest::NotHandled) << (args.empty() ? "(none)" : args[0]);
    EXPECT_EQ(a.text, "");
  }
}

// A standard output that refuses the text is a failure, not a silent 0.
TEST(InformationRequest, UnwritableOutputIsStatus255) {
  std::FILE* in = std::tmpfile();
  ASSERT_NE(in, nullptr);
  const std::string path = "/proc/self/fd/" + std::to_string(fileno(in));
  std::FILE* readOnly = std::fopen(path.c_str(), "r");
  ASSERT_NE(readOnly, nullptr);
  char version[] = "--version";
  char help[] = "--help";
  char name[] = "pocket-classifier";
  for (char* word : {version, help}) {
    char* argv[] = {name, word, nullptr};
    const InformationRequest r = answerInformationRequest(2, argv, "1.0", readOnly);
    EXPECT_EQ(r, InformationRequest::WriteFailed);
    EXPECT_EQ(informationExitStatus(r), 255);
    std::clearerr(readOnly);
  }
  std::fclose(readOnly);
  std::fclose(in);
}

}  // namespace
}  // namespace pc
