#pragma once

#include <string>
#include <vector>

// Deletes recordings into the desktop's trash, or for good. The rows go in groups, for each commit costs more than many
// files; a row whose file is gone is dropped by the next look at the folders anyway. Any thread, one at a time.
class MwFileDeleter {
public:
    // For good: where there is no trash, and in the private storage, whose files must not lie about in one. Otherwise
    // those are left alone.
    explicit MwFileDeleter(bool forGood)
        : _forGood(forGood)
    {
    }

    // A failing file is logged and left out.
    void remove(const std::string& path, const std::string& mediaId);
    // Commits the rest; answers the paths whose file and row are gone.
    [[nodiscard]] std::vector<std::string> finish();
    // What only goes for good, and is still there.
    [[nodiscard]] const std::vector<std::string>& withoutTrash() const { return _withoutTrash; }

private:
    bool _deleteFile(const std::string& path);
    bool _removeFile(const std::string& path);
    void _commit();

    const bool _forGood;
    std::vector<std::string> _done;
    std::vector<std::string> _withoutTrash;
    std::vector<std::string> _pendingPaths;
    std::vector<std::string> _pendingIds;
};
