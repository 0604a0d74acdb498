// Stands in for the operations on files until they are there: weak, so that they only have to be added.
#include "MwFileOperationPopup.h"
#include "MwFileOperator.h"
#include "MwRecordingsContentViewController.h"
#include "MwRecordingsRows.h"
#include "MwRenamePopupController.h"

#define MW_PENDING __attribute__((weak))

MW_PENDING void MwRecordingsContentViewController::_clickDeleteButton(const std::vector<std::string>&) { }
MW_PENDING void MwRecordingsContentViewController::_clickMoveDoneButton(const std::vector<std::string>&) { }
MW_PENDING void MwRecordingsContentViewController::_deletePlayingFile() { }
MW_PENDING void MwRecordingsContentViewController::_deleteFileOperator() { _fileOperator.reset(); }
MW_PENDING void MwRecordingsContentViewController::_updateDuplicationPopup() { }
MW_PENDING bool MwRecordingsContentViewController::_clickShareDoneButton(const std::vector<std::string>&)
{
    return false;
}
MW_PENDING void MwRecordingsContentViewController::_destroyShareRequest(bool) { }
MW_PENDING void MwRecordingsContentViewController::_destroyPrivateModeRequest(bool) { }
MW_PENDING void MwRecordingsContentViewController::_openRenamePopup(const std::string& path) { _renameTarget = path; }
MW_PENDING void MwRecordingsContentViewController::_closeRenamePopup() { }
MW_PENDING void MwRecordingsContentViewController::_renameResponseCb(const char*, int) { }
