// zrbench: how a schema read compares with the XML parser's own pass over the same
// documents, how it grows with the schema, and how much memory it needs.
//
// For each generated size (and each schema named with --schema) it measures in one
// process: the floor, a SAX parser configured exactly as a read configures it, with
// a handler that does nothing but follow includes; the kept floor, the same parser
// with a handler that also does the least any reader that resolves references by
// name must do (below); the host's share, the read's records made again through the
// host's API alone; the read, ZrXmlSchemaDict's whole ReadDictionary including the
// copy of the records into the dictionary; and the peak of live heap bytes during
// one read, counted by the allocation functions this program replaces (the parser
// allocates through them too).
#include "Floor.h"
#include "SchemaGenerator.h"
#include "ZrName.h"
#include "ZrXmlSchemaDict.h"
#include "zrglob.h"

#include <algorithm>
#include <atomic>
#include <benchmark/benchmark.h>
#include <cctype>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <filesystem>
#include <malloc.h>
#include <map>
#include <memory>
#include <new>
#include <optional>
#include <set>
#include <stdexcept>
#include <string>
#include <sys/resource.h>
#include <system_error>
#include <time.h>
#include <unistd.h>
#include <vector>
#include <xercesc/parsers/SAXParser.hpp>
#include <xercesc/sax/HandlerBase.hpp>
#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/XMLString.hpp>

// --- heap accounting ----------------------------------------------------------------
//
// Sizes are what the C library actually reserved (malloc_usable_size), counted on
// both allocation and release, so the figure is the heap the read really holds.
// Counting is switched on only around the one read whose peak is reported, so the
// timed runs pay nothing for it.

namespace {

std::atomic<bool> heapCounting{false};
std::atomic<long long> heapLive{0};
std::atomic<long long> heapPeak{0};

void countAllocation(void* p) {
    const auto size = static_cast<long long>(malloc_usable_size(p));
    const long long live = heapLive.fetch_add(size, std::memory_order_relaxed) + size;
    long long peak = heapPeak.load(std::memory_order_relaxed);
    while (live > peak && !heapPeak.compare_exchange_weak(peak, live, std::memory_order_relaxed)) {
    }
}

void* allocate(std::size_t size, std::size_t alignment) {
    void* p = nullptr;
    if (alignment <= alignof(std::max_align_t))
        p = std::malloc(size ? size : 1);
    else if (posix_memalign(&p, alignment, size ? size : 1) != 0)
        p = nullptr;
    if (p && heapCounting.load(std::memory_order_relaxed))
        countAllocation(p);
    return p;
}

void* allocateOrThrow(std::size_t size, std::size_t alignment) {
    void* p = allocate(size, alignment);
    if (!p)
        throw std::bad_alloc();
    return p;
}

void release(void* p) noexcept {
    if (!p)
        return;
    if (heapCounting.load(std::memory_order_relaxed))
        heapLive.fetch_sub(static_cast<long long>(malloc_usable_size(p)),
                           std::memory_order_relaxed);
    std::free(p);
}

constexpr std::size_t kPlain = alignof(std::max_align_t);

} // namespace

void* operator new(std::size_t n) { return allocateOrThrow(n, kPlain); }

void* operator new[](std::size_t n) { return allocateOrThrow(n, kPlain); }

void* operator new(std::size_t n, const std::nothrow_t&) noexcept { return allocate(n, kPlain); }

void* operator new[](std::size_t n, const std::nothrow_t&) noexcept { return allocate(n, kPlain); }

void* operator new(std::size_t n, std::align_val_t a) {
    return allocateOrThrow(n, static_cast<std::size_t>(a));
}

void* operator new[](std::size_t n, std::align_val_t a) {
    return allocateOrThrow(n, static_cast<std::size_t>(a));
}

void* operator new(std::size_t n, std::align_val_t a, const std::nothrow_t&) noexcept {
    return allocate(n, static_cast<std::size_t>(a));
}

void* operator new[](std::size_t n, std::align_val_t a, const std::nothrow_t&) noexcept {
    return allocate(n, static_cast<std::size_t>(a));
}

void operator delete(void* p) noexcept { release(p); }

void operator delete[](void* p) noexcept { release(p); }

void operator delete(void* p, std::size_t) noexcept { release(p); }

void operator delete[](void* p, std::size_t) noexcept { release(p); }

