#include <LumoraKit/platform/KTActionLoggingProtocol.h>

KTActionLoggingProtocol::~KTActionLoggingProtocol() = default;
