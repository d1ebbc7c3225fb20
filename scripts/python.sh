# Sourced by check.sh: the Python package, built and tried beside Python's own numbers and NumPy.

python_package() {
  need_packages g++ cmake ninja-build gettext pybind11-dev python3-dev python3-numpy python3-pytest python3-hypothesis mypy
  build_preset python
  echo "Testing (python) ..."
  (
    export PYTHONPATH="$PWD/build/python/python" MYPYPATH="$PWD/build/python/python" PYTHONDONTWRITEBYTECODE=1
    /usr/bin/python3 -m pytest -q -p no:cacheprovider tests/python
    for page in README.md docs/python.md; do /usr/bin/python3 -m doctest $page; done
    cd build/python
    /usr/bin/python3 -m mypy.stubtest m_math --concise --allowlist ../../python/stubtest_allowlist.txt
  )
}
