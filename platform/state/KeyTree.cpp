#include "state/KeyTree.h"

#include "state/Directories.h"
#include "state/KeyFile.h"
#include "state/Log.h"

#include <Ecore.h>

#include <algorithm>
#include <array>
#include <filesystem>
#include <set>
#include <utility>

#include <sys/inotify.h>
#include <unistd.h>

namespace platform {

namespace {

    namespace fs = std::filesystem;

    constexpr uint32_t EVENTS = IN_MOVED_TO | IN_CLOSE_WRITE | IN_DELETE | IN_CREATE | IN_ONLYDIR;

    bool isHidden(const std::string& name) { return name.empty() || name[0] == '.'; }

    void collectKeys(const std::string& root, std::set<std::string>& keys)
    {
        std::error_code error;
        auto entry = fs::recursive_directory_iterator(root, fs::directory_options::skip_permission_denied, error);
        for (; !error && entry != fs::recursive_directory_iterator(); entry.increment(error))
            if (entry->is_regular_file(error) && !isHidden(entry->path().filename()))
                keys.insert(entry->path().lexically_relative(root));
    }

}

KeyTree::KeyTree(std::string liveDirectory, std::string pinnedDirectory, Durability durability)
    : _live(std::move(liveDirectory))
    , _pinned(std::move(pinnedDirectory))
    , _durability(durability)
{
    removeStaleTemporaries(_live);
    removeStaleTemporaries(_pinned);
}

KeyTree::~KeyTree() { _stopWatching(); }

bool KeyTree::isValidKey(const std::string& key)
{
    if (key.empty() || key.size() > 512 || key.find('\0') != std::string::npos)
        return false;
    for (size_t start = 0;;) {
        const size_t slash = key.find('/', start);
        const std::string part = key.substr(start, slash - start);
        if (isHidden(part) || part.size() > 200) // "", ".", ".." and the names of temporary files
            return false;
        if (slash == std::string::npos)
            return true;
        start = slash + 1;
    }
}

std::optional<std::string> KeyTree::read(const std::string& key) const
{
    if (!isValidKey(key))
        return std::nullopt;
    if (!_pinned.empty())
        if (auto value = readKeyFile(_pinned + "/" + key))
            return value;
    return _live.empty() ? std::nullopt : readKeyFile(_live + "/" + key);
}

bool KeyTree::write(const std::string& key, const std::string& value) { return _writeBelow(_live, key, value); }

bool KeyTree::writeIfDifferent(const std::string& key, const std::string& value)
{
    if (!isValidKey(key) || _live.empty())
        return false;
    return readKeyFile(_live + "/" + key) == value || write(key, value);
}

bool KeyTree::remove(const std::string& key)
{
    return isValidKey(key) && !_live.empty() && ::unlink((_live + "/" + key).c_str()) == 0;
}

bool KeyTree::pin(const std::string& key, const std::string& value) { return _writeBelow(_pinned, key, value); }

bool KeyTree::unpin(const std::string& key)
{
    return isValidKey(key) && !_pinned.empty() && ::unlink((_pinned + "/" + key).c_str()) == 0;
}

bool KeyTree::isPinned(const std::string& key) const
{
    return isValidKey(key) && !_pinned.empty() && ::access((_pinned + "/" + key).c_str(), R_OK) == 0;
}

std::vector<std::string> KeyTree::keys() const
{
    std::set<std::string> found;
    collectKeys(_live, found);
    if (!_pinned.empty())
        collectKeys(_pinned, found);
    return {found.begin(), found.end()};
}

bool KeyTree::_writeBelow(const std::string& root, const std::string& key, const std::string& value)
{
    if (root.empty() || !isValidKey(key))
        return false;
    const std::string path = root + "/" + key;
    return makeDirectories(path.substr(0, path.rfind('/')), 0700)
        && replaceKeyFile(path, value, _durability == Durability::DISK);
}

KeyTree::WatchId KeyTree::watch(const std::string& key, Changed callback)
{
    if ((!key.empty() && !isValidKey(key)) || !callback || !_startWatching())
        return 0;
    _watches[++_lastId] = {key, std::move(callback)};
    return _lastId;
}

void KeyTree::unwatch(WatchId id)
{
    _watches.erase(id);
    if (_watches.empty())
        _stopWatching();
}

bool KeyTree::_startWatching()
{
    if (_handler != nullptr)
        return true;
    if (!makeDirectories(_live, 0700) || (_inotify = ::inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) < 0)
        return false;
    _addDirectory({_live, "", false}, nullptr);
    if (makeDirectories(_pinned, 0700))
        _addDirectory({_pinned, "", true}, nullptr);
    _handler = ecore_main_fd_handler_add(
        _inotify, ECORE_FD_READ,
        [](void* self, Ecore_Fd_Handler*) -> Eina_Bool {
            static_cast<KeyTree*>(self)->_drain();
            return ECORE_CALLBACK_RENEW;
        },
        this, nullptr, nullptr);
    if (_handler == nullptr)
        _stopWatching();
    return _handler != nullptr;
}

void KeyTree::_stopWatching()
{
    if (_handler != nullptr)
        ecore_main_fd_handler_del(std::exchange(_handler, nullptr));
    if (_inotify >= 0)
        ::close(std::exchange(_inotify, -1));
    _directories.clear();
}

// Watches the directory and those below it. A key may be written into a new directory before its watch exists;
// such keys are added to the found ones.
void KeyTree::_addDirectory(const Directory& directory, std::vector<std::string>* found)
{
    const int descriptor = ::inotify_add_watch(_inotify, directory.path.c_str(), EVENTS);
    if (descriptor < 0)
        return;
    _directories[descriptor] = directory;
    std::error_code error;
    for (fs::directory_iterator entry(directory.path, error), end; !error && entry != end; entry.increment(error)) {
        const std::string name = entry->path().filename();
        if (isHidden(name))
            continue;
        if (entry->is_directory(error))
            _addDirectory({entry->path(), directory.prefix + name + "/", directory.pinned}, found);
        else if (found != nullptr)
            found->push_back(directory.prefix + name);
    }
}

// Somebody removed a whole root: begin it anew, else no later write would be seen.
void KeyTree::_restoreRoot(const Directory& root, std::vector<std::string>& changed)
{
    if (root.prefix.empty() && makeDirectories(root.path, 0700))
        _addDirectory(root, &changed);
}

void KeyTree::_drain()
{
    alignas(inotify_event) std::array<char, 16384> buffer;
    std::vector<std::string> changed;
    for (ssize_t length; (length = ::read(_inotify, buffer.data(), buffer.size())) > 0;) {
        for (ssize_t at = 0; at < length;) {
            const auto* event = reinterpret_cast<const inotify_event*>(buffer.data() + at);
            at += static_cast<ssize_t>(sizeof(inotify_event) + event->len);
            _take(event->wd, event->mask, event->len > 0 ? event->name : "", changed);
        }
    }
    _notify(changed);
}

void KeyTree::_take(int descriptor, uint32_t mask, const std::string& name, std::vector<std::string>& changed)
{
    if ((mask & IN_Q_OVERFLOW) != 0) {
        const auto all = keys();
        changed.insert(changed.end(), all.begin(), all.end());
        return;
    }
    const auto found = _directories.find(descriptor);
    if (found == _directories.end())
        return;
    const Directory directory = found->second;
    if ((mask & IN_IGNORED) != 0) {
        _directories.erase(found);
        _restoreRoot(directory, changed);
        return;
    }
    if (isHidden(name))
        return;
    const std::string key = directory.prefix + name;
    if ((mask & IN_ISDIR) != 0 && (mask & (IN_CREATE | IN_MOVED_TO)) != 0)
        _addDirectory({directory.path + "/" + name, key + "/", directory.pinned}, &changed);
    else if ((mask & (IN_ISDIR | IN_CREATE)) == 0 && (directory.pinned || !isPinned(key)))
        changed.push_back(key);
}

void KeyTree::_notify(const std::vector<std::string>& changed)
{
    std::set<std::string> told;
    for (const std::string& key : changed) {
        if (!told.insert(key).second)
            continue;
        std::vector<WatchId> ids;
        for (const auto& [id, watch] : _watches)
            if (watch.key.empty() || watch.key == key)
                ids.push_back(id);
        for (const WatchId id : ids) {
            const auto found = _watches.find(id);
            if (found == _watches.end())
                continue;
            const Changed callback = found->second.callback; // the callback may remove its own watch
            callback(key);
        }
    }
}

}
