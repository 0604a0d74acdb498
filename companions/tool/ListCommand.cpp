#include "Commands.h"

#include <media_content.h>

#include <cstdio>

#include "MwModel.h"

int tool::list(const Arguments&)
{
    if (media_content_connect() != 0) {
        std::fputs("mewlo-tool: the media database cannot be opened\n", stderr);
        return FAILED;
    }
    MwModel model;
    model.createRecordedFileList();
    for (const MwFileInfo& info : model.getRecordedFileList()) {
        int bookmarks = 0;
        media_info_get_bookmark_count_from_db(info.mediaId.c_str(), nullptr, &bookmarks);
        std::printf("%s\t%d\t%d\n", escaped(info.path).c_str(), info.duration, bookmarks);
    }
    media_content_disconnect();
    return OK;
}
