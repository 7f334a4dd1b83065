// Dictionaries on parallel threads, as a host's parallel sessions hold them: each
// reads its own schema over and over and must get what it gets alone.
#include "ZrXmlSchemaDict.h"
#include "dictionary_support.h"

#include <atomic>
#include <gtest/gtest.h>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace {

struct Session {
    std::string schema; // under the test data folder
    bool qualified;
};

// Successful and failing reads alike: a failure logs while other threads read.
const Session kSessions[] = {
    {"e2e/purchase-order.xsd", false},     {"e2e/worked-example.xsd", false},
    {"e2e/unicode-names.xsd", false},      {"e2e/qualified-record-names.xsd", true},
    {"e2e/flatten-text-spoke.xsd", false}, {"e2e/missing-type.xsd", false},
    {"e2e/malformed-xml.xsd", false},      {"e2e/missing-include.xsd", false},
};

constexpr int kReadsPerSession = 40;

std::string readOnce(ZrXmlSchemaDict& dict, const Session& session) {
    const std::string path = std::string(ZR_TEST_DATA_DIR) + "/" + session.schema;
    const BATCHERR result = dict.ReadDictionary(path.c_str());
    return std::to_string(result) + "\n" + zrtest::dumpRecords(dict.RecordList());
}

// Counts messages from every thread; the test's own capture is for one thread.
class CountingSink {
  public:
    CountingSink() {
        previous_ = ZrGlob::SetLogSink([this](int, int, const std::u16string&) {
            std::lock_guard<std::mutex> lock(mutex_);
            ++count_;
        });
    }

    CountingSink(const CountingSink&) = delete;
    CountingSink& operator=(const CountingSink&) = delete;

    ~CountingSink() { ZrGlob::SetLogSink(previous_); }

    long count() {
        std::lock_guard<std::mutex> lock(mutex_);
        return count_;
    }

  private:
    std::mutex mutex_;
    long count_ = 0;
    ZrLogSink previous_;
};

// The threads come first: in a process of its own, as ctest runs it, the test makes
// the process's first dictionaries on all threads at once.
TEST(Concurrency, ParallelDictionariesReadAsTheyDoAlone) {
    const size_t sessions = std::size(kSessions);
    std::vector<std::vector<std::string>> results(sessions);
    CountingSink sink;
    // Every thread makes its dictionary at the same moment, then reads.
    std::atomic<size_t> waiting{0};
    std::vector<std::thread> threads;
    for (size_t i = 0; i < sessions; ++i) {
        threads.emplace_back([&, i] {
            for (++waiting; waiting < sessions;)
                std::this_thread::yield();
            ZrXmlSchemaDict dict(nullptr);
            dict.QualifiedRecords(kSessions[i].qualified);
            for (int n = 0; n < kReadsPerSession; ++n)
                results[i].push_back(readOnce(dict, kSessions[i]));
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    const long messagesInParallel = sink.count();

    std::vector<std::string> alone(sessions);
    for (size_t i = 0; i < sessions; ++i) {
        ZrXmlSchemaDict dict(nullptr);
        dict.QualifiedRecords(kSessions[i].qualified);
        alone[i] = readOnce(dict, kSessions[i]);
    }
    const long messagesAlone = sink.count() - messagesInParallel;

    for (size_t i = 0; i < sessions; ++i) {
        ASSERT_EQ(results[i].size(), size_t(kReadsPerSession));
        for (const std::string& result : results[i])
            EXPECT_EQ(result, alone[i]) << kSessions[i].schema;
    }
    EXPECT_EQ(messagesInParallel, messagesAlone * kReadsPerSession);
}

} // namespace
