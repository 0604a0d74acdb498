#pragma once

#include <functional>

#include <panekit/WGenlistItem.h>

// A choice of the trim panel's save popup: as a new file (0) or over the original (1). Owned by the genlist. Main loop
// only.
class MwSavePopupMenuItem : public panekit::WGenlistItem {
public:
    MwSavePopupMenuItem(int index, std::function<void(int index)> onChosen);

protected:
    const char* getStyle() const override;
    std::string getText(const char* part) override;
    void onSelected() override;

private:
    static const char* _getGenlistText(int index);

    int _index;
    std::function<void(int index)> _onChosen;
};