void operator delete(void* p, const std::nothrow_t&) noexcept { release(p); }

void operator delete[](void* p, const std::nothrow_t&) noexcept { release(p); }

void operator delete(void* p, std::align_val_t) noexcept { release(p); }

void operator delete[](void* p, std::align_val_t) noexcept { release(p); }

void operator delete(void* p, std::size_t, std::align_val_t) noexcept { release(p); }

void operator delete[](void* p, std::size_t, std::align_val_t) noexcept { release(p); }

void operator delete(void* p, std::align_val_t, const std::nothrow_t&) noexcept { release(p); }

void operator delete[](void* p, std::align_val_t, const std::nothrow_t&) noexcept { release(p); }

namespace {

using namespace xercesc;
using namespace zrfloor;
namespace fs = std::filesystem;

constexpr double kMB = 1024.0 * 1024.0;

// The least a reader that resolves references by name adds to the parse, as a
// reference point between the floor and the read: the values of the attributes the
// reader uses are kept, in one growing buffer, and each value that names a component
// or refers to one (name, type, ref, base) is entered once in a table of distinct
// texts. Occurrences, "use" and documentation attributes, which the reader ignores,
// are only looked at. No dispatch, no model, no records: any reader of this design
// does at least this much.
class KeepingHandler : public FloorHandler {
  public:
    void startElement(const XMLCh* name, AttributeList& attrs) override {
        FloorHandler::startElement(name, attrs);
        for (XMLSize_t i = 0, n = attrs.getLength(); i < n; ++i) {
            const XMLCh* attribute = attrs.getName(i);
            const bool named = namesComponent(attribute);
            if (!named && !keptAsWritten(attribute))
                continue;
            const size_t offset = kept_.size();
            kept_.append(attrs.getValue(i));
            if (named)
                enter(offset, kept_.size() - offset);
        }
    }

  private:
    struct Slot {
        uint64_t hash = 0;
        size_t offset = 0;
        size_t size = 0; // 0: a free slot (empty texts are not entered)

        bool free() const { return size == 0; }
    };

    static bool namesComponent(const XMLCh* attribute) {
        return XMLString::equals(attribute, u"name") || XMLString::equals(attribute, u"type") ||
               XMLString::equals(attribute, u"ref") || XMLString::equals(attribute, u"base");
    }

    // Facet values, and the schema's namespace, declarations and included locations.
    static bool keptAsWritten(const XMLCh* attribute) {
        return XMLString::equals(attribute, u"value") ||
               XMLString::equals(attribute, u"targetNamespace") ||
               XMLString::equals(attribute, u"schemaLocation") ||
               XMLString::startsWith(attribute, u"xmlns");
    }

    std::u16string_view text(size_t offset, size_t size) const {
        return std::u16string_view(kept_).substr(offset, size);
    }

    void enter(size_t offset, size_t size) {
        if (size == 0)
            return;
        if ((entered_ + 1) * 4 > slots_.size() * 3)
            zrRehashSlots(slots_, slots_.empty() ? 256 : slots_.size() * 2);
        const std::u16string_view value = text(offset, size);
        const uint64_t hash = zrTextHash(value);
        const size_t mask = slots_.size() - 1;
        for (size_t i = hash & mask; !slots_[i].free(); i = (i + 1) & mask) {
            if (slots_[i].hash == hash && zrSameText(text(slots_[i].offset, slots_[i].size), value))
                return;
        }
        zrPlaceSlot(slots_, Slot{hash, offset, size});
        ++entered_;
    }

    std::u16string kept_;
    std::vector<Slot> slots_;
    size_t entered_ = 0;
};

// The floor with the keeping handler.
std::vector<std::string> runKeptFloor(const std::string& mainPath) {
    KeepingHandler keeper;
    return runFloor(mainPath, keeper);
}

// --- the read -----------------------------------------------------------------------

// Collects what a read logs instead of letting it reach stderr.
class MessageSink {
  public:
    MessageSink() {
        previous_ = ZrGlob::SetLogSink([this](int severity, int code, const std::u16string& text) {
            ++count;
            if (first.size() < 5)
                first.push_back(std::to_string(severity) + " " + std::to_string(code) + " " +
                                zrUtf16ToUtf8(text));
        });
    }

    MessageSink(const MessageSink&) = delete;
    MessageSink& operator=(const MessageSink&) = delete;

    ~MessageSink() { ZrGlob::SetLogSink(previous_); }

