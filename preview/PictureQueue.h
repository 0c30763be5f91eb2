// The decoded pictures of the thumbnails: what a picture is keyed by, the order in which the loader's
// workers read them, and the cache that keeps them, bounded in bytes. Portable: no <windows.h>; the
// loader (PictureLoaderWin) locks around them.
#pragma once

#include <cstddef>
#include <cstdint>
#include <list>
#include <map>
#include <set>
#include <string>
#include <tuple>
#include <vector>

// One picture of one drawing at one size: a drawing changed on disk (another size or write time) or a
// thumbnail of another size is another picture.
struct PictureKey {
    std::string path; // full path, as the scan spelled it
    std::uint32_t fileSize = 0;
    std::int64_t writeTime = 0;
    int width = 0; // the picture area in pixels
    int height = 0;
    std::uint32_t background = 0; // 0x00BBGGRR behind the picture

    bool operator<(const PictureKey& other) const {
        return std::tie(path, fileSize, writeTime, width, height, background) <
               std::tie(other.path, other.fileSize, other.writeTime, other.width, other.height,
                        other.background);
    }
    bool operator==(const PictureKey& other) const { return !(*this < other) && !(other < *this); }
};

enum class PictureState {
    Drawn,     // pixels hold the picture, placed and scaled in the area on the background
    NoPreview, // the file has no preview: pixels hold the background and the no-preview mark
    HostDraws, // the file holds a picture the library cannot decode: the host's operation draws it
};

struct Picture {
    PictureState state = PictureState::NoPreview;
    int width = 0;
    int height = 0;
    std::vector<std::uint32_t> pixels; // width x height, top row first, 0x00RRGGBB
};

// Which list indexes want their pictures, in the order they should be read: the visible cells top to
// bottom, then as many cells ahead in the direction of the last scroll (down: the cells after, up: the
// cells before, nearest first). Indexes outside [0, total) are left out.
std::vector<int> PictureOrder(int firstVisible, int visibleCount, int aheadCount, int direction, int total);

// The reads waiting for a worker and those a worker has taken. Replacing the wanted list drops every
// waiting read it no longer names (its cell left the screen before its read began); a read taken goes on
// to its end, and its picture is kept.
class PictureQueue {
public:
    // The reads wanted now, in order. Keys already taken are not queued again.
    void Want(const std::vector<PictureKey>& ordered);
    // The next read, taken by a worker; false when none waits.
    bool Take(PictureKey& key);
    // A taken read has ended.
    void Finished(const PictureKey& key);
    // Whether the key waits or is being read.
    bool Knows(const PictureKey& key) const;
    std::size_t Waiting() const { return m_waiting.size(); }
    std::size_t Taken() const { return m_taken.size(); }
    // Reads dropped by Want since the queue was made.
    std::size_t Dropped() const { return m_dropped; }
    void Clear();

private:
    std::list<PictureKey> m_waiting;
    std::map<PictureKey, int>
        m_taken; // a key read by more than one worker never happens; a count all the same
    std::size_t m_dropped = 0;
};

// Decoded pictures, the least recently used dropped first when the bytes they hold pass the bound. The
// picture put last and the pinned ones (those the screen shows) are always kept, whatever their size: a
// picture on the screen dropped would be read again as soon as its thumbnail repainted, for ever.
class PictureCache {
public:
    explicit PictureCache(std::size_t boundBytes) : m_bound(boundBytes) {}
    // The picture, or nullptr; a hit makes it the most recently used.
    const Picture* Find(const PictureKey& key);
    void Put(const PictureKey& key, Picture picture);
    // The pictures that must stay (replaces the pinned set); nothing is dropped until the next Put.
    void Pin(const std::vector<PictureKey>& keys);
    std::size_t Bytes() const { return m_bytes; }
    std::size_t Count() const { return m_entries.size(); }
    std::size_t Bound() const { return m_bound; }
    // What an entry counts against the bound.
    static std::size_t CostOf(const PictureKey& key, const Picture& picture);

private:
    struct Entry {
        Picture picture;
        std::list<PictureKey>::iterator use;
        std::size_t cost = 0;
    };
    void Evict(const PictureKey& keep);

    std::size_t m_bound;
    std::size_t m_bytes = 0;
    std::map<PictureKey, Entry> m_entries;
    std::list<PictureKey> m_uses; // most recently used first
    std::set<PictureKey> m_pinned;
};

// The cache's bound when the settings do not give one: 64 MiB.
constexpr std::size_t kDefaultPictureCacheBytes = std::size_t{64} << 20;
