#pragma once

#include <functional>

#include <panekit/WGenlistItem.h>

class MwModel;

// A row of the storage chooser: a storage's name and its radio. Owned by the genlist, which keeps the radio group under
// the data key "radio". Main loop only.
class MwSaveToListItem : public panekit::WGenlistItem {
public:
    // index: an MwStorageType. The model is borrowed. The handler is called when the row is chosen.
    MwSaveToListItem(MwModel* model, int index, std::function<void(int index)> onChosen);

protected:
    const char* getStyle() const override;
    std::string getText(const char* part) override;
    Evas_Object* getContent(Evas_Object* genlist, const char* part) override;
    void onSelected() override;

private:
    MwModel* _model;
    int _index;
    std::function<void(int index)> _onChosen;
};
