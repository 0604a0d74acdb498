#include "MwRequestParser.h"

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <string>

#include "MwLog.h"
#include "MwModel.h"
#include "MwText.h"

namespace {

// Text that is no number counts as 0, a number beyond an int as the nearest int.
int parseKilobytes(const std::string& text)
{
    const long value = std::strtol(text.c_str(), nullptr, 10);
    return static_cast<int>(std::clamp<long>(value, std::numeric_limits<int>::min(), std::numeric_limits<int>::max()));
}

}

bool MwRequestParser::parse(app_control_h request, MwModel* model)
{
    if (request == nullptr) {
        MW_LOGE("request handle is nullptr");
        return false;
    }
    if (model == nullptr) {
        MW_LOGE("model is nullptr");
        return false;
    }
    _resetData(model);
    _parseMainData(request, model);
    _parseExtraData(request, model);
    return true;
}

void MwRequestParser::_resetData(MwModel* model)
{
    model->setRequestMode(false);
    model->setTypeRequested(false);
    model->setAudioCodec(MwModel::CODEC_AAC);
    model->setFileFormat(MwModel::FORMAT_MP4);
    model->setSampleRate(RECORDER_AAC_SAMPLE_RATE);
    model->setBitRate(RECORDER_AAC_BIT_RATE);
    model->setSizeLimit(MwModel::NO_SIZE_LIMIT);
}

void MwRequestParser::_parseMainData(app_control_h request, MwModel* model)
{
    char* text = nullptr;
    const int result = app_control_get_operation(request, &text);
    if (result != 0 || text == nullptr) {
        MW_LOGE("app_control_get_operation failed:[%d]", result);
        return;
    }
    const std::string operation = mwAdopt(text);
    MW_LOGI("[OPERATION: %s]", operation.c_str());
    if (operation == APP_CONTROL_OPERATION_CREATE_CONTENT)
        model->setRequestMode(true);
}

void MwRequestParser::_parseExtraData(app_control_h request, MwModel* model)
{
    char* text = nullptr;
    if (app_control_get_mime(request, &text) == 0 && text != nullptr) {
        const std::string mime = mwAdopt(text);
        MW_LOGI("[MIME: %s]", mime.c_str());
        model->setTypeRequested(!mime.ends_with("/*"));
        if (mime.find("AMR") != std::string::npos || mime.find("amr") != std::string::npos) {
            model->setAudioCodec(MwModel::CODEC_AMR);
            model->setFileFormat(MwModel::FORMAT_AMR);
            model->setSampleRate(RECORDER_AMR_SAMPLE_RATE);
            model->setBitRate(RECORDER_AMR_BIT_RATE);
        }
    }
    text = nullptr;
    if (app_control_get_extra_data(request, "SIZE", &text) == 0 && text != nullptr) {
        const std::string size = mwAdopt(text);
        MW_LOGI("[SIZE: %s]", size.c_str());
        model->setSizeLimit(parseKilobytes(size));
    }
}
