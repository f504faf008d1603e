#include "apps/notebook/PageStore.h"

#include "apps/notebook/PageFile.h"
#include "apps/notebook/SafeFile.h"
#include "scenes/SceneError.h"

#include <chrono>
#include <cinttypes>
#include <cstdio>
#include <filesystem>
#include <string_view>
#include <unistd.h>

namespace Moka::Notebook {
namespace {

namespace fs = std::filesystem;

std::string GetFolder(std::string const& path) { return fs::path(path).parent_path().string(); }

std::string GetJournal(std::string const& path) { return path + ".journal"; }

// "continues" opens a journal and names the content that its splices begin with; "saved" says which content they
// have become.
std::string MakeMark(char const* word, std::uint64_t fingerprint) {
    char line[64];
    std::snprintf(line, sizeof(line), "%s %016" PRIx64 "\n", word, fingerprint);
    return line;
}

// "splice AT REMOVED INSERTED", and a line for each object that is inserted.
std::string WriteSplice(Splice const& splice, std::string const& folder) {
    std::string text = "splice " + std::to_string(splice.at) + ' ' + std::to_string(splice.removed.size()) +
                       ' ' + std::to_string(splice.inserted.size()) + '\n';
    for (ObjectPtr const& object : splice.inserted) text += WriteOperation(*object, folder) + '\n';
    return text;
}

std::string_view TakeLine(std::string_view& text) {
    std::size_t const end = text.find('\n');
    if (end == std::string_view::npos) return text = {}; // the writer was killed in this line
    std::string_view const line = text.substr(0, end);
    text.remove_prefix(end + 1);
    return line;
}

// Takes whole splices off the text. What is left of it then was cut off by a kill, or a reason says what is wrong.
std::string Replay(std::string_view& whole, std::string const& folder, Objects& objects) {
    using Offset = Objects::difference_type;
    for (std::string_view text = whole; !text.empty(); whole = text) {
        std::string const line(TakeLine(text));
        if (line.empty()) return {};
        if (line.rfind("saved ", 0) == 0) continue;
        std::size_t at = 0;
        std::size_t removed = 0;
        std::size_t count = 0;
        if (std::sscanf(line.c_str(), "splice %zu %zu %zu", &at, &removed, &count) != 3 ||
            at > objects.size() || removed > objects.size() - at)
            return "'" + line.substr(0, 60) + "' does not fit the page";
        Objects inserted;
        try {
            while (inserted.size() < count) {
                std::string_view const operation = TakeLine(text);
                if (operation.empty()) return {};
                inserted.push_back(ReadOperation(operation, folder));
            }
        } catch (Scenes::SceneError const& error) {
            return error.what();
        }
        auto const place = objects.begin() + static_cast<Offset>(at);
        objects.insert(objects.erase(place, place + static_cast<Offset>(removed)), inserted.begin(),
                       inserted.end());
    }
    return {};
}

} // namespace

struct PageStore::Files {
    std::string path;
    std::uint64_t fingerprint = 0; // of the page's file
    bool hasJournal = false;
    std::string waiting; // to be appended

    Report Append(std::vector<Splice> const& splices) {
        std::string const folder = GetFolder(path);
        for (Splice const& splice : splices) waiting += WriteSplice(splice, folder);
        Report report;
        if (waiting.empty()) return report;
        std::string const text = hasJournal ? waiting : MakeMark("continues", fingerprint) + waiting;
        std::string const reason = AppendToFile(GetJournal(path), text);
        if (!reason.empty())
            return {true,
                    false,
                    "cannot autosave to " + GetJournal(path) + ": " + reason +
                        "; make room: it stays in memory and is tried again",
                    {}};
        hasJournal = true;
        waiting.clear();
        report.bytes = text.size();
        return report;
    }

