#pragma once

#include "KRFoundation/KRValue.hpp"

// Collections cannot hold nil: these turn nil into the null marker and back.
KRValue KRGetNullNormalizedObject(const KRValue& value);
KRValue KRGetNullDenormalizedObject(const KRValue& value);
