#pragma once

#include <vector>

class QWidget;

// The pages of the demo host, one per family of the library. The main window shows them as
// tabs; zudemo_schemeshots renders each in the light and the dark scheme as
// <id>-light.png and <id>-dark.png.
struct DemoPage
{
    const char* id;    // file-name stem of its screenshots
    const char* title; // tab title
    QWidget* (*create)(QWidget* inParent);
};

const std::vector<DemoPage>& demoPages();
