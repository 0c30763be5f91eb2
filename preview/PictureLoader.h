// The loader of the thumbnails' pictures: worker threads read each drawing's preview with the library's
// own reader and turn it into pixels in memory, off the user-interface thread, where the host's work
// waits. Results come back through a message to a window the loader owns, on the thread that made the
// loader; the cache of decoded pictures lives on that thread only (Windows build only).
//
// Lifetime: the loader's thread makes and destroys it. Each worker holds its own reference on the
// library (it ends through FreeLibraryAndExitThread) and on the state it shares with the loader, so a
// worker still in a read when the loader goes (a share that stopped answering) neither holds the
// loader's end nor runs code that was unloaded; its picture is thrown away.
#pragma once

#include "preview/PictureQueue.h"

#include <windows.h>

#include <cstddef>
#include <functional>
#include <vector>

class PictureLoader {
public:
    // Reads in flight at most: on a share the wait is the network's, not the processor's.
    static constexpr int kWorkers = 4;
    // How long the loader's end waits for the workers before it leaves them to end on their own.
    static constexpr DWORD kEndWaitMs = 100;

    // What a worker does with a key: DecodePicture, or a test's stand-in. Called on the workers.
    using Decoder = Picture (*)(const PictureKey& key);

    explicit PictureLoader(std::size_t cacheBytes, Decoder decode = nullptr, int workers = kWorkers);
    PictureLoader(const PictureLoader&) = delete;
    PictureLoader& operator=(const PictureLoader&) = delete;
    ~PictureLoader();

    // Told on the loader's thread when a picture has arrived in the cache.
    std::function<void(const PictureKey&)> onPictureReady;

    // The decoded picture, or nullptr while it is not there.
    const Picture* Find(const PictureKey& key);
    // Whether the key waits for a worker or is being read.
    bool Knows(const PictureKey& key) const;
    // The pictures wanted now, in the order to read them; waiting reads not named are dropped, and
    // pictures already in the cache are not read again. The first `shown` of them are on the screen:
    // the cache keeps them whatever its bound.
    void Want(const std::vector<PictureKey>& ordered, std::size_t shown = 0);
    // Reads begun since the loader was made (the benchmarks' files read).
    std::size_t ReadsBegun() const;
    // Workers started (threads made), for the tests.
    int WorkersStarted() const { return static_cast<int>(m_threads.size()); }
    const PictureCache& Cache() const { return m_cache; }

    // Moves the pictures the workers finished into the cache and tells onPictureReady (the message
    // handler does it; a test without a message loop may call it).
    void TakeFinished();

    // The state the loader shares with its workers (PictureLoaderWin.cpp).
    struct Shared;

private:
    void StartWorkers();
    static LRESULT CALLBACK WindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam);

    Shared* m_shared; // shared with the workers, freed by whoever lets go of it last
    HWND m_window = nullptr;
    PictureCache m_cache;
    int m_nWorkers;
    std::vector<HANDLE> m_threads;
};

// Reads the drawing's preview and draws it in memory at the key's size, placed and scaled as the host's
// preview operation draws it, on the key's background. Never throws; any thread.
Picture DecodePicture(const PictureKey& key);

// Paints a decoded picture (Drawn or NoPreview) at the top left of dc.
bool PaintPicture(HDC dc, const Picture& picture);
// The quiet state while a picture loads: the background alone, no mark.
void PaintLoading(HDC dc, const RECT& area, COLORREF background);
