#include <gtest/gtest.h>

#include "gps/GpsdAddress.h"

namespace {

using pyx::gps::GpsdAddressError;
using pyx::gps::parseGpsdAddress;

TEST(GpsdAddress, AloneItIsGpsdsOwnDefault) {
    EXPECT_EQ(parseGpsdAddress("").text(), "127.0.0.1:2947");
}

TEST(GpsdAddress, HostPortAndBothAreTaken) {
    EXPECT_EQ(parseGpsdAddress("192.168.1.5:2948").text(), "192.168.1.5:2948");
    EXPECT_EQ(parseGpsdAddress("car-pi").text(), "car-pi:2947");
    EXPECT_EQ(parseGpsdAddress(":2950").text(), "127.0.0.1:2950");
    EXPECT_EQ(parseGpsdAddress("[::1]:2947").host, "::1");
}

TEST(GpsdAddress, ABadPortOrAnUnbracketedIpv6AddressIsRefusedInOneLine) {
    for (const char* text : {"host:", "host:port", "host:0", "host:70000", "::1", "[::1"}) {
        try {
            (void)parseGpsdAddress(text);
            ADD_FAILURE() << text << " was taken";
        } catch (const GpsdAddressError& e) {
            const std::string what = e.what();
            EXPECT_TRUE(what.starts_with(std::string("--gps ") + text + ": ")) << what;
            EXPECT_EQ(what.find('\n'), std::string::npos) << what;
        }
    }
}

}  // namespace
