// Base64 and the two login texts.
#include "transfer/base64.h"

#include <gtest/gtest.h>

#include <string>

#include "guarded.h"

namespace {

std::string encode(const std::string& data) {
  const auto* const bytes = reinterpret_cast<const unsigned char*>(data.data());
  Guarded room("", zv::base64_length(data.size()));
  EXPECT_EQ(zv::base64_encode(bytes, data.size(), room.data()), room.data());
  EXPECT_TRUE(room.intact());
  const zv::HeapPtr<char> made(zv::base64_encode(bytes, data.size(), nullptr));
  EXPECT_STREQ(made.get(), room.text());
  return made.get();
}

TEST(Base64, StandardVectors) {
  const char* const cases[][2] = {{"", ""},
                                  {"f", "Zg=="},
                                  {"fo", "Zm8="},
                                  {"foo", "Zm9v"},
                                  {"foob", "Zm9vYg=="},
                                  {"fooba", "Zm9vYmE="},
                                  {"foobar", "Zm9vYmFy"},
                                  {"\xff\xfe\xfd", "//79"},
                                  {"\xfb\xff", "+/8="}};
  for (const auto& [plain, text] : cases) EXPECT_EQ(encode(plain), text);
  EXPECT_EQ(encode(std::string(3, '\0')), "AAAA");
}

TEST(Base64, Credentials) {
  struct Case {
    const char *user, *password, *basic, *plain;
  };
  const Case cases[] = {{"u", "p", "dTpw", "AHUAcA=="},
                        {"u", "", "dQ==", "AHUAdQ=="},
                        {"u", nullptr, "dQ==", "AHUAdQ=="}};
  for (const Case& c : cases) {
    EXPECT_STREQ(zv::basic_credentials(c.user, c.password).get(), c.basic);
    EXPECT_STREQ(zv::plain_credentials(c.user, c.password).get(), c.plain);
  }
  for (const char* nobody : {"", static_cast<const char*>(nullptr)}) {
    EXPECT_EQ(zv::basic_credentials(nobody, "p"), nullptr);
    EXPECT_EQ(zv::plain_credentials(nobody, "p"), nullptr);
  }

  // The longest that a location holds, and more than that.
  const std::string longest(319, 'u');
  EXPECT_EQ(zv::basic_credentials(longest.c_str(), longest.c_str()).get(),
            encode(longest + ":" + longest));
  EXPECT_EQ(zv::plain_credentials(longest.c_str(), "").get(),
            encode(std::string(1, '\0') + longest + std::string(1, '\0') + longest));
  const std::string too_long(700, 'u');
  EXPECT_EQ(zv::basic_credentials(too_long.c_str(), "p"), nullptr);
  EXPECT_EQ(zv::plain_credentials("u", too_long.c_str()), nullptr);
}

}  // namespace
