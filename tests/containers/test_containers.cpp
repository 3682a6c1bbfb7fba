// The host's containers: order kept through appends and removals, and misuse that warns (naming
// the header and line) and leaves the container as it was.
#include "sgcore/containers/sgtarray.h"
#include "sgcore/containers/sgtsimplearray.h"
#include "sgcore/containers/sgtsortedarray.h"
#include "sgcore/containers/sgtstack.h"

#include <QRegularExpression>
#include <QStringList>
#include <gtest/gtest.h>

#include <climits>

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
    ASSERT_EQ(array.count(), 15);
    EXPECT_EQ(array[0], 10);
    EXPECT_EQ(array[4], 50);
    EXPECT_EQ(array[5], 90);
    EXPECT_EQ(array[14], 180);
    EXPECT_EQ(array.addSpace(3), 15);
    EXPECT_EQ(array[17], 0);
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
    ASSERT_EQ(pair.count(), 2);
    EXPECT_EQ(pair[0], 1);
    EXPECT_EQ(pair[1], 2);
}

TEST(SgTSortedAndSimpleArrays, KeepOrderFindAndWarn) {
    WarningCapture capture;
    SgTSortedArray<int> sorted;
    for (int value : {5, 1, 9, 3, 5, 7})
        sorted.add(value);
    ASSERT_EQ(sorted.count(), 6);
    const int expected[] = {1, 3, 5, 5, 7, 9};
    for (int i = 0; i < 6; ++i)
        EXPECT_EQ(sorted[i], expected[i]);
    EXPECT_EQ(sorted.find(5), 2);
    EXPECT_EQ(sorted.find(4), -1);
    EXPECT_TRUE(sorted.remove(5));
    EXPECT_EQ(sorted.find(5), 2);
    EXPECT_FALSE(sorted.removeByIndex(3, 5));
    capture.expectOne("sgtsortedarray.h", QString());
    EXPECT_EQ(sorted[5], 0);
    capture.expectOne("sgtsortedarray.h", "Index out of range in SgTSortedArray::operator[]");

    SgTSimpleArray<float> values(3);
    values[1] = 2.5f;
    EXPECT_EQ(values.append(4.0f), 3);
    EXPECT_EQ(values.find(2.5f), 1);
    capture.expectOne("sgtsimplearray.h", QString());
    values[4] = 1.0f;
    capture.expectOne("sgtsimplearray.h", "Illegal array index in SgTSimpleArray::operator[]");
    EXPECT_EQ(values.count(), 4);
    EXPECT_EQ(values[3], 4.0f);
}

TEST(SgTStack, PushPopAndMisuse) {
    WarningCapture capture;
    SgTStack<int> stack(4);
    for (int i = 0; i < 10; ++i)
        EXPECT_TRUE(stack.push(i));
    EXPECT_EQ(stack.top(), 9);
    for (int i = 9; i >= 0; --i)
        EXPECT_EQ(stack.pop(), i);
    capture.expectOne("sgtstack.h", QString());
    EXPECT_EQ(stack.pop(), 0);
    capture.expectOne("sgtstack.h", "Empty stack in SgTStack::pop()");

    struct Big {
        char bytes[1 << 20];
    };
    SgTStack<Big> huge(INT_MAX);
    EXPECT_FALSE(huge.addBlocks(INT_MAX));
    capture.expectOne("sgtstack.h", "Out of memory in SgTStack::addBlocks");
    EXPECT_TRUE(huge.isEmpty());
}
