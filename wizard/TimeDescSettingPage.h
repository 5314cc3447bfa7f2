#pragma once
// The page on which the user says where the dates and times of an ASCII file stand.
#include "wizard/TimeDescPage.h"

class CTimeDescSettingPage : public CTimeDescPage {
    Q_OBJECT
public:
    enum : int { IDD = 2281 };
    enum : int { IDC_DATETIME_FORMAT = 211, IDC_TIME_FORMAT = 217, IDC_DATETIME_COLUMN = 219, IDC_DATE_COLUMN = 222,
                 IDC_DATE_FORMAT = 236, IDC_OPTION_DATETIME = 242, IDC_OPTION_SAME_DATE = 244,
                 IDC_OPTION_SAME_TIME = 245, IDC_DATETIME_SPIN = 250, IDC_TIME_COLUMN = 251, IDC_TIME_SPIN = 253,
                 IDC_DATE_SPIN = 257, IDC_DATE_VALUE = 273, IDC_TIME_VALUE = 275 };

    explicit CTimeDescSettingPage(QWidget* parent = nullptr);
};
