#include "MwApp.h"
#include "MwLog.h"

int main(int argc, char** argv)
{
    MW_LOGW("BEGIN");
    MwApp app;
    const int result = app.start(argc, argv);
    MW_LOGW("END");
    return result;
}
