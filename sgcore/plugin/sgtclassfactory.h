#pragma once

#include "sgcore/plugin/sgtcustomclassfactory.h"

// A class factory for a class T with a constructor that takes no arguments.
template <typename T> class SgTClassFactory : public SgTCustomClassFactory<T> {
public:
    explicit SgTClassFactory(const SgGUID &guid) : SgTCustomClassFactory<T>(guid) {}

    // A new T with no parent; the caller owns it.
    QObject *createInstance() override { return new T(); }
    using SgClassFactory::createInstance;
};
