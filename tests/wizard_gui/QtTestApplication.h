#pragma once
// One QApplication for a whole test program, made before the first test and removed after the
// last, on the offscreen platform unless QT_QPA_PLATFORM names another. A program registers it
// once: testing::AddGlobalTestEnvironment(new QtTestApplication("name")).
#include <QApplication>

#include <cstdio>

#include <gtest/gtest.h>

class QtTestApplication : public testing::Environment {
public:
    explicit QtTestApplication(const char* name) { std::snprintf(s_name, sizeof s_name, "%s", name); }
    void SetUp() override
    {
        if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
            qputenv("QT_QPA_PLATFORM", "offscreen");
        m_application = new QApplication(s_argc, s_argv);
    }
    void TearDown() override
    {
        delete m_application;
        m_application = nullptr;
    }

private:
    static inline int s_argc = 1;
    static inline char s_name[64] = "";
    static inline char* s_argv[] = {s_name, nullptr};
    QApplication* m_application = nullptr;
};
