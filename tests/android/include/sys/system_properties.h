#ifndef NIB_TESTS_ANDROID_SYSTEM_PROPERTIES_H
#define NIB_TESTS_ANDROID_SYSTEM_PROPERTIES_H

// Declarations only.

#define PROP_VALUE_MAX 92

extern "C" int __system_property_get(const char* name, char* value);

#endif
