// Names, namespaces and facet values of the component model: immutable text that
// copies share. A schema repeats the same few namespaces and many of its names on
// every declaration, and the model saves, restores and stores its components by
// value, so owning one string per field would cost an allocation per copy and a
// heap block per repetition.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <new>
#include <string_view>
#include <utility>
#include <vector>

// Equal texts. The standard comparison of char16_t text walks it one unit at a
// time; names and namespaces are compared often enough for that to show.
inline bool zrSameText(std::u16string_view a, std::u16string_view b) noexcept {
    return a.size() == b.size() &&
           (a.empty() || std::memcmp(a.data(), b.data(), a.size() * sizeof(char16_t)) == 0);
}

// The hash's starting state, chosen per process (from where the program was loaded
// and when it started), so that a schema cannot be prepared to make the probes of
// the tables below collide. No answer depends on it: the tables only find things.
// Taken at first use, so that no hash is made before it is set.
inline uint64_t zrTextHashSeed() noexcept {
    static const uint64_t seed = [] {
        static const char anchor = 0;
        uint64_t mixed = uint64_t(reinterpret_cast<uintptr_t>(&anchor)) ^
                         uint64_t(std::chrono::steady_clock::now().time_since_epoch().count());
        mixed = (mixed ^ (mixed >> 30)) * 0xbf58476d1ce4e5b9ull;
        return mixed ^ (mixed >> 27);
    }();
    return seed;
}

// A hash of the text's bytes, eight at a time: it spreads the names of a schema over
// a table, seeded as above.
inline uint64_t zrTextHash(std::u16string_view text) noexcept {
    constexpr uint64_t kMul = 0xbf58476d1ce4e5b9ull;
    const unsigned char* p = reinterpret_cast<const unsigned char*>(text.data());
    size_t n = text.size() * sizeof(char16_t);
    uint64_t h = zrTextHashSeed() ^ 0x9e3779b97f4a7c15ull ^ n;
    for (; n >= 8; p += 8, n -= 8) {
        uint64_t word;
        std::memcpy(&word, p, 8);
        h = (h ^ word) * kMul;
        h ^= h >> 31;
    }
    if (n != 0) {
        uint64_t word = 0;
        std::memcpy(&word, p, n);
        h = (h ^ word) * kMul;
        h ^= h >> 31;
    }
    h *= 0x94d049bb133111ebull;
    return h ^ (h >> 32);
}

// Linear probing for the open-addressing tables of names and positions. Each Slot
// has a `hash` and says whether it is free(); a table's size is a power of two and
// always has a free slot.
template <class Slot> void zrPlaceSlot(std::vector<Slot>& slots, Slot&& slot) {
    const size_t mask = slots.size() - 1;
    size_t i = size_t(slot.hash) & mask;
    while (!slots[i].free())
        i = (i + 1) & mask;
    slots[i] = std::move(slot);
}

// Moves the held slots into a table of `size` slots.
template <class Slot> void zrRehashSlots(std::vector<Slot>& slots, size_t size) {
    std::vector<Slot> old(size);
    old.swap(slots);
    for (Slot& slot : old) {
        if (!slot.free())
            zrPlaceSlot(slots, std::move(slot));
    }
}

class ZrName {
  public:
    ZrName() noexcept = default;

    ZrName(const ZrName& other) noexcept : rep_(other.rep_) { retain(); }

    ZrName(ZrName&& other) noexcept : rep_(std::exchange(other.rep_, nullptr)) {}

    explicit ZrName(std::u16string_view text) : rep_(make(text)) {}

    ZrName(const char16_t* text)
        : rep_(make(text ? std::u16string_view(text) : std::u16string_view())) {}

    ~ZrName() { release(); }

    ZrName& operator=(const ZrName& other) noexcept {
        ZrName copy(other);
        swap(copy);
        return *this;
    }

    ZrName& operator=(ZrName&& other) noexcept {
        ZrName moved(std::move(other));
        swap(moved);
        return *this;
    }

    ZrName& operator=(std::u16string_view text) { return *this = ZrName(text); }

    ZrName& operator=(const char16_t* text) { return *this = ZrName(text); }

    std::u16string_view view() const noexcept {
        return rep_ ? std::u16string_view(text(rep_), rep_->size) : std::u16string_view();
    }

    // Null-terminated; the empty text when the name is empty.
    const char16_t* c_str() const noexcept { return rep_ ? text(rep_) : u""; }

    bool empty() const noexcept { return rep_ == nullptr; }

    long length() const noexcept { return rep_ ? static_cast<long>(rep_->size) : 0; }

    void clear() noexcept {
        release();
        rep_ = nullptr;
    }

    void swap(ZrName& other) noexcept { std::swap(rep_, other.rep_); }

    // The shared text's address: equal for copies of one name, and for equal names
    // from one pool; null for the empty name.
    const void* identity() const noexcept { return rep_; }

    friend bool operator==(const ZrName& a, const ZrName& b) noexcept {
        return a.rep_ == b.rep_ || a.view() == b.view();
    }

