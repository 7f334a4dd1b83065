// Host file access: which texts are URIs, and the file proxy's refusals and reads.
#include "TestSupport.h"
#include "zrfile.h"

#include <algorithm>
#include <filesystem>
#include <gtest/gtest.h>
#include <string>
#include <sys/stat.h>
#include <vector>

namespace {

using zrtest::TempDir;

TEST(HostFile, UriProtocolAndPath) {
    const struct {
        const char16_t* text;
        ZRPROTOCOL protocol;
        const char* path;
    } cases[] = {
        {u"schemas/a.xsd", ZRP_NONE, "schemas/a.xsd"},
        {u"/abs/a.xsd", ZRP_NONE, "/abs/a.xsd"},
        {u"C:\\x\\a.xsd", ZRP_NONE, "C:\\x\\a.xsd"},
        {u"c:/x/a.xsd", ZRP_NONE, "c:/x/a.xsd"},
        {u"\\\\server\\share\\a.xsd", ZRP_NONE, "\\\\server\\share\\a.xsd"},
        {u"sub/a:b.xsd", ZRP_NONE, "sub/a:b.xsd"}, // a colon after a directory
        {u"file:///tmp/a.xsd", ZRP_FILE, "/tmp/a.xsd"},
        {u"file:/tmp/a.xsd", ZRP_FILE, "/tmp/a.xsd"},
        {u"FILE:///x", ZRP_FILE, "/x"},
        {u"http://host:8080/dir/a.xsd", ZRP_HTTP, "/dir/a.xsd"},
        {u"http://host", ZRP_HTTP, ""},
        {u"https://h/a", ZRP_HTTPS, "/a"},
        {u"ftp://h/a", ZRP_FTP, "/a"},
        {u"urn:x:y", ZRP_OTHER, "x:y"},
        {u"", ZRP_NONE, ""},
        {nullptr, ZRP_NONE, ""},
    };

    for (const auto& c : cases) {
        ZrURI uri(c.text);
        EXPECT_EQ(uri.protocol(), c.protocol) << c.path;
        EXPECT_STREQ(uri.path(), c.path);
    }
}

TEST(HostFile, RefusesWhatIsNotALocalRegularFileAndReadsTheRest) {
    TempDir dir;
    const std::string file = dir.write("a.xsd", "content");
    const std::string fifo = (dir.path() / "pipe").string();
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);

    const std::pair<std::string, const char*> refusals[] = {
        {(dir.path() / "missing.xsd").string(), "rb"},
        {dir.path().string(), "rb"}, // a directory
        {fifo, "rb"},                // would block a plain open
        {"/dev/zero", "rb"},         // endless data
        {"file://" + file, "rb"},    // URIs are not read even when local
        {"", "rb"},
        {file, "wb"}, // reading only
    };
    for (const auto& [name, mode] : refusals) {
        ZrFileProxy proxy;
        EXPECT_EQ(proxy.openfile(name.c_str(), mode, ZR_CSET_FILESYSTEM), -1) << name;
        EXPECT_FALSE(proxy.isOpen()) << name;
        char buffer[4];
        EXPECT_EQ(proxy.read(buffer, sizeof buffer), -1) << name;
    }
    ZrFileProxy proxy;
    EXPECT_EQ(proxy.openfile(nullptr, "rb", ZR_CSET_FILESYSTEM), -1);
    EXPECT_EQ(proxy.openfile(file.c_str(), nullptr, ZR_CSET_FILESYSTEM), -1);
    EXPECT_EQ(std::filesystem::file_size(file), 7u) << "a refused write mode truncated the file";

    // A regular file is read to its end in chunks; reopening closes the first file.
    std::string content;
    for (int i = 0; i < 10000; ++i)
        content += static_cast<char>('a' + i % 26);
    const std::string big = dir.write("big.xsd", content);
    const std::string empty = dir.write("empty.xsd", "");

    ASSERT_EQ(proxy.openfile(big.c_str(), "rb", ZR_CSET_FILESYSTEM), 0);
    std::string got;
    std::vector<long> counts;
    char buffer[4096];
    for (long n = 1; n > 0;) {
        n = proxy.read(buffer, sizeof buffer);
        counts.push_back(n);
        got.append(buffer, static_cast<size_t>(std::max(n, 0L)));
    }
    EXPECT_EQ(counts, (std::vector<long>{4096, 4096, 1808, 0}));
    EXPECT_EQ(got, content);
    EXPECT_EQ(proxy.read(buffer, -1), -1);
    EXPECT_EQ(proxy.read(nullptr, 4), -1);

    ASSERT_EQ(proxy.openfile(empty.c_str(), "rb", ZR_CSET_DEFAULT), 0);
    EXPECT_EQ(proxy.read(buffer, 1), 0) << "the second, empty file is the one open";
    proxy.close(true);
    EXPECT_FALSE(proxy.isOpen());
    EXPECT_FALSE(std::filesystem::exists(empty));
    EXPECT_TRUE(std::filesystem::exists(big));
    proxy.close(true); // closing twice is harmless
    ASSERT_EQ(proxy.openfile(big.c_str(), "rb", ZR_CSET_DEFAULT), 0);
    proxy.close(false);
    EXPECT_TRUE(std::filesystem::exists(big));
}

} // namespace
