#include <gtest/gtest.h>
#include <sys/stat.h>

#include <array>
#include <cerrno>
#include <span>
#include <string>
#include <vector>

#include "ScratchFolder.h"
#include "platform/linux/LinuxSystemControl.h"
#include "platform/linux/MachineInfo.h"

namespace norvex {
namespace {

constexpr const char* kProductName = "sys/class/dmi/id/product_name";
constexpr const char* kDeviceTreeModel = "sys/firmware/devicetree/base/model";
constexpr const char* kMachineInfo = "etc/machine-info";

struct Answer {
  int status = 0;
  int error = 0;
  std::size_t length = 0;
  std::string model;  // up to the zero byte; empty unless the status is 0
};

Answer ask(const ScratchFolder& root, std::span<const int> name = kHardwareModelName) {
  std::array<char, 64> buffer{};
  buffer.fill('#');
  Answer answer;
  answer.length = buffer.size();
  errno = 0;
  answer.status = LinuxSystemControl(root.path()).sysctl(name, buffer.data(), &answer.length);
  answer.error = errno;
  if (answer.status == 0) answer.model = buffer.data();
  return answer;
}

std::string modelOf(const ScratchFolder& root) {
  return ask(root).model;
}

TEST(SystemControl, TakesTheFirstSourceThatSaysSomething) {
  const ScratchFolder root;
  EXPECT_EQ(ask(root).error, ENOENT);
  root.write(kMachineInfo, "HARDWARE_MODEL=Third\n");
  EXPECT_EQ(modelOf(root), "Third");
  root.write(kDeviceTreeModel, std::string("Second\0", 7));
  EXPECT_EQ(modelOf(root), "Second");
  root.write(kProductName, "First\n");
  EXPECT_EQ(modelOf(root), "First");
  root.write(kProductName, " \n");
  EXPECT_EQ(modelOf(root), "Second") << "an empty one says nothing";
}

TEST(SystemControl, DropsLineEndsZeroBytesAndBlanksBehindTheModel) {
  struct Case {
    std::string content;
    std::string model;
  };
  const Case cases[] = {
      {"20XW00\n", "20XW00"},
      {"20XW00", "20XW00"},
      {"Laptop 13 (Gen 2) \t\r\n\n", "Laptop 13 (Gen 2)"},
      {std::string("Board rev 1.4\0", 14), "Board rev 1.4"},
      {std::string("Board \0\n\0", 9), "Board"},
      {std::string("Board\0Other\0", 12), "Board"},
      {"  Board", "  Board"},
      {"Gerät\n", "Gerät"},
  };
  for (const Case& row : cases) {
    const ScratchFolder root;
    root.write(kProductName, row.content);
    const Answer answer = ask(root);
    EXPECT_EQ(answer.model, row.model);
    EXPECT_EQ(answer.length, row.model.size() + 1) << "the zero byte counts";
  }
}

TEST(SystemControl, ValuesThatAreEmptyAreNone) {
  for (const std::string& content :
       {std::string(), std::string("\n"), std::string(" \t "), std::string(1, '\0')}) {
    const ScratchFolder root;
    root.write(kProductName, content);
    root.write(kDeviceTreeModel, content);
    root.write(kMachineInfo, "HARDWARE_MODEL=" + content);
    const Answer answer = ask(root);
    EXPECT_EQ(answer.status, -1);
    EXPECT_EQ(answer.error, ENOENT);
  }
}

TEST(SystemControl, AModelOf63BytesFitsAndOneOf64DoesNot) {
  for (const char* source : {kProductName, kDeviceTreeModel}) {
    const ScratchFolder root;
    root.write(source, std::string(63, 'm') + "\n");
    const Answer fits = ask(root);
    EXPECT_EQ(fits.status, 0);
    EXPECT_EQ(fits.model, std::string(63, 'm'));
    EXPECT_EQ(fits.length, 64U);
    for (const std::size_t size : {std::size_t{64}, std::size_t{1'000'000}}) {
      root.write(source, std::string(size, 'm'));
      const Answer tooLong = ask(root);
      EXPECT_EQ(tooLong.status, -1);
      EXPECT_EQ(tooLong.error, ENOMEM) << size;
    }
  }
}

TEST(SystemControl, KnowsNoOtherName) {
  const ScratchFolder root;
  root.write(kProductName, "Model\n");
  const std::array<std::vector<int>, 5> names{{{}, {6}, {6, 1}, {2, 6}, {6, 2, 0}}};
  for (const std::vector<int>& name : names) {
    const Answer answer = ask(root, name);
    EXPECT_EQ(answer.status, -1);
    EXPECT_EQ(answer.error, ENOENT);
  }
}

TEST(SystemControl, WhatIsNoRegularFileIsPassedOver) {
  const ScratchFolder root;
  root.write("sys/class/dmi/id/other", "");
  ASSERT_EQ(::mkfifo(root.at(kProductName).c_str(), 0600), 0);
  std::filesystem::create_directories(root.at(kDeviceTreeModel));
  root.write(kMachineInfo, "HARDWARE_MODEL=Model\n");
  EXPECT_EQ(modelOf(root), "Model");
}

TEST(MachineInfo, ValuesAreReadAsAShellWouldRead) {
  struct Case {
    const char* text;
    const char* value;
  };
  const Case cases[] = {
      {"", ""},
      {"HARDWARE_MODEL=Model", "Model"},
      {"HARDWARE_MODEL=\"Model 13 (Gen 2)\"\n", "Model 13 (Gen 2)"},
      {"HARDWARE_MODEL='Model 13 \\ \"x\"'\n", "Model 13 \\ \"x\""},
      {"HARDWARE_MODEL=\"a \\\"b\\\" \\$c \\\\ \\d\"\n", "a \"b\" $c \\ \\d"},
      {"HARDWARE_MODEL=a\\ b\n", "a b"},
      {"HARDWARE_MODEL=a' b'\"c\"\n", "a bc"},
      {"HARDWARE_MODEL=a b\n", "a"},
      {"HARDWARE_MODEL=$HOME\n", "$HOME"},
      {"HARDWARE_MODEL=\n", ""},
      {"HARDWARE_MODEL=\"\"\n", ""},
      {"HARDWARE_MODEL=\"unfinished\n", ""},
      {"HARDWARE_MODEL = Model\n", ""},
      {"# HARDWARE_MODEL=Comment\n", ""},
      {"XHARDWARE_MODEL=No\nHARDWARE_MODEL_X=No\n", ""},
      {"CHASSIS=laptop\n  HARDWARE_MODEL=Model\r\nICON_NAME=x", "Model"},
      {"HARDWARE_MODEL=First\nHARDWARE_MODEL=Last\n", "Last"},
      {"HARDWARE_MODEL=a\\", "a\\"},
  };
  for (const Case& row : cases) EXPECT_EQ(shellVariable(row.text, "HARDWARE_MODEL"), row.value) << row.text;
}

}  // namespace
}  // namespace norvex
