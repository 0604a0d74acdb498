#pragma once

#include <panekit/WGenlistItem.h>

// One fact about a recording: a title and a value of several lines. Owned by the genlist, which keeps the file record
// under the data key "file_info" and the date formatter under "icu". Main loop only.
class MwDetailsListItem : public panekit::WGenlistItem {
public:
    enum Type : int { NAME, DATE, LOCATION, LENGTH, SIZE, TYPE_COUNT };

    explicit MwDetailsListItem(int type);

protected:
    const char* getStyle() const override;
    std::string getText(const char* part) override;

private:
    [[nodiscard]] std::string _getTitle() const;
    [[nodiscard]] std::string _getValue() const;
    [[nodiscard]] std::string _getDateText() const;
    [[nodiscard]] std::string _getLoactionText() const;
    [[nodiscard]] std::string _getFileSizeText() const;

    int _type;
};
