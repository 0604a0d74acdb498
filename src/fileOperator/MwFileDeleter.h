#pragma once

#include <string>
#include <vector>

// Deletes recordings: into the desktop's trash, those of the private storage for good. The rows go in groups, for each
// commit costs more than many files; a row whose file is gone is dropped by the next look at the folders anyway. Any
// thread, one at a time.
class MwFileDeleter {
public:
    // A failing file is logged and left out.
    void remove(const std::string& path, const std::string& mediaId);
    // Commits the rest; answers the paths whose file and row are gone.
    [[nodiscard]] std::vector<std::string> finish();

private:
    bool _deleteFile(const std::string& path);
    void _commit();

    std::vector<std::string> _done;
    std::vector<std::string> _pendingPaths;
    std::vector<std::string> _pendingIds;
};