    long count = 0;
    std::vector<std::string> first;

  private:
    ZrLogSink previous_;
};

struct ReadOutcome {
    int status = 0;
    int records = 0;
    long messages = 0;
    std::vector<std::string> firstMessages;
    long long peakBytes = 0;     // most live heap during the read, above its start
    long long retainedBytes = 0; // live heap left by the read: the dictionary's records
};

// Whether reads with every field's digits, nulls and description ("DecimalDigits",
// "OccurrenceNulls", "FieldDescriptions") are measured too, beside the plain ones;
// set once from the command line.
bool fieldDetail = false;

void configureRead(ZrXmlSchemaDict& dict, bool qualified, bool detail) {
    dict.QualifiedRecords(qualified);
    dict.Detail().decimalDigits = detail;
    dict.Detail().occurrenceNulls = detail;
    dict.Detail().fieldDescriptions = detail;
}

ReadOutcome measuredRead(const std::string& mainPath, bool qualified, bool detail = false) {
    ReadOutcome out;
    MessageSink sink;
    ZrXmlSchemaDict dict(nullptr);
    configureRead(dict, qualified, detail);
    heapLive.store(0);
    heapPeak.store(0);
    heapCounting.store(true);
    out.status = dict.ReadDictionary(mainPath.c_str());
    heapCounting.store(false);
    out.peakBytes = heapPeak.load();
    out.retainedBytes = heapLive.load();
    out.records = dict.RecordList().Count();
    out.messages = sink.count;
    out.firstMessages = sink.first;
    return out;
}

// Each record of `from` made again in `to` the way a reader hands its records over:
// one record, then one call per field with the field's type and a name of its own.
void remakeRecords(const ZrRecordList& from, ZrRecordList& to) {
    for (int i = 0; i < from.Count(); ++i) {
        const ZrRecord* record = from[i];
        ZrRecord* made = to.AddRecord(nullptr, -1);
        if (!made)
            throw std::bad_alloc();
        made->name = record->name;
        made->RecordLength(record->RecordLength());
        for (int f = 0; f < record->FieldCount(); ++f) {
            const ZrField* field = record->GetFieldbyPos(f);
            made->NewField(field->DataType(), ZrWString(field->FieldName()));
        }
    }
}

// --- one schema set -------------------------------------------------------------------

struct SetResult {
    std::string label;
    long size = 0; // generated complex types; 0 for a schema given by the user
    std::vector<std::string> documents;
    uint64_t textBytes = 0;
    ReadOutcome read;
    ReadOutcome detailRead; // with field detail; measured only when asked for
    double floorSeconds = 0;
    double keptSeconds = 0;
    double hostSeconds = 0;
    double readSeconds = 0;
    double detailSeconds = 0;
    double maxRssMB = 0;
    bool timed = false;
};

std::map<std::string, double> minimumSeconds; // benchmark name -> fastest repetition

// The clock of the timed runs. The calling thread's CPU time by default: both sides
// are single-threaded and read files the page cache already holds, and on a shared
// machine CPU time is far steadier than elapsed time, which counts the time other
// processes hold the cores.
bool wallClock = false;

double now() {
    if (wallClock)
        return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch())
            .count();
    timespec ts{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &ts);
    return static_cast<double>(ts.tv_sec) + static_cast<double>(ts.tv_nsec) * 1e-9;
}

// Echoes the library's own report and keeps the fastest repetition of each benchmark.
class CollectingReporter : public benchmark::ConsoleReporter {
  public:
    CollectingReporter() : ConsoleReporter(isatty(fileno(stdout)) ? OO_ColorTabular : OO_Tabular) {}

    // The machine description once, not before every set.
    bool ReportContext(const Context& context) override {
        if (contextShown_)
            return true;
        contextShown_ = true;
        return ConsoleReporter::ReportContext(context);
    }

    void ReportRuns(const std::vector<Run>& runs) override {
        ConsoleReporter::ReportRuns(runs);
        for (const Run& run : runs) {
            // A single repetition has no aggregate: its one run is the fastest.
            const bool fastest = run.run_type == Run::RT_Aggregate ? run.aggregate_name == "min"
                                                                   : run.repetitions <= 1;
            if (fastest && !run.error_occurred)
                minimumSeconds[run.run_name.function_name] =
                    run.GetAdjustedRealTime() / 1e3; // the unit is milliseconds
        }
    }

