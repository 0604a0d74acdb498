#include "MwCatalogueFollower.h"

#include <utility>

#include "MwCatalogueReader.h"

namespace {

constexpr size_t READ_AT_ONCE = 500; // recordings: nobody notices a few milliseconds

}

MwCatalogueFollower::MwCatalogueFollower(MwModel* model, std::function<bool()> isBusy, std::function<void()> changed)
    : _model(model)
    , _isBusy(std::move(isBusy))
    , _changed(std::move(changed))
    , _reader(std::make_unique<MwCatalogueReader>([this](std::vector<MwFileInfo> files) { _adopt(std::move(files)); }))
{
}

MwCatalogueFollower::~MwCatalogueFollower() = default;

void MwCatalogueFollower::follow()
{
    if (_isBusy()) {
        _databaseChanged = true;
        return;
    }
    if (_model->getRecordedFileList().size() < READ_AT_ONCE) {
        _model->createRecordedFileList();
        return _changed();
    }
    _askedRevision = _model->getCatalogueRevision();
    _reader->ask();
}

// What has changed here meanwhile is newer than what was read.
void MwCatalogueFollower::_adopt(std::vector<MwFileInfo> files)
{
    if (_isBusy()) {
        _databaseChanged = true;
        return;
    }
    if (_askedRevision != _model->getCatalogueRevision()) {
        _askedRevision = _model->getCatalogueRevision();
        return _reader->ask();
    }
    _model->setRecordedFiles(std::move(files));
    _changed();
}

bool MwCatalogueFollower::catchUp()
{
    if (!std::exchange(_databaseChanged, false))
        return false;
    _model->createRecordedFileList();
    return true;
}
