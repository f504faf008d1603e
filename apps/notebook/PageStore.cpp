#include "apps/notebook/PageStore.h"

#include "apps/notebook/PageFile.h"
#include "apps/notebook/SafeFile.h"
#include "scenes/SceneError.h"

#include <cerrno>
#include <cinttypes>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <string_view>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace Moka::Notebook {
namespace {

constexpr std::uint64_t kShortJournal = std::uint64_t{4} << 20;

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

// A socket without a file: the system takes the name back when the process ends, however it ends.
PageLock::PageLock(std::string const& path) : mSocket(socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0)) {
    std::error_code ignored;
    std::string const whole = fs::weakly_canonical(path, ignored).string();
    sockaddr_un name{};
    name.sun_family = AF_UNIX;
    std::snprintf(name.sun_path + 1, sizeof(name.sun_path) - 1, "moka-notebook %016" PRIx64,
                  Fingerprint(whole));
    mIsTaken = bind(mSocket, reinterpret_cast<sockaddr*>(&name), sizeof(name)) != 0 && errno == EADDRINUSE;
}

PageLock::~PageLock() { close(mSocket); }

PageStore::Opened PageStore::Open(std::string const& path) {
    mPath = path;
    mFingerprint = Fingerprint({});
    mWaiting.clear();
    mJournalBytes = 0;
    Opened opened;
    std::string text;
    std::string reason;
    if (ReadFile(path, text, reason)) {
        PageText page = ReadPage(text, path, GetFolder(path));
        opened.objects = std::move(page.objects);
        opened.problems = std::move(page.problems);
        mFingerprint = Fingerprint(text);
    }
    mPageObjects = opened.objects.size();
    mWholeBytes = text.size();
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
    std::string const mark = MakeMark("continues", mFingerprint);
    if (rest.substr(0, mark.size()) == mark) {
        opened.hasUnsaved = true;
        rest.remove_prefix(mark.size());
        reason = Replay(rest, GetFolder(path), opened.objects);
        if (!reason.empty())
            opened.problems.push_back(journal + ": " + reason);
        else if (!rest.empty()) // or the next splice would be appended to a part of one
            fs::resize_file(journal, splices.size() - rest.size(), ignored);
        mJournalBytes = splices.size() - rest.size();
    } else if (splices.find(MakeMark("saved", mFingerprint)) != std::string::npos ||
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

PageStore::Report PageStore::Append(std::vector<Splice> const& splices) {
    for (Splice const& splice : splices) mWaiting += WriteSplice(splice, GetFolder(mPath));
    Report report;
    if (mWaiting.empty()) return report;
    std::string const journal = GetJournal(mPath);
    std::string const text = mJournalBytes > 0 ? mWaiting : MakeMark("continues", mFingerprint) + mWaiting;
    std::string const reason = AppendToFile(journal, text);
    if (!reason.empty()) {
        report.hasFailed = true;
        report.message = "cannot autosave to " + journal + ": " + reason +
                         "; make room: it stays in memory and is tried again";
        return report;
    }
    mWaiting.clear();
    mJournalBytes += text.size();
    report.bytes = text.size();
    report.isJournalLong = mJournalBytes > kShortJournal + 2 * mWholeBytes;
    return report;
}

PageStore::Report PageStore::Shorten(Objects const& objects) {
    Splice const all{0, Objects(mPageObjects), objects};
    std::string const text = MakeMark("continues", mFingerprint) + WriteSplice(all, GetFolder(mPath));
    Report report;
    if (!ReplaceFile(GetJournal(mPath), text).empty()) return report; // the long one is as good
    mWaiting.clear();
    mJournalBytes = mWholeBytes = report.bytes = text.size();
    return report;
}

PageStore::Report PageStore::Save(Objects const& objects, int height, std::string const& to) {
    std::string const text = WritePage(objects, height, GetFolder(to));
    std::uint64_t const after = Fingerprint(text);
    if (to == mPath && mJournalBytes > 0) AppendToFile(GetJournal(mPath), MakeMark("saved", after));
    std::string const reason = ReplaceFile(to, text);
    Report report;
    report.isSave = true;
    report.path = to;
    report.hasFailed = !reason.empty();
    report.message = "saved " + to;
    if (report.hasFailed)
        report.message = "cannot save " + to + ": " + reason + "; make room, or save under another name";
    if (report.hasFailed) return report;
    if (mJournalBytes > 0) unlink(GetJournal(mPath).c_str());
    mPath = to;
    mFingerprint = after;
    mPageObjects = objects.size();
    mWholeBytes = text.size();
    mJournalBytes = 0;
    mWaiting.clear();
    return report;
}

} // namespace Moka::Notebook