  private:
    bool contextShown_ = false;
};

double fastest(const std::vector<double>& values) {
    return values.empty() ? 0.0 : *std::min_element(values.begin(), values.end());
}

int defaultRepetitions(uint64_t textBytes) {
    if (textBytes < 4 * 1024 * 1024)
        return 9;
    if (textBytes < 40 * 1024 * 1024)
        return 5;
    return 3;
}

void timeSet(SetResult& set, bool qualified, int repetitions, CollectingReporter& reporter) {
    const std::string floorName = "floor/" + set.label;
    const std::string keptName = "kept/" + set.label;
    const std::string hostName = "host/" + set.label;
    const std::string readName = "read/" + set.label;
    const std::string detailName = "detail/" + set.label;
    const std::string mainPath = set.documents.front();
    const int reps = repetitions > 0 ? repetitions : defaultRepetitions(set.textBytes);
    auto configure = [reps](benchmark::internal::Benchmark* b) {
        b->UseManualTime()
            ->Unit(benchmark::kMillisecond)
            ->Iterations(1)
            ->Repetitions(reps)
            ->ComputeStatistics("min", fastest)
            ->DisplayAggregatesOnly(true);
    };
    configure(benchmark::RegisterBenchmark(floorName.c_str(), [mainPath](benchmark::State& state) {
        for (auto _ : state) {
            const double start = now();
            runFloor(mainPath);
            state.SetIterationTime(now() - start);
        }
    }));
    configure(benchmark::RegisterBenchmark(keptName.c_str(), [mainPath](benchmark::State& state) {
        for (auto _ : state) {
            const double start = now();
            runKeptFloor(mainPath);
            state.SetIterationTime(now() - start);
        }
    }));
    // The records of one read, made again through the host's API into a fresh list
    // (its release untimed, as with the read's dictionary).
    auto source = std::make_shared<ZrXmlSchemaDict>(nullptr);
    {
        MessageSink sink;
        configureRead(*source, qualified, false);
        source->ReadDictionary(mainPath.c_str());
    }
    configure(benchmark::RegisterBenchmark(hostName.c_str(), [source](benchmark::State& state) {
        for (auto _ : state) {
            ZrRecordList made;
            const double start = now();
            remakeRecords(source->RecordList(), made);
            state.SetIterationTime(now() - start);
        }
    }));
    auto timedRead = [mainPath, qualified](bool detail) {
        return [mainPath, qualified, detail](benchmark::State& state) {
            MessageSink sink;
            for (auto _ : state) {
                // A fresh dictionary each time, built outside the timing: the read is
                // ReadDictionary alone, from an empty record list.
                ZrXmlSchemaDict dict(nullptr);
                configureRead(dict, qualified, detail);
                const double start = now();
                const BATCHERR status = dict.ReadDictionary(mainPath.c_str());
                state.SetIterationTime(now() - start);
                if (status != BE_OK)
                    state.SkipWithError("ReadDictionary failed");
            }
        };
    };
    configure(benchmark::RegisterBenchmark(readName.c_str(), timedRead(false)));
    // Beside the plain read and in the same process, so that what the options cost is
    // a ratio of two figures taken under the same conditions.
    if (fieldDetail)
        configure(benchmark::RegisterBenchmark(detailName.c_str(), timedRead(true)));
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::ClearRegisteredBenchmarks();
    set.timed = minimumSeconds.count(floorName) && minimumSeconds.count(keptName) &&
                minimumSeconds.count(hostName) && minimumSeconds.count(readName);
    if (set.timed) {
        set.floorSeconds = minimumSeconds[floorName];
        set.keptSeconds = minimumSeconds[keptName];
        set.hostSeconds = minimumSeconds[hostName];
        set.readSeconds = minimumSeconds[readName];
    }
    if (set.timed && fieldDetail) {
        set.timed = minimumSeconds.count(detailName) != 0;
        set.detailSeconds = set.timed ? minimumSeconds[detailName] : 0;
    }
}

double maxRssMB() {
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return static_cast<double>(usage.ru_maxrss) * 1024.0 / kMB; // ru_maxrss is in KiB
}

