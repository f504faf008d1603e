#include "apps/moka/Batch.h"

#include "apps/moka/Arguments.h"
#include "apps/moka/Failure.h"
#include "apps/moka/Interruption.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
#include "moka/base/Handler.h"
#include "moka/base/MessageLoop.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "moka/graphics/loader/MKBitmapSaveManager.h"
#include "moka/host/RenderThread.h"

#include <atomic>
#include <chrono>
#include <memory>
#include <mutex>
#include <new>
#include <optional>
#include <unistd.h>
#include <utility>

namespace Moka::Tool {
namespace {

enum class News { None, Loaded, NotLoaded, Saved, NotSaved };

struct Job {
    // What the other threads tell, under the batch's lock.
    News news = News::None;
    RefPtr<IMKBitmap> bitmap;

    std::optional<Interruption::Saving> saving; // from the request to its result
    std::string gpuError;                       // of the reading back
    std::string error;
};

class Batch {
public:
    Batch(BatchRequest const& request, ConversionEnvironment const& env);
    ~Batch() { mEnv.interruption.SetLastWords({}); }
    Batch(Batch const&) = delete;
    Batch& operator=(Batch const&) = delete;
    BatchResult Run();

private:
    static void OnNews(Handler*, void* batch, int);
    static void OnSaved(void* batch, String const*, void* job);
    static void OnSaveFailed(void* batch, String const*, void* job);
    MKBitmapLoader::Callback MakeCallback();

    void Tell(Job& job, News news);
    std::vector<Job*> TakeTold();
    void Drive();
    std::string TellCount() const;
    void StartNext();
    void Start(Job& job);
    void GoOn(Job& job);
    void Save(Job& job);
    void CheckSaved(Job& job);
    void FailJob(Job& job, std::string const& error);
    void Finish(Job& job);

    BatchFile const& FileOf(Job const& job) const {
        return mRequest.files[static_cast<std::size_t>(&job - mJobs.data())];
    }
    int IdOf(Job const& job) const { return static_cast<int>(&job - mJobs.data()); }

    BatchRequest const& mRequest;
    ConversionEnvironment const& mEnv;
    std::vector<Job> mJobs; // one for each file
    std::size_t mNext = 0;
    int mInFlight = 0;
    int mDone = 0;
    std::atomic<int> mConverted{0};

    std::mutex mMutex;
    std::vector<Job*> mTold; // those with news, in their order; room for all, so that telling never fails

