#include "frame/ClassRegistry.h"
#include "frame/UserControl.h"

#include <QPluginLoader>
#include <QtUiPlugin/QDesignerCustomWidgetCollectionInterface>
#include <QtUiPlugin/QDesignerCustomWidgetInterface>

#include <gtest/gtest.h>

TEST(DesignerPlugin, loadsAndCreatesEveryControlInDesignMode)
{
    QPluginLoader loader(ZELCTL_DESIGNER_PLUGIN_FILE);
    ASSERT_TRUE(loader.load()) << loader.errorString().toStdString();
    auto *collection = qobject_cast<QDesignerCustomWidgetCollectionInterface *>(loader.instance());
    ASSERT_NE(collection, nullptr);

    QStringList offered;
    for (QDesignerCustomWidgetInterface *entry : collection->customWidgets()) {
        offered << entry->name();
        EXPECT_EQ(entry->group(), QString::fromUtf8("ZEL - Componentes gráficos"));
        EXPECT_TRUE(entry->includeFile().endsWith(entry->name().mid(8) + ".h"));
        QWidget form;
        QWidget *widget = entry->createWidget(&form);
        auto *control = qobject_cast<zelctl::UserControl *>(widget);
        ASSERT_NE(control, nullptr) << entry->name().toStdString();
        EXPECT_EQ(QString::fromLatin1(widget->metaObject()->className()), entry->name());
        EXPECT_TRUE(control->designMode()) << entry->name().toStdString();
        EXPECT_EQ(widget->parent(), &form);
    }

    QStringList built;
    for (const zelctl::ClassInfo &info : zelctl::ClassRegistry::classes()) {
        if (info.isControl && zelctl::ClassRegistry::factoryFor(info.classId))
            built << QStringLiteral("zelctl::") + info.name;
    }
    EXPECT_EQ(offered, built);
    EXPECT_FALSE(offered.isEmpty());
}
