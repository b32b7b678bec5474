// Plugins when memory runs out: nothing is lost, and nothing that failed stays.
#include <gtest/gtest.h>

#include "failing_allocation.h"
#include "fixtures/plugins/plugin_folder.h"
#include "zarvo.h"

namespace {

// This program links the library statically, and the plugins bring the shared one along. It is
// loaded for good, so that they find it and what they write into its environment is not lost.
class PluginMemory : public testing::Test {
 protected:
  static void SetUpTestSuite() { zv_dll_open(ZARVO_LIBRARY, 1); }
};

TEST_F(PluginMemory, ARecordIsWholeOrNotThere) {
  const PluginFolder folder;
  folder.add("accept", "a.dll");
  const std::string dir = folder.path();
  zv_plugin_t* record = nullptr;
  int code = 0;
  const auto create = [&] { record = zv_plugin_create(dir.c_str(), "a.dll", "img", 1, 5, &code); };
  const auto nothing = [&] {
    EXPECT_EQ(record, nullptr);
    EXPECT_TRUE(code == ZV_PLUGIN_E_MEMORY || code == ZV_PLUGIN_E_NOT_FOUND) << code;
  };
  EXPECT_GE(fail_each_allocation(create, nothing), 7);
  ASSERT_NE(record, nullptr);
  EXPECT_EQ(code, 3);
  zv_plugin_destroy(record);
}

TEST_F(PluginMemory, AnArrayStaysAsItWas) {
  const PluginFolder folder;
  const std::string first = folder.add("accept", "a.dll");
  const std::string second = folder.add("accept", "b.dll");
  zv_plugin_t** plugins = nullptr;
  int code = 0;
  int result = 0;
  ASSERT_EQ(zv_plugin_add_lib(&plugins, first.c_str(), "img", 1, 5, &code, 0), 1);
  zv_plugin_t* const record = plugins[0];
  fail_each_allocation(
      [&] { result = zv_plugin_add_lib(&plugins, second.c_str(), "img", 1, 5, &code, 0); },
      [&] {
        EXPECT_EQ(result, 0);
        EXPECT_TRUE(code == ZV_PLUGIN_E_MEMORY || code == ZV_PLUGIN_E_NOT_FOUND) << code;
        EXPECT_EQ(plugins[0], record);
        EXPECT_EQ(plugins[1], nullptr);
      });
  EXPECT_EQ(result, 1);
  for (zv_plugin_t** each = plugins; *each != nullptr; ++each) zv_plugin_destroy(*each);
  zv_free(plugins);
}

TEST_F(PluginMemory, AnEnumerationGoesOn) {
  const PluginFolder folder;
  folder.add("accept", "img_a.dll");
  folder.add("accept", "img_b.dll");
  folder.add("accept", "img_bd.dll");
  zv_putenv_private("img", folder.path().c_str(), 0);
  zv_plugin_t** plugins = nullptr;
  int count = -1;
  const auto give_back = [&] {
    for (int i = 0; plugins != nullptr && plugins[i] != nullptr; ++i) zv_plugin_destroy(plugins[i]);
    zv_free(plugins);
    plugins = nullptr;
  };
  testing::internal::CaptureStderr();
  fail_each_allocation([&] { count = zv_plugin_enumerate(&plugins, "img", 1, 5, 0); },
                       [&] {
                         EXPECT_GE(count, 0);
                         EXPECT_LE(count, 2);
                         give_back();
                       });
  const std::string report = testing::internal::GetCapturedStderr();
  EXPECT_NE(report.find("rejected: memory allocation failed\n"), std::string::npos);
  EXPECT_EQ(count, 2);
  give_back();
  zv_putenv_private(nullptr, nullptr, 0);
}

TEST(FormatMemory, ACompositeIsAppendedOrNot) {
  char** list = nullptr;
  int result = 0;
  ASSERT_EQ(zv_strlist(&list, "A|.a|.b|;B|.B|;", ';'), 2);
  EXPECT_GE(fail_each_allocation([&] { result = zv_fmt_composite(&list, -1, "All"); },
                                 [&] {
                                   EXPECT_EQ(result, 0);
                                   EXPECT_EQ(zv_strlist_len(list), 2);
                                 }),
            5);
  EXPECT_EQ(result, 1);
  EXPECT_STREQ(list[2], "All|.a|.b|");

  zv_plugin_t record = {};
  record.formats = list;
  zv_plugin_t* plugins[] = {&record, nullptr};
  char** all = nullptr;
  fail_each_allocation([&] { result = zv_plugin_formats(plugins, &all); },
                       [&] {
                         EXPECT_TRUE(result == 3 || all == nullptr);
                         zv_strlist_free(all, -1);
                         all = nullptr;
                       });
  EXPECT_EQ(zv_strlist_len(all), 3);
  zv_strlist_free(all, -1);
  zv_strlist_free(list, -1);
}

}  // namespace
