#pragma once

// Whether a menu entry is offered on this device model. Main loop only.
class MwFeatureChecker {
public:
    enum MenuType : int { MENU_TYPE_TRIM = 0 };

    static bool isEnable(int menuType);
};
