// The host's array that the bridge keeps its send list in: order kept through appends and
// removals, and misuse that warns (naming the header and line) and leaves the array as it was.
#include "sgcore/containers/sgtarray.h"

#include <QRegularExpression>
#include <QStringList>
#include <gtest/gtest.h>

#include <vector>

namespace {

QStringList capturedWarnings;

// Collects the Qt warnings issued during its lifetime.
class WarningCapture {
public:
    WarningCapture() {
        capturedWarnings.clear();
        m_previous = qInstallMessageHandler(
            [](QtMsgType type, const QMessageLogContext &, const QString &message) {
                if (type == QtWarningMsg)
                    capturedWarnings.append(message);
            });
    }
    ~WarningCapture() { qInstallMessageHandler(m_previous); }
    // Checks that exactly one warning "<file>(<line>): <message>" naming `header` came since
    // the last call (none when `message` is empty).
    void expectOne(const char *header, const QString &message) {
        const QStringList warnings = std::exchange(capturedWarnings, {});
        if (message.isEmpty()) {
            EXPECT_TRUE(warnings.isEmpty()) << warnings.join('\n').toStdString();
            return;
        }
        ASSERT_EQ(warnings.size(), 1) << warnings.join('\n').toStdString();
        const QRegularExpression pattern(QStringLiteral("^.*%1\\([1-9]\\d*\\): %2$")
                                             .arg(QRegularExpression::escape(QString(header)),
                                                  QRegularExpression::escape(message)));
        EXPECT_TRUE(pattern.match(warnings.first()).hasMatch()) << warnings.first().toStdString();
    }

private:
    QtMessageHandler m_previous = nullptr;
};

std::vector<int> items(const SgTArray<int> &array) {
    return std::vector<int>(array.begin(), array.end());
}

} // namespace

TEST(SgTArray, KeepsOrderAndRefusesMisuse) {
    WarningCapture capture;
    SgTArray<int> array(8);
    for (int i = 0; i < 20; ++i)
        EXPECT_EQ(array.append(i * 10), i);
    EXPECT_EQ(array.find(70), 7);
    EXPECT_EQ(array.find(5), -1);
    EXPECT_TRUE(array.removeByIndex(0, 1));
    EXPECT_TRUE(array.removeByIndex(5, 3));
    EXPECT_TRUE(array.removeByIndex(15, 1));
    EXPECT_EQ(array.addSpace(3), 15);
    EXPECT_EQ(items(array), (std::vector<int>{10, 20, 30, 40, 50, 90, 100, 110, 120, 130, 140, 150,
                                              160, 170, 180, 0, 0, 0}));
    capture.expectOne("sgtarray.h", QString());

    SgTArray<int> pair;
    pair.append(1);
    pair.append(2);
    pair[2] = 99;
    capture.expectOne("sgtarray.h", "Index out of range in SgTArray::operator[]");
    EXPECT_EQ(pair[-1], 0);
    capture.expectOne("sgtarray.h", "Index out of range in SgTArray::operator[]");
    EXPECT_FALSE(pair.removeByIndex(2, 1));
    capture.expectOne("sgtarray.h",
                      "Invalid starting index specified in SgTArray::removeByIndex()");
    EXPECT_FALSE(pair.removeByIndex(1, 2));
    capture.expectOne("sgtarray.h",
                      "Too many items specified for removal in SgTArray::removeByIndex()");
    EXPECT_EQ(pair.addSpace(-4), -1);
    capture.expectOne("sgtarray.h", "Invalid size '-4' passed to SgTArray::addSpace()");
    EXPECT_EQ(items(pair), (std::vector<int>{1, 2}));
}
