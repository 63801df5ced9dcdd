// What tests of the program's operations share: a machine, and the record of a run on it.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "core/hooks.h"
#include "machine/faults.h"
#include "machine/registry_store.h"
#include "package/package_reader.h"
#include "platform/registry_key.h"
#include "tests/support/allocation_faults.h"
#include "tests/support/test_machine.h"

// What calls in a row have given.
using Results = std::vector<int64_t>;

// The n-th call of a function of the system from now on fails.
inline void FailCall(const char* function, int call = 1) {
  machine::SetFaults({{.function = function, .call = call}});
}

// Every call of it fails.
inline void FailAllCalls(const char* function) {
  machine::SetFaults({{.function = function, .call = 1, .fromThenOn = true}});
}

inline void FailNothing() {
  machine::SetFaults({});
}

// Makes the key below HKEY_LOCAL_MACHINE and stores the bytes as REG_SZ, without a NUL of its own.
inline void SetRegistryText(const std::string& key, const char* name, const std::string& bytes) {
  RegistryKey opened;
  ASSERT_TRUE(opened.Create(HKEY_LOCAL_MACHINE, key.c_str()));
  ASSERT_TRUE(opened.SetText(name, bytes.c_str(), static_cast<DWORD>(bytes.size())));
}

inline void MakeRegistryKey(const std::string& key) {
  ASSERT_TRUE(machine::MakeKey(machine::LocalMachine(), key)) << key;
}

// The bytes of a value, its NUL too if it has one; "none" when it isn't there.
inline std::string GetRegistryBytes(const std::string& key, const char* name) {
  const auto found = machine::FindKey(machine::LocalMachine(), key);
  const machine::RegistryValue* const value = found ? machine::FindValue(*found, name) : nullptr;
  return value != nullptr ? std::string(value->data.begin(), value->data.end()) : "none";
}

inline bool HasRegistryKey(const std::string& key) {
  return machine::FindKey(machine::LocalMachine(), key) != nullptr;
}

// The key in which the system keeps a program's directory.
inline std::string AppPathsKey(const std::string& executable) {
  return "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\App Paths\\" + executable;
}

class ProductTest : public testing::Test {
 protected:
  ProductTest() {
    context.language = kLanguageNone;
    context.currentLanguage = kLanguageNone;
    (void)CopyText(context.installDir, "C:\\Moriv");
  }

  // Whatever a test did, the program has left nothing open. Here and not in TearDown: the members
  // of the tests are closed by now.
  ~ProductTest() override {
    wizardState = {};
    FailNothing();
    EXPECT_EQ(CloseSetup(&context), 1);
    EXPECT_EQ(machine::Stop(), "");
    EXPECT_EQ(LiveAllocations(), 0);
  }

  // The run's events as "CODE/SEVERITY TEXT".
  std::vector<std::string> Events() const {
    std::vector<std::string> events;
    for (int32_t i = 0; i < context.events.count; ++i) {
      const EventEntry& entry = context.events.entries[i];
      events.push_back(std::to_string(entry.code) + "/" + std::to_string(entry.severity) +
                       (entry.text[0] != '\0' ? std::string(" ") + entry.text : ""));
    }
    return events;
  }

  // Makes the browser's directory and registers it.
  void InstallBrowser(const std::string& executable, const std::string& name) const {
    pc.Write("drive_c/" + name + "/browser.exe", "");
    SetRegistryText(AppPathsKey(executable), "Path", "C:\\" + name);
  }

  TestMachine pc;
  SetupContext context = {};
};