    Report Save(Objects const& objects, int height, std::string const& to) {
        std::string const text = WritePage(objects, height, GetFolder(to));
        std::uint64_t const after = Fingerprint(text);
        bool const isSame = to == path;
        if (isSame && hasJournal) AppendToFile(GetJournal(path), MakeMark("saved", after));
        std::string const reason = ReplaceFile(to, text);
        if (!reason.empty())
            return {true, true,
                    "cannot save " + to + ": " + reason + "; make room, or save under another name", to};
        if (hasJournal) unlink(GetJournal(path).c_str());
        path = to;
        fingerprint = after;
        hasJournal = false;
        waiting.clear();
        return {false, true, "saved " + to, to};
    }
};

PageStore::PageStore(std::function<void()> notify)
    : mNotify(std::move(notify)), mFiles(new Files), mThread(&PageStore::Work, this) {}

PageStore::~PageStore() {
    {
        std::lock_guard<std::mutex> const lock(mMutex);
        mIsEnding = true;
        mChanged.notify_all();
    }
    mThread.join();
}

PageStore::Opened PageStore::Open(std::string const& path) {
    mPath = path;
    *mFiles = {path, Fingerprint({}), false, {}};
    Opened opened;
    std::string text;
    std::string reason;
    if (ReadFile(path, text, reason)) {
        PageText page = ReadPage(text, path, GetFolder(path));
        opened.objects = std::move(page.objects);
        opened.problems = std::move(page.problems);
        mFiles->fingerprint = Fingerprint(text);
    }
    if (!reason.empty()) opened.problems.push_back("cannot read " + path + ": " + reason);
    std::string const journal = GetJournal(path);
    std::string splices;
    std::error_code ignored;
    reason.clear();
    if (!ReadFile(journal, splices, reason)) {
        if (!reason.empty()) opened.problems.push_back("cannot read " + journal + ": " + reason);
        return opened;
    }
    std::string_view rest = splices;
    std::string const mark = MakeMark("continues", mFiles->fingerprint);
    if (rest.substr(0, mark.size()) == mark) {
        mFiles->hasJournal = true;
        opened.hasUnsaved = true;
        rest.remove_prefix(mark.size());
        reason = Replay(rest, GetFolder(path), opened.objects);
        if (!reason.empty())
            opened.problems.push_back(journal + ": " + reason);
        else if (!rest.empty()) // or the next splice would be appended to a part of one
            fs::resize_file(journal, splices.size() - rest.size(), ignored);
    } else if (splices.find(MakeMark("saved", mFiles->fingerprint)) != std::string::npos ||
               mark.rfind(splices, 0) == 0) {
        unlink(journal.c_str());
    } else {
        std::string const aside = journal + ".kept";
        rename(journal.c_str(), aside.c_str());
        opened.problems.push_back(path + " has changed since the last edit in " + journal +
                                  ", which is kept as " + aside);
    }
    return opened;
}

void PageStore::Append(std::vector<Splice> splices) {
    Post([this, splices = std::move(splices)] { return mFiles->Append(splices); });
}

void PageStore::Save(Objects objects, int height, std::string const& path) {
    Post([this, objects = std::move(objects), height, path] { return mFiles->Save(objects, height, path); });
}

bool PageStore::IsBusy() const {
    std::lock_guard<std::mutex> const lock(mMutex);
    return !mJobs.empty();
}

std::vector<PageStore::Report> PageStore::TakeReports() {
    std::vector<Report> reports;
    {
        std::lock_guard<std::mutex> const lock(mMutex);
        reports.swap(mReports);
    }
    for (Report const& report : reports)
        if (report.isSave && !report.hasFailed) mPath = report.path;
    return reports;
}

void PageStore::Post(std::function<Report()> job) {
    std::lock_guard<std::mutex> const lock(mMutex);
    mJobs.push_back(std::move(job));
    mChanged.notify_all();
}

void PageStore::Wait() {
    std::unique_lock<std::mutex> lock(mMutex);
    mChanged.wait(lock, [this] { return mJobs.empty(); });
}

void PageStore::Work() {
    std::unique_lock<std::mutex> lock(mMutex);
    for (;;) {
        mChanged.wait(lock, [this] { return mIsEnding || !mJobs.empty(); });
        if (mJobs.empty()) return;
        std::function<Report()> const job = mJobs.front();
        lock.unlock();
        auto const begin = std::chrono::steady_clock::now();
        Report report = job();
        std::chrono::duration<double, std::milli> const passed = std::chrono::steady_clock::now() - begin;
        report.milliseconds = passed.count();
        lock.lock();
        mReports.push_back(std::move(report));
        mJobs.pop_front();
        mChanged.notify_all();
        lock.unlock();
        mNotify();
        lock.lock();
    }
}

} // namespace Moka::Notebook
