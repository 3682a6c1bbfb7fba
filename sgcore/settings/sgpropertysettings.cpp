#include "sgcore/settings/sgpropertysettings.h"

SgPropertySettings::SgPropertySettings() = default;

SgPropertySettings::~SgPropertySettings() = default;
