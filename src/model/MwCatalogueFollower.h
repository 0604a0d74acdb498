#pragma once

#include <functional>
#include <memory>
#include <vector>

#include "MwModel.h"

class MwCatalogueReader;

// Brings the model's list of recordings up to what the database says: a short one at once, a long one by a thread.
// While something changes files itself, news wait for its end. The model is borrowed. Main loop only.
class MwCatalogueFollower {
public:
    // changed: the model's list is new.
    MwCatalogueFollower(MwModel* model, std::function<bool()> isBusy, std::function<void()> changed);
    ~MwCatalogueFollower();
    MwCatalogueFollower(const MwCatalogueFollower&) = delete;
    MwCatalogueFollower& operator=(const MwCatalogueFollower&) = delete;

    void follow();
    // With what came while it was busy; nothing is called. False when that was nothing.
    bool catchUp();

private:
    void _adopt(std::vector<MwFileInfo> files);

    MwModel* _model;
    std::function<bool()> _isBusy;
    std::function<void()> _changed;
    bool _databaseChanged = false; // while it was busy
    unsigned int _askedRevision = 0; // of the catalogue when the reader was asked
    std::unique_ptr<MwCatalogueReader> _reader;
};
