#include <kplib/geometry/shapes/AbstractShape2D.h>

#include <kplib/geometry/shapes/CurvedShape2D.h>
#include <kplib/geometry/shapes/Shape2D.h>

AbstractShape2D::~AbstractShape2D() = default;

Shape2D::~Shape2D() = default;

CurvedShape2D::~CurvedShape2D() = default;
