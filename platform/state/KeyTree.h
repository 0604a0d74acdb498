// A small store of named texts: one file per key, replaced atomically, watched with inotify.
//
// Two directories hold it. A key in the pinned directory hides the live one, so that a value set by hand survives
// everything the host reports. Every write notifies, also one of the same value; a burst of writes may be reported
// once, but the last one always is. Processes share a tree by sharing its directories.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

struct _Ecore_Fd_Handler;

namespace platform {

class KeyTree {
public:
    using Changed = std::function<void(const std::string& key)>;
    using WatchId = uint64_t; // 0 is none

    // An empty pinned directory means that the tree has no pins. A durable tree survives a power cut.
    enum class Durability { MEMORY, DISK };
    KeyTree(std::string liveDirectory, std::string pinnedDirectory, Durability durability);
    ~KeyTree();
    KeyTree(const KeyTree&) = delete;
    KeyTree& operator=(const KeyTree&) = delete;

    // Relative, no empty, "." or hidden component.
    static bool isValidKey(const std::string& key);

    // Any thread.
    std::optional<std::string> read(const std::string& key) const;
    bool write(const std::string& key, const std::string& value);
    bool writeIfDifferent(const std::string& key, const std::string& value);
    bool remove(const std::string& key);
    bool pin(const std::string& key, const std::string& value);
    bool unpin(const std::string& key);
    bool isPinned(const std::string& key) const;
    // All keys in order, pinned or live.
    std::vector<std::string> keys() const;

    // Main loop, after ecore_init. An empty key watches all. Answers 0 when watching is not possible. Callbacks may
    // add and remove watches.
    WatchId watch(const std::string& key, Changed callback);
    void unwatch(WatchId id);

private:
    struct Watch {
        std::string key;
        Changed callback;
    };
    struct Directory {
        std::string path;
        std::string prefix; // of the keys in it: "" or "memory/sysman/"
        bool pinned;
    };

    bool _startWatching();
    void _stopWatching();
    void _addDirectory(const Directory& directory, std::vector<std::string>* found);
    void _drain();
    void _take(int descriptor, uint32_t mask, const std::string& name, std::vector<std::string>& changed);
    void _restoreRoot(const Directory& root, std::vector<std::string>& changed);
    void _notify(const std::vector<std::string>& changed);
    bool _writeBelow(const std::string& root, const std::string& key, const std::string& value);

    const std::string _live;
    const std::string _pinned;
    const Durability _durability;
    std::map<WatchId, Watch> _watches;
    WatchId _lastId = 0;
    int _inotify = -1;
    _Ecore_Fd_Handler* _handler = nullptr;
    std::map<int, Directory> _directories; // by inotify descriptor
};

}