    friend bool operator!=(const ZrName& a, const ZrName& b) noexcept { return !(a == b); }

    friend bool operator==(const ZrName& a, std::u16string_view b) noexcept {
        return a.view() == b;
    }

    friend bool operator!=(const ZrName& a, std::u16string_view b) noexcept {
        return a.view() != b;
    }

    friend bool operator==(const ZrName& a, const char16_t* b) noexcept {
        return a.view() == (b ? std::u16string_view(b) : std::u16string_view());
    }

    friend bool operator!=(const ZrName& a, const char16_t* b) noexcept { return !(a == b); }

  private:
    // The text follows the header in the same block. The count is not atomic: a
    // model belongs to one reader on one thread.
    struct Rep {
        size_t refs;
        size_t size;
    };

    static char16_t* text(Rep* rep) noexcept { return reinterpret_cast<char16_t*>(rep + 1); }

    // The empty text needs no block.
    static Rep* make(std::u16string_view text) {
        if (text.empty())
            return nullptr;
        void* block = ::operator new(sizeof(Rep) + (text.size() + 1) * sizeof(char16_t));
        Rep* rep = new (block) Rep{1, text.size()};
        std::memcpy(ZrName::text(rep), text.data(), text.size() * sizeof(char16_t));
        ZrName::text(rep)[text.size()] = u'\0';
        return rep;
    }

    void retain() noexcept {
        if (rep_)
            ++rep_->refs;
    }

    void release() noexcept {
        if (rep_ && --rep_->refs == 0) {
            rep_->~Rep();
            ::operator delete(rep_);
        }
    }

    Rep* rep_ = nullptr;
};

// One shared copy of each distinct text: names read through a pool cost a lookup
// and no allocation once their text has been seen.
class ZrNamePool {
  public:
    ZrName intern(std::u16string_view text) {
        if (text.empty())
            return ZrName();
        if ((count_ + 1) * 4 > slots_.size() * 3)
            grow();
        const uint64_t hash = zrTextHash(text);
        const size_t mask = slots_.size() - 1;
        for (size_t i = hash & mask;; i = (i + 1) & mask) {
            Slot& slot = slots_[i];
            if (slot.name.empty()) {
                slot.hash = hash;
                slot.name = ZrName(text);
                ++count_;
                return slot.name;
            }
            if (slot.hash == hash && zrSameText(slot.name.view(), text))
                return slot.name;
        }
    }

    // Forgets the texts; names handed out stay valid.
    void clear() {
        slots_.clear();
        count_ = 0;
    }

  private:
    struct Slot {
        uint64_t hash = 0;
        ZrName name; // empty: a free slot

        bool free() const { return name.empty(); }
    };

    void grow() { zrRehashSlots(slots_, slots_.empty() ? 256 : slots_.size() * 2); }

    std::vector<Slot> slots_;
    size_t count_ = 0;
};

// A set of texts stored elsewhere: each text must outlive its place in the set.
// Most sets are small (the field names of one record), so the first few texts sit
// in place and are scanned; a table is built only once a set outgrows them, and
// clear() keeps what was allocated, so a set used again allocates nothing.
class ZrTextSet {
  public:
    bool contains(std::u16string_view text) const { return find(text, zrTextHash(text)); }

    void insert(std::u16string_view text) {
        const uint64_t hash = zrTextHash(text);
        if (find(text, hash))
            return;
        const Slot slot{hash, text.data() ? text.data() : u"", text.size()};
        if (count_ < kInPlace) {
            inPlace_[count_++] = slot;
            return;
        }
        if (slots_.empty()) {
            slots_.resize(4 * kInPlace);
            for (Slot held : inPlace_)
                zrPlaceSlot(slots_, std::move(held));
        } else if ((count_ + 1) * 4 > slots_.size() * 3) {
            zrRehashSlots(slots_, slots_.size() * 2);
        }
        zrPlaceSlot(slots_, Slot(slot));
        ++count_;
    }

    void clear() {
        count_ = 0;
        slots_.clear();
    }

  private:
    struct Slot {
        uint64_t hash = 0;
        const char16_t* data = nullptr; // null: a free slot
        size_t size = 0;

        bool free() const { return data == nullptr; }
    };

    static constexpr size_t kInPlace = 8;

    static bool holds(const Slot& slot, uint64_t hash, std::u16string_view text) {
        return slot.hash == hash && zrSameText(std::u16string_view(slot.data, slot.size), text);
    }

    bool find(std::u16string_view text, uint64_t hash) const {
        if (slots_.empty()) {
            for (size_t i = 0; i < count_; ++i) {
                if (holds(inPlace_[i], hash, text))
                    return true;
            }
            return false;
        }
        const size_t mask = slots_.size() - 1;
        for (size_t i = hash & mask;; i = (i + 1) & mask) {
            const Slot& slot = slots_[i];
            if (!slot.data)
                return false;
            if (holds(slot, hash, text))
                return true;
        }
    }

    Slot inPlace_[kInPlace];
    std::vector<Slot> slots_; // empty while the texts fit in place
    size_t count_ = 0;
};
