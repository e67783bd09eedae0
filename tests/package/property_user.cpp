// A module author's property class of its own, the one that CC_PropertyClass.h shows.
#include "platform/base/Export.h"
#include "properties/CC_PropertyClass.h"
#include "properties/CC_PropertyContainer.h"

class CC_EXPORT CC_PropertyPoint : public CC_PropertyClass<CC_PropertyPoint>
{
public:
    static constexpr char const* TYPE_NAME = "Point";
    static TypeId s_typeId;
    using CC_PropertyClass::CC_PropertyClass;
    CC_PropertyPoint(unsigned int id, int x, int y) : CC_PropertyClass(id), m_x(x), m_y(y) {}
    String& getValueString(String& out) const override;
    bool hasSameValue(CC_PropertyPoint const& other) const { return m_x == other.m_x && m_y == other.m_y; }

private:
    int m_x = 0;
    int m_y = 0;
};

CC_PropertyPoint::TypeId CC_PropertyPoint::s_typeId;
String& CC_PropertyPoint::getValueString(String& out) const { return out.format("%d/%d", m_x, m_y); }

int main()
{
    constexpr unsigned int POINT = 0x4018ff;
    CC_PropertyContainer properties;
    if (!properties.set(CC_PropertyPoint(POINT, 1, 2)).isOk() || !properties.set(CC_PropertyPoint(POINT, 3, 4)).isOk())
        return 1;
    CC_PropertyPoint const* const point = CC_PropertyPoint::FROM(properties.get(POINT));
    return point != nullptr && point->isEqual(CC_PropertyPoint(0, 3, 4)) && !point->isEqual(CC_PropertyPoint(0, 1, 2))
               ? 0
               : 2;
}