// Floor once (it also finds the documents), one counted read, then the timings.
// False when the set cannot be read.
bool measureSet(SetResult& set, const std::string& mainPath, bool qualified, bool timing,
                int repetitions, CollectingReporter& reporter) {
    // A set the floor cannot parse is reported and left out; the others still run.
    try {
        set.documents = runFloor(mainPath);
    } catch (const std::exception& e) {
        std::fprintf(stderr, "%s: %s\n", set.label.c_str(), e.what());
        return false;
    }
    for (const auto& doc : set.documents)
        set.textBytes += fs::file_size(doc);
    set.read = measuredRead(mainPath, qualified);
    if (set.read.status != BE_OK || set.read.messages != 0) {
        std::fprintf(stderr, "%s: ReadDictionary returned %d with %ld message(s)\n",
                     set.label.c_str(), set.read.status, set.read.messages);
        for (const auto& m : set.read.firstMessages)
            std::fprintf(stderr, "  %s\n", m.c_str());
    }
    if (set.read.status != BE_OK)
        return false;
    if (fieldDetail)
        set.detailRead = measuredRead(mainPath, qualified, true);
    if (timing)
        timeSet(set, qualified, repetitions, reporter);
    set.maxRssMB = maxRssMB();
    if (timing && !set.timed) {
        std::fprintf(stderr, "%s: a measurement recorded no time\n", set.label.c_str());
        return false;
    }
    return true;
}

// --- report ---------------------------------------------------------------------------

void printTable(const std::vector<SetResult>& sets) {
    int width = 8;
    for (const auto& s : sets)
        width = std::max(width, static_cast<int>(s.label.size()));
    std::printf("\ntimes: fastest of the repetitions, %s\n",
                wallClock ? "elapsed time" : "CPU time of the reading thread");
    std::printf("%-*s %9s %5s %10s %10s %9s %10s %6s %6s %9s %9s %11s %8s %9s\n", width, "set",
                "text MB", "docs", "floor ms", "kept ms", "host ms", "read ms", "least", "ratio",
                "peak MB", "peak/text", "retained MB", "records", "maxrss MB");
    for (const auto& s : sets) {
        const double text = static_cast<double>(s.textBytes);
        const double peak = static_cast<double>(s.read.peakBytes);
        std::printf("%-*s %9.2f %5zu ", width, s.label.c_str(), text / kMB, s.documents.size());
        if (s.timed)
            std::printf("%10.2f %10.2f %9.2f %10.2f %6.2f %6.2f ", s.floorSeconds * 1e3,
                        s.keptSeconds * 1e3, s.hostSeconds * 1e3, s.readSeconds * 1e3,
                        (s.keptSeconds + s.hostSeconds) / s.floorSeconds,
                        s.readSeconds / s.floorSeconds);
        else
            std::printf("%10s %10s %9s %10s %6s %6s ", "-", "-", "-", "-", "-", "-");
        std::printf("%9.1f %9.2f %11.1f %8d %9.1f\n", peak / kMB, peak / text,
                    static_cast<double>(s.read.retainedBytes) / kMB, s.read.records, s.maxRssMB);
    }

    // The targets: read within 1.25 x the floor, linear growth from 10,000 to
    // 100,000 complex types (at most 11 x), peak at most 8 x the text at 100,000.
    const SetResult* at10k = nullptr;
    const SetResult* at100k = nullptr;
    for (const auto& s : sets) {
        if (s.size == 10000 && s.timed)
            at10k = &s;
        if (s.size == 100000)
            at100k = &s;
    }
    std::printf("\n");
    for (const auto& s : sets)
        if (s.timed && s.size > 0)
            std::printf("target read/floor <= 1.25 at %-7ld %6.2f  %s\n", s.size,
                        s.readSeconds / s.floorSeconds,
                        s.readSeconds <= 1.25 * s.floorSeconds ? "met" : "MISSED");
    if (at10k && at100k && at100k->timed) {
        const double growth = at100k->readSeconds / at10k->readSeconds;
        std::printf("growth read(100000)/read(10000)      %6.2f  %s (floor %.2f, kept %.2f)\n",
                    growth, growth <= 11.0 ? "met" : "MISSED",
                    at100k->floorSeconds / at10k->floorSeconds,
                    at100k->keptSeconds / at10k->keptSeconds);
    }
    if (at100k) {
        const double ratio =
            static_cast<double>(at100k->read.peakBytes) / static_cast<double>(at100k->textBytes);
        std::printf("target peak/text <= 8 at 100000      %6.2f  %s\n", ratio,
                    ratio <= 8.0 ? "met" : "MISSED");
    }
    if (!fieldDetail)
        return;
    std::printf("\nwith DecimalDigits, OccurrenceNulls and FieldDescriptions on (detail), in "
                "the same runs\n");
    std::printf("%-*s %10s %10s %12s %9s %14s\n", width, "set", "read ms", "detail ms",
                "detail/read", "peak MB", "detail peak MB");
    for (const auto& s : sets) {
        std::printf("%-*s ", width, s.label.c_str());
        if (s.timed)
            std::printf("%10.2f %10.2f %12.3f ", s.readSeconds * 1e3, s.detailSeconds * 1e3,
                        s.detailSeconds / s.readSeconds);
        else
            std::printf("%10s %10s %12s ", "-", "-", "-");
        std::printf("%9.1f %14.1f\n", static_cast<double>(s.read.peakBytes) / kMB,
                    static_cast<double>(s.detailRead.peakBytes) / kMB);
    }
    if (at10k)
        std::printf("target detail/read <= 1.10 at 10000  %6.3f  %s\n",
                    at10k->detailSeconds / at10k->readSeconds,
                    at10k->detailSeconds <= 1.10 * at10k->readSeconds ? "met" : "MISSED");
}