    MessageLoop mLoop;
    Handler mHandler{OnNews, this};
    std::unique_ptr<RenderThread> mQueue;
    std::thread::id mRenderThread;
    MKBitmapSaveManager mSaveManager;
    std::optional<MKBitmapLoader> mLoader; // goes first: what it still calls needs the rest
};

Batch::Batch(BatchRequest const& request, ConversionEnvironment const& env)
    : mRequest(request), mEnv(env), mJobs(request.files.size()) {
    mTold.reserve(static_cast<std::size_t>(request.inFlight));
}

MKBitmapLoader::Callback Batch::MakeCallback() {
    MKBitmapLoader::Callback callback;
    callback.onLoad = [this](int id, String const&, IMKBitmap& bitmap) {
        Job& job = mJobs[static_cast<std::size_t>(id)];
        job.bitmap = RefPtr<IMKBitmap>::Share(&bitmap);
        Tell(job, News::Loaded);
    };
    callback.onLoadError = [this](int id, String const&) {
        Tell(mJobs[static_cast<std::size_t>(id)], News::NotLoaded);
    };
    return callback;
}

BatchResult Batch::Run() {
    auto const start = std::chrono::steady_clock::now();
    mQueue = StartQueue(mRequest.options, mEnv);
    MakeFolder(mRequest.folder);
    mQueue->Call([this] { mRenderThread = std::this_thread::get_id(); });
    if (!MKBitmapLoader::startEventLoopBySelf()) throw Failure("not enough memory for the loader's thread");
    MKBitmapLoader::Callback callback = MakeCallback();
    mLoader.emplace("moka", &callback);
    mEnv.interruption.SetLastWords([this] { return "interrupted; " + TellCount(); });
    Drive();

    BatchResult result;
    for (Job& job : mJobs)
        if (!job.error.empty()) result.errors.push_back(std::move(job.error));
    if (mConverted == 0) rmdir(mRequest.folder.c_str()); // what is not empty stays
    result.seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    return result;
}

std::string Batch::TellCount() const {
    return std::to_string(mConverted) + " of " + std::to_string(mJobs.size()) + " images are in " +
           mRequest.folder;
}

void Batch::Drive() {
    mEnv.progress.SetCount(0, static_cast<int>(mJobs.size()));
    StartNext();
    if (mInFlight > 0) mLoop.Run();
}

// On the loader's thread, or, of a save's result, on the driving one with the save manager's lock held.
void Batch::Tell(Job& job, News news) {
    {
        std::lock_guard const lock(mMutex);
        job.news = news;
        mTold.push_back(&job);
    }
    mHandler.SendMessage();
}

void Batch::OnSaved(void* batch, String const*, void* job) {
    static_cast<Batch*>(batch)->Tell(*static_cast<Job*>(job), News::Saved);
}

void Batch::OnSaveFailed(void* batch, String const*, void* job) {
    static_cast<Batch*>(batch)->Tell(*static_cast<Job*>(job), News::NotSaved);
}

void Batch::OnNews(Handler*, void* batch, int) {
    auto& self = *static_cast<Batch*>(batch);
    for (Job* const job : self.TakeTold()) self.GoOn(*job);
    self.StartNext();
    if (self.mInFlight == 0) self.mLoop.Quit();
}

std::vector<Job*> Batch::TakeTold() {
    std::lock_guard const lock(mMutex);
    std::vector<Job*> told(mTold);
    mTold.clear();
    return told;
}

void Batch::StartNext() {
    while (mInFlight < mRequest.inFlight && mNext < mJobs.size()) {
        ++mInFlight;
        Start(mJobs[mNext++]);
    }
}

void Batch::Start(Job& job) {
    BatchFile const& file = FileOf(job);
    try {
        ConversionOptions const& options = mRequest.options;
        CheckWidth(file.input, ReadInfo(file.input, mEnv.log), options, *mQueue);
        String const path = String::FromFileName(file.input);
        if (!mLoader->RequestLoad(IdOf(job), path, mQueue.get(), options.width, options.height))
            FailJob(job, file.input + ": not enough memory to load it");
    } catch (Failure const& failure) {
        FailJob(job, failure.what());
    } catch (std::bad_alloc const&) {
        FailJob(job, file.input + ": not enough memory");
    }
}

void Batch::GoOn(Job& job) {
    BatchFile const& file = FileOf(job);
    try {
        switch (job.news) {
        case News::Loaded:
            return Save(job);
        case News::NotLoaded: {
            std::string const error = mEnv.log.GetErrorAbout(file.input);
            return FailJob(job, error.empty() ? file.input + ": it cannot be read" : error);
        }
        case News::Saved:
            return CheckSaved(job);
        case News::NotSaved: {
            std::string const error = mEnv.log.GetErrorAbout(file.output);
            return FailJob(job, file.input + ": " + (error.empty() ? "cannot save " + file.output : error));
        }
        case News::None:
            return;
        }
    } catch (Failure const& failure) {
        FailJob(job, failure.what());
    } catch (std::bad_alloc const&) {
        FailJob(job, file.input + ": not enough memory");
    }
}

void Batch::Save(Job& job) {
    BatchFile const& file = FileOf(job);
    RefPtr<IMKBitmap> const bitmap = std::move(job.bitmap);
    mQueue->WaitForTasks();
    CheckStrips(*bitmap, file.input);
    // Of uploads, which have been looked at.
    mEnv.log.TakeErrorOf(mRenderThread);

    job.saving.emplace(mEnv.interruption);
    MKBitmapSaveManager::SaveCallback callback{OnSaved, OnSaveFailed, this, &job};
    if (!mSaveManager.RequestSave(IdOf(job), String::FromFileName(file.output), *bitmap, &callback,
                                  mRequest.options.quality))
        throw Failure(file.input + ": not enough memory to read it back");
    // The GPU's errors do not tell which bitmap they are about. That of an upload in between is taken for one
    // of reading back: better one failure too many than a file without its pixels.
    mQueue->WaitForTasks();
    job.gpuError = mEnv.log.TakeErrorOf(mRenderThread);
}

// A bitmap that could not be read back has been saved all the same, without its pixels.
void Batch::CheckSaved(Job& job) {
    if (job.gpuError.empty()) return Finish(job);
    unlink(FileOf(job).output.c_str());
    FailJob(job, FileOf(job).input + ": cannot be read back from the GPU: " + job.gpuError);
}

void Batch::FailJob(Job& job, std::string const& error) {
    job.error = error;
    Finish(job);
}

void Batch::Finish(Job& job) {
    job.saving.reset();
    --mInFlight;
    if (job.error.empty()) {
        ++mConverted;
        mEnv.progress.Tell(FileOf(job).input + " -> " + FileOf(job).output);
    }
    mEnv.progress.SetCount(++mDone, static_cast<int>(mJobs.size()));
}

} // namespace

BatchResult ConvertBatch(BatchRequest const& request, ConversionEnvironment const& environment) {
    return Batch(request, environment).Run();
}

} // namespace Moka::Tool
