#include "MwCatalogueReader.h"

#include <memory>
#include <utility>

MwCatalogueReader::MwCatalogueReader(std::function<void(Files files)> read)
    : _read(std::move(read))
{
}

void MwCatalogueReader::ask()
{
    if (_isReading)
        _isAskedAgain = true;
    else
        _start();
}

void MwCatalogueReader::_start()
{
    _isReading = true;
    _isAskedAgain = false;
    _thread = std::jthread([this] {
        auto files = std::make_shared<Files>(MwModel::readRecordedFiles());
        _mailbox.post([this, files] { _finished(std::move(*files)); });
    });
}

void MwCatalogueReader::_finished(Files files)
{
    _isReading = false;
    if (_isAskedAgain)
        return _start();
    _read(std::move(files)); // may end this object
}