// --- command line ---------------------------------------------------------------------

struct Options {
    std::vector<long> sizes;
    std::vector<std::string> schemas;
    std::string workDir;
    bool keep = false;
    bool qualified = false;
    bool fieldDetail = false;
    bool check = false;
    bool wall = false;
    int repetitions = 0;
};

int usage(std::FILE* out = stderr) {
    std::fprintf(
        out, "usage: zrbench [--sizes N[,N...]] [--schema FILE]... [--work-dir DIR] [--keep]\n"
             "               [--qualified] [--field-detail] [--repetitions N] [--wall] [--check]\n"
             "               [--benchmark_...]\n"
             "  --sizes N,...      generated sets to measure (default 1000,10000,100000;\n"
             "                     none when only --schema is given)\n"
             "  --schema FILE      also measure this schema and what it includes (repeatable)\n"
             "  --work-dir DIR     generate into DIR instead of a temporary folder\n"
             "  --keep             keep the generated sets\n"
             "  --qualified        read with QualifiedRecordNames on\n"
             "  --field-detail     also time reads with DecimalDigits, OccurrenceNulls\n"
             "                     and FieldDescriptions on, beside the plain ones\n"
             "  --repetitions N    timed runs per measurement; the fastest counts\n"
             "                     (default 9, 5 or 3 by size)\n"
             "  --wall             time by the elapsed clock instead of the reading thread's\n"
             "                     CPU time\n"
             "  --check            no timing: every set must read with status 0, no message\n"
             "                     and at least one record\n"
             "Google Benchmark's own --benchmark_... flags are passed on.\n");
    return 2;
}

std::optional<Options> parseOptions(int argc, char** argv) {
    Options o;
    bool sizesGiven = false;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        auto value = [&]() -> std::optional<std::string> {
            if (i + 1 >= argc)
                return std::nullopt;
            return std::string(argv[++i]);
        };
        if (arg == "--sizes") {
            auto v = value();
            if (!v)
                return std::nullopt;
            sizesGiven = true;
            size_t pos = 0;
            while (pos <= v->size()) {
                const size_t comma = std::min(v->find(',', pos), v->size());
                char* end = nullptr;
                const std::string item = v->substr(pos, comma - pos);
                const long n = std::strtol(item.c_str(), &end, 10);
                if (item.empty() || *end != '\0' || n < 1)
                    return std::nullopt;
                o.sizes.push_back(n);
                pos = comma + 1;
            }
        } else if (arg == "--schema") {
            auto v = value();
            if (!v)
                return std::nullopt;
            o.schemas.push_back(*v);
        } else if (arg == "--work-dir") {
            auto v = value();
            if (!v)
                return std::nullopt;
            o.workDir = *v;
        } else if (arg == "--repetitions") {
            auto v = value();
            if (!v || (o.repetitions = std::atoi(v->c_str())) < 1)
                return std::nullopt;
        } else if (arg == "--keep") {
            o.keep = true;
        } else if (arg == "--qualified") {
            o.qualified = true;
        } else if (arg == "--field-detail") {
            o.fieldDetail = true;
        } else if (arg == "--check") {
            o.check = true;
        } else if (arg == "--wall") {
            o.wall = true;
        } else {
            return std::nullopt;
        }
    }
    if (!sizesGiven && o.schemas.empty())
        o.sizes = {1000, 10000, 100000};
    return o;
}

