/// LoaderFrontEnd: the common part of MKBitmapLoader and BitmapLoader. A front end requests loads and saves,
/// identified by numbers that the caller chooses, and passes the results to callback functions.
/// Owner:   the caller. There may be any number of front ends. The one loader of the process handles all
///          requests in order.
/// Thread:  requests, cancels, waits and destruction on any thread. The callback functions run on the
///          loader's thread, without a lock. They may request, cancel, and destroy other front ends. They
///          must not wait, and must not destroy their own front end.
/// Loop:    start the loader once in a process, with startEventLoop or startEventLoopBySelf. Earlier requests
/// wait. Results: each request that was accepted and not cancelled calls back once. An exception of a
/// callback function is
///          logged as an error.
/// Units:   sizes in pixels; RGBA8, premultiplied.
/// Fails:   a refused request returns false and calls nobody. If a file cannot be read or written,
///          onLoadError or onSaveError is called.
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
    /// The callback functions. Each may be empty. path is that of the request.
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

    /// Requests a load, in the file's own size, or scaled to width x height if neither is 0. A GPU bitmap is
    /// created on queue; the deletion of a CPU bitmap is posted to it. Returns false while a load of this id
    /// is waiting or being decoded, and if memory runs out.
    bool RequestLoad(int id, String const& path, IGLMsgQueue* queue);
    bool RequestLoad(int id, String const& path, IGLMsgQueue* queue, int width, int height);

    /// Cancel one load, or all of this front end. A load that waits or is being decoded never calls back, and
    /// its id can be used again. If OnCallbackPending was called already, the load still calls back;
    /// WaitForCallback() then waits until that is over.
    void CancelLoadRequest(int id);
    void CancelAllLoadRequest();

    /// Saves pixels, rows packed, and takes ownership of buffer, which must come from `new unsigned char[]`.
    /// The path's extension selects the format; quality is that of the encoder, 0 ... 100. Returns false, and
    /// does not take ownership, if buffer is null or memory runs out.
    bool RequestSave(int id, String const& path, unsigned char* buffer, int width, int height, void* userData,
                     int quality);

    /// Makes the calling thread the loader's thread. Never returns.
    [[noreturn]] static void startEventLoop();
    /// Starts the loader's thread; further calls do nothing and return true. Returns false if the system
    /// cannot create a thread.
    static bool startEventLoopBySelf();

    /// Waits until no load is being processed.
    static void WaitUntilMsgQueueRequired();
    /// Waits until all files are written and all queued loads are done. queue is that of the saved bitmaps,
    /// or null. Do not call it on the render thread.
    static void WaitForAllSaveRequestsToEnd(IGLMsgQueue* queue);
    /// Waits until none of this front end's callback functions is running.
    void WaitForCallback();

    /// See BitmapLoaderInterface.
    using BitmapLoaderInterface::OnLoad;
    using BitmapLoaderInterface::OnLoadList;
    /// Call the callback function of the same name.
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

    /// Drops the loads, makes the saves call nobody, and waits for a running callback function. Derived
    /// classes call it first in their destructors.
    void Detach();

    /// Logs a save request and returns isAccepted. source is the bitmap or the buffer.
    bool LogSave(String const& path, void const* source, bool isAccepted) const;

private:
    template <class... Values>
    void Print(char const* format, Values... values) const;

    char const* const mName; // owned by the caller; if it is null, the lines that contain it are not logged
    Callback mCallback;
    CriticalSection mLock{true}; // guards mCallbackPending
    ConditionalVariable mCondition;
    bool mCallbackPending = false; // true from OnCallbackPending to OnCallbackCompleted
};

} // namespace detail
} // namespace Moka
