/// LoaderFrontEnd: the common part of MKBitmapLoader and BitmapLoader. A front end asks for loads and saves
/// under numbers of the caller's choice and hands the results to the functions it was given.
/// Owner:   the caller; any number of them, all served by the one loader of the process, in the order of the
///          requests.
/// Thread:  requests, cancels, waits and destruction from any; the functions run on the loader's thread, with
///          no lock held. They may request, cancel and destroy other front ends. They may not wait, nor
///          destroy the front end that is calling.
/// Loop:    start it once in a process, by one of the two ways, which are alternatives. Requests made before
///          wait for it.
/// Results: each request that was accepted, and not cancelled, calls back once. An exception out of a
///          function is one error line.
/// Units:   sizes in pixels; RGBA8, premultiplied.
/// Fails:   a refused request is false and calls nobody; a file that cannot be read or written is onLoadError
///          or onSaveError.
#pragma once

#include "moka/base/ConditionalVariable.h"
#include "moka/base/CriticalSection.h"
#include "moka/base/NonAssignable.h"
#include "moka/base/String.h"
#include "moka/graphics/loader/BitmapLoaderInterface.h"

#include <functional>
#include <vector>

namespace Moka {

class IGLMsgQueue;

namespace detail {

template <class BitmapT>
class LoaderFrontEnd : public BitmapLoaderInterface, NonAssignable {
public:
    /// Each may be empty. path is the one of the request.
    struct Callback {
        /// A loaded bitmap.
        std::function<void(int id, String const& path, BitmapT& bitmap)> onLoad;
        /// Never called by the loader.
        std::function<void(int id, String const& path, std::vector<BitmapT*>& bitmaps)> onLoadList;
        /// The file could not be read; the log says why.
        std::function<void(int id, String const& path)> onLoadError;
        /// The file is complete on the disk.
        std::function<void(int id, String const& path, void* userData)> onSave;
        /// The file could not be written; the log says why.
        std::function<void(int id, String const& path, void* userData)> onSaveError;
    };

    /// False while a load of this id is waiting or being decoded, and when memory runs out. Without a size,
    /// or when one side is 0, the file's own. queue is where the result goes.
    bool RequestLoad(int id, String const& path, IGLMsgQueue* queue);
    bool RequestLoad(int id, String const& path, IGLMsgQueue* queue, int width, int height);

    /// A load that waits or is being decoded never calls back; its id is free again. One whose
    /// OnCallbackPending was called still calls back: after a cancel, WaitForCallback() returns when that is
    /// over.
    void CancelLoadRequest(int id);
    void CancelAllLoadRequest();

    /// Saves pixels, rows packed, in a `new unsigned char[]` that belongs to the loader from here on. The
    /// path's extension chooses the format; quality is the encoder's, 0 ... 100. False, with the buffer still
    /// the caller's, when it is null or memory runs out.
    bool RequestSave(int id, String const& path, unsigned char* buffer, int width, int height, void* userData,
                     int quality);

    /// Makes the calling thread the loader's.
    [[noreturn]] static void startEventLoop();
    /// Starts the loader's own thread; further calls return true. False if the system has no more threads.
    static bool startEventLoopBySelf();

    /// Returns when no load is being processed.
    static void WaitUntilMsgQueueRequired();
    /// Returns when every file has been written; loads that are queued are waited for as well. queue is the
    /// one of the bitmaps that are being saved, or null. Never from the render thread.
    static void WaitForAllSaveRequestsToEnd(IGLMsgQueue* queue);
    /// Returns when none of this front end's functions is running.
    void WaitForCallback();

    /// As BitmapLoaderInterface.
    using BitmapLoaderInterface::OnLoad;
    using BitmapLoaderInterface::OnLoadList;
    /// Call the function of the same name.
    void OnLoad(int id, String const& path, BitmapT& bitmap) override;
    void OnLoadList(int id, String const& path, std::vector<BitmapT*>& bitmaps) override;
    void OnLoadError(int id, String const& path) override;
    void OnSave(int id, String const& path, void* userData) override;
    void OnSaveError(int id, String const& path, void* userData) override;
    void OnCallbackPending() override;
    void OnCallbackCompleted() override;

protected:
    /// name is not copied; callback is.
    LoaderFrontEnd(char const* name, Callback* callback);
    ~LoaderFrontEnd() override = default;

    /// First in the destructor of the class that is called back: drops the loads, lets the saves go on
    /// without it, and waits for a function that is running.
    void Detach();

    /// Logs and returns what became of a save; source is the bitmap, or the buffer.
    bool LogSave(String const& path, void const* source, bool isAccepted) const;

private:
    template <class... Values>
    void Print(char const* format, Values... values) const;

    char const* const mName; // the caller's; null silences the lines that would carry it
    Callback mCallback;
    CriticalSection mLock{true}; // guards mCallbackPending
    ConditionalVariable mCondition;
    bool mCallbackPending = false; // the loader's thread is between pending and completed
};

} // namespace detail
} // namespace Moka
