#include <gtest/gtest.h>

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "xml/ParamRows.h"

using namespace OrvaneLumoCore;

namespace {

struct Inner {
    std::int32_t flag = 0;
    std::int32_t count = 0;
    float weight = 0;
    std::u16string file;
};

struct Holder {
    Inner inner;
    std::int32_t ownFlag = 0;
    std::int32_t ownCount = 0;
    bool on = false;
    double scale = 0;
    std::u16string path;
};

std::u16string written(const std::function<void(AssetXmlWriter&)>& body) {
    std::u16string out;
    AssetXmlWriter w(out);
    body(w);
    return out;
}

TEST(ParamRows, AFlagOfZeroIsFalseWhereverItLies) {
    Holder h;
    const ParamRow<Holder> rows[] = {
        {"own", asFlag(&Holder::ownFlag)},
        {"inner", asFlag(fieldOf<&Holder::inner, &Inner::flag>)},
    };
    const std::u16string expected = written([](AssetXmlWriter& w) {
        w.writeBool("own", false);
        w.writeBool("inner", false);
    });
    EXPECT_EQ(written([&](AssetXmlWriter& w) { writeParams(w, h, rows); }), expected);
}

// Hook rows go to the hook in table order; the rows around them are written.
TEST(ParamRows, HookRowsGoToTheHookInOrder) {
    Holder h;
    h.ownCount = 4;
    h.inner.count = 9;
    const ParamRow<Holder> rows[] = {
        {"first", &Holder::ownCount},
        {"hooked", {}, "", false, 3},
        {"inner", fieldOf<&Holder::inner, &Inner::count>},
        {"last", {}, "", false, 5},
    };
    std::vector<int> hooks;
    const std::u16string out = written([&](AssetXmlWriter& w) {
        writeParams(w, h, rows, [&](const ParamRow<Holder>& row) {
            hooks.push_back(row.hook);
            w.writeString(row.name, "x");
        });
    });
    EXPECT_EQ(hooks, (std::vector<int>{3, 5}));
    EXPECT_EQ(out, written([](AssetXmlWriter& w) {
                  w.writeInteger("first", 4);
                  w.writeString("hooked", "x");
                  w.writeInteger("inner", 9);
                  w.writeString("last", "x");
              }));
}

}  // namespace
