#include "KRClasses/KRNullNormalization.hpp"

KRValue KRGetNullNormalizedObject(const KRValue& value) { return value.isNil() ? KRValue::null() : value; }

KRValue KRGetNullDenormalizedObject(const KRValue& value) { return value.isNull() ? KRValue() : value; }
