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
#include "moka/graphics/task/ITask.h"
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

enum class News { None, Loaded, NotLoaded, Read, Saved, NotSaved };

class Batch;

struct Job {
    Batch* batch = nullptr;

    // The results of other threads, guarded by the batch's lock.
    News news = News::None;
    RefPtr<IMKBitmap> bitmap;
    std::string reason; // why it could not be loaded, read back or saved; empty on success

    std::unique_ptr<unsigned char[]> pixels;    // read back
    std::optional<Interruption::Saving> saving; // from the request to its result
    std::string error;
};

// Forgets errors of uploads, because their textures are checked instead.
class ForgetErrors final : public ITask {
public:
    explicit ForgetErrors(LogCollector& log) : mLog(log) {}
    void run() override { mLog.TakeOwnError(); }

private:
    LogCollector& mLog;
};

// Returns the reason from the library's log line "cannot read image 'name': reason", in which the name may be
// masked.
std::string ReasonIn(std::string line) {
    std::size_t const end = line.rfind("': ");
    return end == std::string::npos ? line : line.erase(0, end + 3);
}

class Batch {
public:
    Batch(BatchRequest const& request, ConversionEnvironment const& env);
    ~Batch() { mEnv.interruption.SetLastWords({}); }
    Batch(Batch const&) = delete;
    Batch& operator=(Batch const&) = delete;
    BatchResult Run();

private:
    static void OnNews(Handler*, void* batch, int);
    static void OnRead(Rect const&, void*, void* job);
    MKBitmapLoader::Callback MakeCallback();

    void Tell(Job& job, News news);
    void TellWithReason(int id, News news);
    std::vector<Job*> TakeTold();
    void Drive();
    std::string TellCount() const;
    void StartNext();
    void Start(Job& job);
    void GoOn(Job& job);
    void ReadBack(Job& job);
    void Save(Job& job);
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
    std::vector<Job*> mTold; // jobs with news, in order; has room for all jobs, so that adding never fails

    MessageLoop mLoop;
    Handler mHandler{OnNews, this};
    std::unique_ptr<RenderThread> mQueue;
    std::optional<MKBitmapLoader> mLoader; // destroyed first: its callbacks use the other members
};

Batch::Batch(BatchRequest const& request, ConversionEnvironment const& env)
    : mRequest(request), mEnv(env), mJobs(request.files.size()) {
    mTold.reserve(static_cast<std::size_t>(request.inFlight));
    for (Job& job : mJobs) job.batch = this;
}

MKBitmapLoader::Callback Batch::MakeCallback() {
    MKBitmapLoader::Callback callback;
    callback.onLoad = [this](int id, String const&, IMKBitmap& bitmap) {
        Job& job = mJobs[static_cast<std::size_t>(id)];
        job.bitmap = RefPtr<IMKBitmap>::Share(&bitmap);
        Tell(job, News::Loaded);
    };
    callback.onLoadError = [this](int id, String const&) { TellWithReason(id, News::NotLoaded); };
    callback.onSave = [this](int id, String const&, void*) {
        Tell(mJobs[static_cast<std::size_t>(id)], News::Saved);
    };
    callback.onSaveError = [this](int id, String const&, void*) { TellWithReason(id, News::NotSaved); };
    return callback;
}

BatchResult Batch::Run() {
    auto const start = std::chrono::steady_clock::now();
    mQueue = StartQueue(mRequest.options, mEnv);
    MakeFolder(mRequest.folder);
    if (!MKBitmapLoader::startEventLoopBySelf()) throw Failure("not enough memory for the loader's thread");
    MKBitmapLoader::Callback callback = MakeCallback();
    mLoader.emplace("moka", &callback);
    mEnv.interruption.SetLastWords([this] { return "interrupted; " + TellCount(); });
    Drive();

    BatchResult result;
    for (Job& job : mJobs)
        if (!job.error.empty()) result.errors.push_back(std::move(job.error));
    if (mConverted == 0) rmdir(mRequest.folder.c_str()); // fails if it is not empty
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

// Runs on the loader's thread or the render thread.
void Batch::Tell(Job& job, News news) {
    {
        std::lock_guard const lock(mMutex);
        job.news = news;
        mTold.push_back(&job);
    }
    mHandler.SendMessage();
}

// The loader has logged the reason on this thread before it called back.
void Batch::TellWithReason(int id, News news) {
    Job& job = mJobs[static_cast<std::size_t>(id)];
    job.reason = ReasonIn(mEnv.log.TakeOwnError());
    Tell(job, news);
}

// An error since ForgetErrors belongs to this job, or to an upload in between. A wrong failure is better than
// a file without its pixels.
void Batch::OnRead(Rect const&, void*, void* userData) {
    Job& job = *static_cast<Job*>(userData);
    job.reason = job.batch->mEnv.log.TakeOwnError();
    job.batch->Tell(job, News::Read);
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
        CheckWidth(file.input, ReadInfo(file.input), options, *mQueue);
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
            return ReadBack(job);
        case News::NotLoaded:
            return FailJob(job, TellCannot("read", file.input, job.reason));
        case News::Read:
            return Save(job);
        case News::Saved:
            return Finish(job);
        case News::NotSaved:
            return FailJob(job, file.input + ": " + TellCannot("save", file.output, job.reason));
        case News::None:
            return;
        }
    } catch (Failure const& failure) {
        FailJob(job, failure.what());
    } catch (std::bad_alloc const&) {
        FailJob(job, file.input + ": not enough memory");
    }
}

void Batch::ReadBack(Job& job) {
    Rect const whole = job.bitmap->GetBitmapRect();
    std::size_t const pixels =
        static_cast<std::size_t>(whole.GetWidth()) * static_cast<std::size_t>(whole.GetHeight());
    job.pixels.reset(new (std::nothrow) unsigned char[pixels * 4]);
    if (!job.pixels) throw Failure(FileOf(job).input + ": not enough memory to read it back");
    auto* const forget = new (std::nothrow) ForgetErrors(mEnv.log);
    if (!mQueue->Post(forget)) delete forget;
    job.bitmap->GetBitmapDataAsync(whole, job.pixels.get(), &job, OnRead);
}

void Batch::Save(Job& job) {
    BatchFile const& file = FileOf(job);
    RefPtr<IMKBitmap> const bitmap = std::move(job.bitmap);
    CheckStrips(*bitmap, file.input);
    if (!job.reason.empty()) throw Failure(file.input + ": cannot be read back from the GPU: " + job.reason);
    job.saving.emplace(mEnv.interruption);
    if (!mLoader->RequestSave(IdOf(job), String::FromFileName(file.output), job.pixels.get(),
                              bitmap->GetWidth(), bitmap->GetHeight(), nullptr, mRequest.options.quality))
        throw Failure(file.input + ": not enough memory to save it");
    static_cast<void>(job.pixels.release()); // the loader owns them
}

void Batch::FailJob(Job& job, std::string const& error) {
    job.error = error;
    Finish(job);
}

void Batch::Finish(Job& job) {
    job.saving.reset();
    job.bitmap = {};
    job.pixels.reset();
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
