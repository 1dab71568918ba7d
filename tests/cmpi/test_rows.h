// The providers of the test module (see cmpi/Module_Definition.h).
TVRN_ROW(Test_Store_Provider, Test_Store, 1, 0, 0)
TVRN_ROW(Test_Link_Provider, Test_Link, 1, 1, 0)
TVRN_ROW(Test_Alert_Provider, Test_Alert, 0, 0, 1)