// The folder generated sets go to: the one given, or a fresh temporary one that is
// removed at the end unless --keep.
class WorkFolder {
  public:
    explicit WorkFolder(const Options& o) : keep_(o.keep || !o.workDir.empty()) {
        if (!o.workDir.empty()) {
            fs::create_directories(o.workDir);
            path_ = fs::absolute(o.workDir).string();
            return;
        }
        std::string pattern = (fs::temp_directory_path() / "zrbench-XXXXXX").string();
        if (!mkdtemp(pattern.data()))
            throw std::runtime_error("cannot create a temporary folder");
        path_ = pattern;
    }

    WorkFolder(const WorkFolder&) = delete;
    WorkFolder& operator=(const WorkFolder&) = delete;

    ~WorkFolder() {
        std::error_code ec;
        if (keep_)
            std::printf("generated sets kept in %s\n", path_.c_str());
        else
            fs::remove_all(path_, ec);
    }

    const std::string& path() const { return path_; }

  private:
    bool keep_;
    std::string path_;
};

} // namespace

int main(int argc, char** argv) {
    // Repetitions of the floor and the read alternate in random order, so a burst of
    // load on the machine does not fall on one side only. A flag given overrides.
    for (int i = 1; i < argc; ++i) {
        if (std::strcmp(argv[i], "--help") == 0 || std::strcmp(argv[i], "-h") == 0) {
            usage(stdout);
            return 0;
        }
    }
    std::vector<char*> args(argv, argv + argc);
    bool interleavingGiven = false;
    for (char* a : args)
        interleavingGiven |= std::strncmp(a, "--benchmark_enable_random_interleaving", 38) == 0;
    char interleave[] = "--benchmark_enable_random_interleaving=true";
    if (!interleavingGiven)
        args.insert(args.begin() + 1, interleave);
    int count = static_cast<int>(args.size());
    benchmark::Initialize(&count, args.data());
    const std::optional<Options> options = parseOptions(count, args.data());
    if (!options)
        return usage();
    wallClock = options->wall;
    fieldDetail = options->fieldDetail;

    try {
        XMLPlatformUtils::Initialize();
        WorkFolder work(*options);
        CollectingReporter reporter;
        std::vector<SetResult> results;
        bool allRead = true;

        for (long size : options->sizes) {
            const std::string dir = work.path() + "/" + std::to_string(size);
            fs::create_directories(dir);
            const auto start = std::chrono::steady_clock::now();
            const zrgen::GeneratedSet generated = zrgen::generateSchemaSet(size, dir);
            std::printf(
                "generated %ld complex types, %.1f MB in %zu documents, in %.1f s\n", size,
                static_cast<double>(generated.bytes) / kMB, generated.documents.size(),
                std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count());
            std::fflush(stdout);
            SetResult set;
            set.label = std::to_string(size);
            set.size = size;
            const bool ok = measureSet(set, generated.mainPath, options->qualified, !options->check,
                                       options->repetitions, reporter);
            if (ok && set.documents.size() != generated.documents.size()) {
                std::fprintf(stderr, "%s: the floor parsed %zu documents, the set has %zu\n",
                             set.label.c_str(), set.documents.size(), generated.documents.size());
                allRead = false;
            }
            allRead = allRead && ok && set.read.messages == 0 && set.read.records > 0;
            if (!set.documents.empty())
                results.push_back(std::move(set));
            if (!options->keep && options->workDir.empty())
                fs::remove_all(dir);
        }
        for (const auto& schema : options->schemas) {
            SetResult set;
            set.label = fs::path(schema).filename().string();
            const bool ok = measureSet(set, schema, options->qualified, !options->check,
                                       options->repetitions, reporter);
            allRead = allRead && ok;
            if (!set.documents.empty())
                results.push_back(std::move(set));
        }

        printTable(results);
        benchmark::Shutdown();
        return allRead ? 0 : 1;
    } catch (const XMLException& e) {
        std::fprintf(stderr, "zrbench: %s\n", utf8(e.getMessage()).c_str());
    } catch (const std::exception& e) {
        std::fprintf(stderr, "zrbench: %s\n", e.what());
    }
    return 1;
}
