#include "preview/PictureLoader.h"

#include "hostapi/TextConv.h"
#include "preview/DrawPreview.h"
#include "preview/DwgPreview.h"

#include <algorithm>
#include <cstring>
#include <utility>

extern "C" IMAGE_DOS_HEADER __ImageBase;

namespace {

// Posted by a worker to the loader's window: pictures are waiting in the shared state.
constexpr UINT kPicturesFinished = WM_USER + 1;
const wchar_t kWindowClass[] = L"Orvex1PictureLoader";

// Pictures larger than this are not drawn in memory (a thumbnail never is).
constexpr long long kMaxPicturePixels = 4096LL * 4096LL;

class ExclusiveLock {
public:
    explicit ExclusiveLock(SRWLOCK& lock) : m_lock(lock) { AcquireSRWLockExclusive(&m_lock); }
    ExclusiveLock(const ExclusiveLock&) = delete;
    ExclusiveLock& operator=(const ExclusiveLock&) = delete;
    ~ExclusiveLock() { ReleaseSRWLockExclusive(&m_lock); }

private:
    SRWLOCK& m_lock;
};

BITMAPINFO TopDownInfo(int width, int height) {
    BITMAPINFO info{};
    info.bmiHeader.biSize = sizeof(BITMAPINFOHEADER);
    info.bmiHeader.biWidth = width;
    info.bmiHeader.biHeight = -height;
    info.bmiHeader.biPlanes = 1;
    info.bmiHeader.biBitCount = 32;
    info.bmiHeader.biCompression = BI_RGB;
    return info;
}

// Draws into a DIB section the size of the picture and keeps its pixels; the GDI objects go at once.
bool DrawInMemory(Picture& picture, const DwgPreview* preview, COLORREF background) {
    HDC dc = CreateCompatibleDC(nullptr);
    if (!dc)
        return false;
    const BITMAPINFO info = TopDownInfo(picture.width, picture.height);
    void* bits = nullptr;
    HBITMAP bitmap = CreateDIBSection(dc, &info, DIB_RGB_COLORS, &bits, nullptr, 0);
    bool drawn = false;
    if (bitmap && bits) {
        HGDIOBJ old = SelectObject(dc, bitmap);
        const RECT area{0, 0, picture.width, picture.height};
        drawn = DrawDwgPreviewImage(dc, area, preview ? *preview : DwgPreview(), background);
        GdiFlush();
        const std::size_t count = static_cast<std::size_t>(picture.width) * picture.height;
        picture.pixels.assign(static_cast<const std::uint32_t*>(bits),
                              static_cast<const std::uint32_t*>(bits) + count);
        SelectObject(dc, old);
    }
    if (bitmap)
        DeleteObject(bitmap);
    DeleteDC(dc);
    return drawn;
}

} // namespace

Picture DecodePicture(const PictureKey& key) {
    Picture picture;
    picture.state = PictureState::NoPreview;
    try {
        if (key.width <= 0 || key.height <= 0 ||
            static_cast<long long>(key.width) * key.height > kMaxPicturePixels)
            return picture;
        picture.width = key.width;
        picture.height = key.height;
        // The same checks before decoding as the host's drawing: the reader's limits, then the picture's
        // own measure against the section's.
        DwgPreview preview;
        const bool read = ReadDwgPreview(WidenAnsi(key.path), preview);
        const COLORREF background = static_cast<COLORREF>(key.background);
        const bool drawn = DrawInMemory(picture, read ? &preview : nullptr, background);
        if (read && !drawn)
            picture.state = PictureState::HostDraws; // a picture this library cannot draw: the host may
        else
            picture.state = drawn ? PictureState::Drawn : PictureState::NoPreview;
    } catch (...) {
        picture.pixels.clear();
        picture.state = PictureState::NoPreview;
    }
    return picture;
}

bool PaintPicture(HDC dc, const Picture& picture) {
    if (picture.width <= 0 || picture.height <= 0 ||
        picture.pixels.size() != static_cast<std::size_t>(picture.width) * picture.height)
        return false;
    const BITMAPINFO info = TopDownInfo(picture.width, picture.height);
    return SetDIBitsToDevice(dc, 0, 0, static_cast<DWORD>(picture.width), static_cast<DWORD>(picture.height),
                             0, 0, 0, static_cast<UINT>(picture.height), picture.pixels.data(), &info,
                             DIB_RGB_COLORS) > 0;
}

void PaintLoading(HDC dc, const RECT& area, COLORREF background) {
    HBRUSH brush = CreateSolidBrush(background);
    if (!brush)
        return;
    FillRect(dc, &area, brush);
    DeleteObject(brush);
}

// ---- the state the loader shares with its workers ---------------------------------------------------

struct PictureLoader::Shared {
    SRWLOCK lock = SRWLOCK_INIT;
    CONDITION_VARIABLE wake = CONDITION_VARIABLE_INIT;
    PictureQueue queue;
    std::vector<std::pair<PictureKey, Picture>> finished;
    HWND window = nullptr; // cleared when the loader goes: nothing is posted after
    PictureLoader::Decoder decode = &DecodePicture;
    bool stop = false;
    std::size_t readsBegun = 0;
    volatile LONG references = 1; // the loader's

    void AddReference() { InterlockedIncrement(&references); }
    void Release() {
        if (InterlockedDecrement(&references) == 0)
            delete this;
    }
};

