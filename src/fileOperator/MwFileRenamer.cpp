#include "MwFileRenamer.h"

#include <media_content.h>

#include "MwFiles.h"
#include "MwHandle.h"
#include "MwLog.h"
#include "MwMediaRow.h"

namespace MwFileRenamer {

Outcome rename(const std::string& from, const std::string& to)
{
    MwHandle<files_lock_h, media_content_unlock_files> lock;
    if (!MW_CALL(media_content_lock_files, lock.out()))
        return Outcome::FAILED;
    const auto moved = MwFiles::moveWithoutOverwriting(from, to);
    if (moved != MwFiles::Move::DONE)
        return moved == MwFiles::Move::EXISTS ? Outcome::TAKEN : Outcome::FAILED;
    MwFiles::flushDirectoryOf(to);
    const auto row = MwMediaRow::move(from, to);
    if (row == MwMediaRow::Move::DONE)
        return Outcome::DONE;
    if (row == MwMediaRow::Move::UNKNOWN && MW_CALL(media_content_scan_file, to.c_str()))
        return Outcome::DONE;
    (void)MwFiles::moveWithoutOverwriting(to, from);
    return Outcome::FAILED;
}

}
