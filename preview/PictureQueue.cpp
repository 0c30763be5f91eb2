#include "preview/PictureQueue.h"

#include <set>
#include <utility>

std::vector<int> PictureOrder(int firstVisible, int visibleCount, int aheadCount, int direction, int total) {
    std::vector<int> order;
    if (total <= 0)
        return order;
    const auto add = [&](long long index) {
        if (index >= 0 && index < total)
            order.push_back(static_cast<int>(index));
    };
    const long long first = firstVisible;
    for (long long i = 0; i < visibleCount; ++i)
        add(first + i);
    for (long long i = 0; i < aheadCount; ++i)
        add(direction < 0 ? first - 1 - i : first + visibleCount + i);
    return order;
}

void PictureQueue::Want(const std::vector<PictureKey>& ordered) {
    std::set<PictureKey> kept;
    std::list<PictureKey> waiting;
    for (const PictureKey& key : ordered) {
        if (m_taken.count(key) || !kept.insert(key).second)
            continue;
        waiting.push_back(key);
    }
    for (const PictureKey& key : m_waiting)
        if (!kept.count(key))
            ++m_dropped;
    m_waiting.swap(waiting);
}

bool PictureQueue::Take(PictureKey& key) {
    if (m_waiting.empty())
        return false;
    key = std::move(m_waiting.front());
    m_waiting.pop_front();
    ++m_taken[key];
    return true;
}

void PictureQueue::Finished(const PictureKey& key) {
    const auto found = m_taken.find(key);
    if (found != m_taken.end() && --found->second <= 0)
        m_taken.erase(found);
}

bool PictureQueue::Knows(const PictureKey& key) const {
    if (m_taken.count(key))
        return true;
    for (const PictureKey& waiting : m_waiting)
        if (waiting == key)
            return true;
    return false;
}

void PictureQueue::Clear() {
    m_dropped += m_waiting.size();
    m_waiting.clear();
}

std::size_t PictureCache::CostOf(const PictureKey& key, const Picture& picture) {
    // The pixels, the path kept twice (the map's key and the use list) and the bookkeeping around them.
    return picture.pixels.size() * sizeof(std::uint32_t) + 2 * key.path.size() + 160;
}

const Picture* PictureCache::Find(const PictureKey& key) {
    const auto found = m_entries.find(key);
    if (found == m_entries.end())
        return nullptr;
    m_uses.splice(m_uses.begin(), m_uses, found->second.use);
    return &found->second.picture;
}

void PictureCache::Put(const PictureKey& key, Picture picture) {
    const std::size_t cost = CostOf(key, picture);
    const auto found = m_entries.find(key);
    if (found != m_entries.end()) {
        m_bytes -= found->second.cost;
        found->second.picture = std::move(picture);
        found->second.cost = cost;
        m_uses.splice(m_uses.begin(), m_uses, found->second.use);
    } else {
        m_uses.push_front(key);
        Entry entry;
        entry.picture = std::move(picture);
        entry.use = m_uses.begin();
        entry.cost = cost;
        m_entries.emplace(key, std::move(entry));
    }
    m_bytes += cost;
    Evict(key);
}

void PictureCache::Pin(const std::vector<PictureKey>& keys) {
    m_pinned = std::set<PictureKey>(keys.begin(), keys.end());
}

void PictureCache::Evict(const PictureKey& keep) {
    // From the least recently used up, past the pictures that must stay.
    auto use = m_uses.end();
    while (m_bytes > m_bound && use != m_uses.begin()) {
        --use;
        if (*use == keep || m_pinned.count(*use))
            continue;
        const auto found = m_entries.find(*use);
        m_bytes -= found->second.cost;
        m_entries.erase(found);
        use = m_uses.erase(use);
    }
}
