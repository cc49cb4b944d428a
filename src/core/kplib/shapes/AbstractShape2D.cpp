#include <kplib/shapes/AbstractShape2D.h>

#include <kplib/shapes/CurvedShape2D.h>
#include <kplib/shapes/Shape2D.h>

AbstractShape2D::~AbstractShape2D() = default;

Shape2D::~Shape2D() = default;

CurvedShape2D::~CurvedShape2D() = default;