namespace {

struct WorkerStart {
    PictureLoader::Shared* shared;
    HMODULE module;
};

// One worker: takes the next wanted read, decodes it, hands the picture over, until the loader ends.
void Serve(PictureLoader::Shared& shared) {
    for (;;) {
        PictureKey key;
        {
            ExclusiveLock hold(shared.lock);
            while (!shared.stop && !shared.queue.Take(key))
                SleepConditionVariableSRW(&shared.wake, &shared.lock, INFINITE, 0);
            if (shared.stop)
                return;
            ++shared.readsBegun;
        }
        Picture picture;
        try {
            picture = shared.decode(key);
        } catch (...) {
            picture = Picture(); // DecodePicture never throws; a stand-in might
        }
        ExclusiveLock hold(shared.lock);
        shared.queue.Finished(key);
        if (shared.stop || !shared.window)
            return;
        shared.finished.emplace_back(std::move(key), std::move(picture));
        // Posted under the lock: the loader clears the window under it before destroying it.
        PostMessageW(shared.window, kPicturesFinished, 0, 0);
    }
}

DWORD WINAPI Work(void* parameter) {
    const WorkerStart start = *static_cast<WorkerStart*>(parameter);
    delete static_cast<WorkerStart*>(parameter);
    try {
        Serve(*start.shared);
    } catch (...) {
        // Out of memory in a worker: this worker ends; the host never hears of it.
    }
    start.shared->Release();
    FreeLibraryAndExitThread(start.module, 0);
}

} // namespace

// ---- the loader -------------------------------------------------------------------------------------

PictureLoader::PictureLoader(std::size_t cacheBytes, Decoder decode, int workers)
    : m_shared(new Shared), m_cache(cacheBytes), m_nWorkers(workers > 0 ? workers : 1) {
    if (decode)
        m_shared->decode = decode;
    const HINSTANCE instance = reinterpret_cast<HINSTANCE>(&__ImageBase);
    WNDCLASSEXW windowClass{};
    windowClass.cbSize = sizeof windowClass;
    if (!GetClassInfoExW(instance, kWindowClass, &windowClass)) {
        windowClass = WNDCLASSEXW{};
        windowClass.cbSize = sizeof windowClass;
        windowClass.lpfnWndProc = &PictureLoader::WindowProc;
        windowClass.hInstance = instance;
        windowClass.lpszClassName = kWindowClass;
        RegisterClassExW(&windowClass);
    }
    m_window = CreateWindowExW(0, kWindowClass, L"", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, instance, nullptr);
    if (m_window)
        SetWindowLongPtrW(m_window, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(this));
    m_shared->window = m_window;
}

PictureLoader::~PictureLoader() {
    {
        ExclusiveLock hold(m_shared->lock);
        m_shared->stop = true;
        m_shared->window = nullptr;
        m_shared->queue.Clear();
        m_shared->finished.clear();
    }
    WakeAllConditionVariable(&m_shared->wake);
    if (m_window) {
        SetWindowLongPtrW(m_window, GWLP_USERDATA, 0);
        DestroyWindow(m_window);
        UnregisterClassW(kWindowClass, reinterpret_cast<HINSTANCE>(&__ImageBase));
    }
    // A worker in a read that does not return (a share that stopped answering) is left to end by itself,
    // holding its own references: the host's call does not wait for it.
    if (!m_threads.empty())
        WaitForMultipleObjects(static_cast<DWORD>(m_threads.size()), m_threads.data(), TRUE, kEndWaitMs);
    for (HANDLE thread : m_threads)
        CloseHandle(thread);
    m_shared->Release();
}

void PictureLoader::StartWorkers() {
    while (static_cast<int>(m_threads.size()) < m_nWorkers) {
        HMODULE module = nullptr;
        if (!GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS,
                                reinterpret_cast<LPCWSTR>(reinterpret_cast<void*>(&Work)), &module))
            return;
        auto* start = new WorkerStart{m_shared, module};
        m_shared->AddReference();
        HANDLE thread = CreateThread(nullptr, 0, &Work, start, 0, nullptr);
        if (!thread) {
            delete start;
            m_shared->Release();
            FreeLibrary(module);
            return;
        }
        m_threads.push_back(thread);
    }
}

const Picture* PictureLoader::Find(const PictureKey& key) {
    return m_cache.Find(key);
}

bool PictureLoader::Knows(const PictureKey& key) const {
    ExclusiveLock hold(m_shared->lock);
    return m_shared->queue.Knows(key);
}

void PictureLoader::Want(const std::vector<PictureKey>& ordered, std::size_t shown) {
    m_cache.Pin(std::vector<PictureKey>(ordered.begin(), ordered.begin() + std::min(shown, ordered.size())));
    std::vector<PictureKey> missing;
    missing.reserve(ordered.size());
    for (const PictureKey& key : ordered)
        if (!m_cache.Find(key))
            missing.push_back(key);
    {
        ExclusiveLock hold(m_shared->lock);
        m_shared->queue.Want(missing);
    }
    if (!missing.empty()) {
        StartWorkers();
        WakeAllConditionVariable(&m_shared->wake);
    }
}

std::size_t PictureLoader::ReadsBegun() const {
    ExclusiveLock hold(m_shared->lock);
    return m_shared->readsBegun;
}

void PictureLoader::TakeFinished() {
    std::vector<std::pair<PictureKey, Picture>> finished;
    {
        ExclusiveLock hold(m_shared->lock);
        finished.swap(m_shared->finished);
    }
    for (auto& [key, picture] : finished) {
        m_cache.Put(key, std::move(picture));
        if (onPictureReady)
            onPictureReady(key);
    }
}

LRESULT CALLBACK PictureLoader::WindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == kPicturesFinished) {
        auto* loader = reinterpret_cast<PictureLoader*>(GetWindowLongPtrW(window, GWLP_USERDATA));
        try {
            if (loader)
                loader->TakeFinished();
        } catch (...) {
            // Out of memory keeping a picture: its thumbnail stays in the loading state.
        }
        return 0;
    }
    return DefWindowProcW(window, message, wParam, lParam);
}
