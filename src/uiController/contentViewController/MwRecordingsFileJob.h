#pragma once

#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "MwFileOperator.h"

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwFileOperationPopup;
class MwModel;
class MwPrivateStorage;

// Deleting, moving or renaming recordings beside the main loop, with the popup that shows it: at most one runs at a
// time. What its end means for the screen is told once it is over, and not when it was ended. The recording that is
// loaded stays it under its new path. Model and private storage are borrowed. Main loop only.
class MwRecordingsFileJob {
public:
    using Paths = std::vector<std::string>;
    struct Deleted {
        bool hasBegun = true; // false when it was cancelled before
        Paths donePaths;
        Paths withoutTrash; // what only goes for good, and is to be asked for
        bool hasFailed = false;
    };
    using Outcome = MwFileRenamer::Outcome;

    // window: where the popups appear.
    MwRecordingsFileJob(Evas_Object* window, MwModel* model, MwPrivateStorage* privateStorage);
    ~MwRecordingsFileJob();
    MwRecordingsFileJob(const MwRecordingsFileJob&) = delete;
    MwRecordingsFileJob& operator=(const MwRecordingsFileJob&) = delete;

    [[nodiscard]] bool isRunning() const { return _fileOperator != nullptr; }
    // These are without effect while one runs.
    void remove(const Paths& pathList, bool forGood, std::function<void(const Deleted&)> finished);
    // MOVE_TO_PRIVATE or REMOVE_FROM_PRIVATE. The private storage is open, and handed back at the end.
    void move(MwFileOperator::Type type, const Paths& pathList, std::function<void()> finished);
    void rename(const MwFileOperator::Source& source,
        std::function<void(Outcome outcome, const std::string& path, const std::string& newPath)> finished);
    // Cancels it and waits for it.
    void end();
    // Rewrites the texts of a question after a change of language or region.
    void updateDuplicationPopup();

private:
    [[nodiscard]] bool _mayStart(const Paths& pathList) const;
    [[nodiscard]] std::vector<MwFileOperator::Source> _sourcesOf(const Paths& pathList) const;
    void _cancelDeleting();
    void _createMovingingPopupController();
    void _cancelMoving();
    void _updateMovePopup();
    void _createDuplicationPopupController(const std::string& path);
    void _onSelectedDuplicationPopupButton(int action);
    void _moveFinished();
    void _moveEnded(const MwFileOperator& fileOperator);
    void _finish();

    Evas_Object* _window;
    MwModel* _model;
    MwPrivateStorage* _privateStorage;
    std::unique_ptr<MwFileOperator> _fileOperator;
    std::unique_ptr<MwFileOperationPopup> _fileOperationPopup; // while an operator works
    std::function<void()> _finished; // what the end of this one means
};
