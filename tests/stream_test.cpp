// File streams: blocks, offsets, lines.
#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>

#include "scratch_folder.h"
#include "zarvo.h"

namespace {

using Stream = std::unique_ptr<FILE, int (*)(FILE*)>;

// At the second try where calls fail on purpose.
Stream open(const std::string& path, const char* mode) {
  FILE* const stream = zv_fopen(path.c_str(), mode, nullptr);
  return {stream != nullptr ? stream : zv_fopen(path.c_str(), mode, nullptr), zv_fclose};
}

TEST(Stream, IsBinaryWhateverTheModeSays) {
  const ScratchFolder scratch;
  int flag = 7;
  FILE* fp = zv_fopen(scratch.path("text").c_str(), "w", &flag);
  ASSERT_NE(fp, nullptr);
  EXPECT_EQ(flag, 0);
  EXPECT_EQ(zv_fputs("a\n\r\n\x1Az", fp, 0), 0);
  EXPECT_EQ(zv_fclose(fp), 0);
  EXPECT_EQ(scratch.content("text"), "a\n\r\n\x1Az");

  char read[8] = "";
  EXPECT_EQ(zv_fread(read, 1, sizeof read, open(scratch.path("text"), "r").get(), 0), 6u);
  EXPECT_STREQ(read, "a\n\r\n\x1Az");

  flag = 7;
  EXPECT_EQ(zv_fopen(scratch.path("missing").c_str(), "r", &flag), nullptr);
  EXPECT_EQ(flag, 7);
  EXPECT_EQ(zv_fclose(nullptr), 0);
}

TEST(Stream, BlocksInTheOtherByteOrder) {
  const ScratchFolder scratch;
  char elements[] = "0123abcdxyz";
  {
    const Stream out = open(scratch.path("block"), "w");
    EXPECT_EQ(zv_fwrite(elements, 4, 2, out.get(), 1), 2u);
    EXPECT_EQ(zv_fwrite(elements + 8, 1, 3, out.get(), 1), 3u);
  }
  EXPECT_STREQ(elements, "0123abcdxyz");
  EXPECT_EQ(scratch.content("block"), "3210dcbaxyz");

  // Of the third element only three bytes are there: it is neither counted nor turned round.
  const Stream in = open(scratch.path("block"), "r");
  char back[13] = "............";
  EXPECT_EQ(zv_fread(back, 4, 3, in.get(), 1), 2u);
  EXPECT_STREQ(back, "0123abcdxyz.");
  EXPECT_EQ(zv_fread(back, 4, 1, in.get(), 1), 0u);
}

TEST(Stream, OffsetsBeyondFourGigabytes) {
  const ScratchFolder scratch;
  constexpr int64_t far = INT64_C(5) << 30;
  Stream fp = open(scratch.path("sparse"), "w+");
  ASSERT_TRUE(fp);
  ASSERT_EQ(zv_fseek(fp.get(), far, SEEK_SET), 0);
  ASSERT_EQ(zv_fputs("end", fp.get(), 0), 0);
  EXPECT_EQ(zv_ftell(fp.get()), far + 3);
  EXPECT_EQ(zv_fseek(fp.get(), -4, SEEK_CUR), 0);
  char read[5] = "....";
  EXPECT_EQ(zv_fread(read, 1, 4, fp.get(), 0), 4u);
  EXPECT_EQ(std::memcmp(read, "\0end", 4), 0);
  EXPECT_EQ(zv_fseek(fp.get(), -1, SEEK_END), 0);
  EXPECT_EQ(zv_ftell(fp.get()), far + 2);
  EXPECT_NE(zv_fseek(fp.get(), -1, SEEK_SET), 0);
  fp.reset();

  struct _stat64 st;
  ASSERT_EQ(zv_stat(scratch.path("sparse").c_str(), &st), 0);
  EXPECT_EQ(st.st_size, far + 3);
}

TEST(Stream, LinesWithAndWithoutTheirCarriageReturn) {
  struct Case {
    const char* content;
    int size;
    const char *kept, *stripped;
  };
  const Case cases[] = {
      {"abc\r\nd", 16, "abc\r\n", "abc\n"},
      {"\r\n", 16, "\r\n", "\n"},
      {"abc\nd", 16, "abc\n", "abc\n"},
      {"\n", 16, "\n", "\n"},
      {"abc\r", 16, "abc\r", "abc\r"},
      {"abc\r\n", 5, "abc\r", "abc\r"},  // cut between the two
      {"abc\r\n", 6, "abc\r\n", "abc\n"},
  };
  const ScratchFolder scratch;
  for (const Case& c : cases) {
    SCOPED_TRACE(testing::Message() << c.content << ' ' << c.size);
    scratch.make_file("lines", c.content);
    for (const int strip : {0, 1}) {
      const Stream fp = open(scratch.path("lines"), "r");
      char buf[17] = "################";
      ASSERT_EQ(zv_fgets(buf, c.size, fp.get(), strip), buf);
      std::string expected = strip ? c.stripped : c.kept;
      expected.resize(static_cast<size_t>(c.size));  // zero to the buffer's end
      EXPECT_EQ(std::string(buf, static_cast<size_t>(c.size)), expected);
      EXPECT_EQ(buf[c.size], c.size < 16 ? '#' : '\0');
    }
  }
  const Stream fp = open(scratch.make_file("empty"), "r");
  char buf[4] = "abc";
  EXPECT_EQ(zv_fgets(buf, sizeof buf, fp.get(), 1), nullptr);
}

TEST(Stream, LineFeedsAsCarriageReturnLineFeed) {
  struct Case {
    const char *text, *crlf;
  };
  const Case cases[] = {
      {"a\nb", "a\r\nb"}, {"", ""}, {"\n\n", "\r\n\r\n"}, {"a\r\n", "a\r\r\n"}, {"a", "a"}};
  const ScratchFolder scratch;
  for (const Case& c : cases) {
    for (const int crlf : {0, 1}) {
      EXPECT_EQ(zv_fputs(c.text, open(scratch.path("out"), "w").get(), crlf), 0);
      EXPECT_EQ(scratch.content("out"), crlf ? c.crlf : c.text);
    }
  }
}

TEST(Stream, SkipsToTheNextLine) {
  const ScratchFolder scratch;
  const Stream fp = open(scratch.make_file("lines", "abc\n\ndef"), "r");
  EXPECT_EQ(zv_fskip(fp.get()), 0);
  EXPECT_EQ(zv_ftell(fp.get()), 4);
  EXPECT_EQ(zv_fskip(fp.get()), 0);
  EXPECT_EQ(zv_ftell(fp.get()), 5);
  EXPECT_EQ(zv_fskip(fp.get()), -1);
  EXPECT_EQ(zv_ftell(fp.get()), 8);

  // The end of the file met before does not count.
  ASSERT_EQ(zv_fseek(fp.get(), 0, SEEK_SET), 0);
  EXPECT_EQ(zv_fskip(fp.get()), 0);
  EXPECT_EQ(zv_fskip(nullptr), -1);

  const Stream out = open(scratch.path("out"), "w");
  EXPECT_EQ(zv_fskip(out.get()), -1);
}

}  // namespace
